// The conversion table in use, the filling of a variant's gaps, and the driver of the
// complex layouts.
#include "vrkframework/basic/core/typeconv/conversionkernels.h"

#include "vrkframework/basic/core/kernels/kerneltables.h"

namespace typeconv::detail {
namespace {

constexpr std::size_t Log2(std::size_t size) {
    return size == 1 ? 0 : size == 2 ? 1 : size == 4 ? 2 : 3;
}

/// Real to complex conversions go through a small block that stays in the first-level
/// cache: contiguous conversion, then interleaving with zeros, so every pair shares the
/// contiguous kernels.
constexpr std::size_t kBlockBytes = 8192;

}  // namespace

const KernelSet& ActiveKernels() { return kora::kubo::detail::ActiveKernelTables().conversion; }

void FillGaps(KernelSet& kernels, const KernelSet& before) {
    const auto fill = [](auto& entries, const auto& beforeEntries) {
        for (std::size_t i = 0; i < entries.size(); ++i) {
            entries[i] = entries[i] != nullptr ? entries[i] : beforeEntries[i];
        }
    };
    for (std::size_t from = 0; from < kComponentCount; ++from) {
        fill(kernels.convert[from], before.convert[from]);
        fill(kernels.convertRealParts[from], before.convertRealParts[from]);
    }
    fill(kernels.interleaveWithZeros, before.interleaveWithZeros);
    fill(kernels.unpack, before.unpack);
    fill(kernels.pack, before.pack);
}

void RunPromote(const KernelSet& kernels, SampleLayout layout, std::size_t from, std::size_t to,
                const void* src, void* dst, std::size_t count) {
    const ConvertKernel convert = kernels.convert[from][to];
    switch (layout) {
        case SampleLayout::kReal:
            convert(src, dst, count);
            return;
        case SampleLayout::kComplex:
            convert(src, dst, 2 * count);
            return;
        case SampleLayout::kComplexToReal:
            kernels.convertRealParts[from][to](src, dst, count);
            return;
        case SampleLayout::kRealToComplex:
            break;
    }
    const std::size_t fromSize = kComponentSizes[from];
    const std::size_t toSize = kComponentSizes[to];
    const std::size_t blockCount = kBlockBytes / toSize;
    alignas(64) unsigned char block[kBlockBytes];
    const auto* in = static_cast<const unsigned char*>(src);
    auto* out = static_cast<unsigned char*>(dst);
    for (std::size_t done = 0; done < count; done += blockCount) {
        const std::size_t n = count - done < blockCount ? count - done : blockCount;
        convert(in + done * fromSize, block, n);
        kernels.interleaveWithZeros[Log2(toSize)](block, out + 2 * done * toSize, n);
    }
}

}  // namespace typeconv::detail
