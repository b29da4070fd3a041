// The choice of the kernel table and the drivers of the complex layouts.
#include "vrkframework/basic/core/typeconv/kernels.h"

#include <cstdint>

namespace typeconv::detail {
namespace {

constexpr std::size_t kSizeOf[kComponentCount] = {1, 1, 2, 2, 4, 4, 4, 8, 8, 8};

constexpr std::size_t Log2(std::size_t size) {
    return size == 1 ? 0 : size == 2 ? 1 : size == 4 ? 2 : 3;
}

/// Real to complex conversions go through a small block that stays in the first-level
/// cache: contiguous conversion, then interleaving with zeros, so every pair shares the
/// contiguous kernels.
constexpr std::size_t kBlockBytes = 8192;

}  // namespace

const KernelSet* FindKernels(KernelVariant variant) {
    switch (variant) {
        case KernelVariant::kBaseline:
            return &BaselineKernelSet();
#if defined(KUBO_HAVE_X86_KERNELS)
        case KernelVariant::kAvx2:
            return __builtin_cpu_supports("avx2") ? &Avx2KernelSet() : nullptr;
        case KernelVariant::kAvx512:
            // Every extension the file is compiled with, and AVX2 for the kernels it
            // takes from the AVX2 set.
            return __builtin_cpu_supports("avx2") && __builtin_cpu_supports("avx512f") &&
                           __builtin_cpu_supports("avx512bw") &&
                           __builtin_cpu_supports("avx512dq") && __builtin_cpu_supports("avx512vl")
                       ? &Avx512KernelSet()
                       : nullptr;
#else
        case KernelVariant::kAvx2:
        case KernelVariant::kAvx512:
            return nullptr;
#endif
    }
    return nullptr;
}

const KernelSet& ActiveKernels() {
    static const KernelSet& active = []() -> const KernelSet& {
        for (auto variant = kKernelVariants.rbegin(); variant != kKernelVariants.rend();
             ++variant) {
            if (const KernelSet* kernels = FindKernels(*variant)) {
                return *kernels;
            }
        }
        return BaselineKernelSet();
    }();
    return active;
}

KernelSet WithGapsFilled(KernelSet kernels, const KernelSet& fallback) {
    const auto fill = [](auto& entries, const auto& fallbackEntries) {
        for (std::size_t i = 0; i < entries.size(); ++i) {
            entries[i] = entries[i] != nullptr ? entries[i] : fallbackEntries[i];
        }
    };
    for (std::size_t from = 0; from < kComponentCount; ++from) {
        fill(kernels.convert[from], fallback.convert[from]);
        fill(kernels.convertRealParts[from], fallback.convertRealParts[from]);
    }
    fill(kernels.interleaveWithZeros, fallback.interleaveWithZeros);
    fill(kernels.unpack, fallback.unpack);
    fill(kernels.pack, fallback.pack);
    return kernels;
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
    const std::size_t fromSize = kSizeOf[from];
    const std::size_t toSize = kSizeOf[to];
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
