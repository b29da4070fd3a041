// The conversion table in use, the filling of a variant's gaps, and the driver of the
// complex layouts.
#include "vrkframework/basic/core/typeconv/conversionkernels.h"

#include <algorithm>  // std::min
#include <cstdint>    // std::uintptr_t

#include "vrkframework/basic/core/kernels/kerneltables.h"
#include "vrkframework/basic/core/kernels/prefetch.h"

namespace typeconv::detail {
namespace {

constexpr std::size_t Log2(std::size_t size) {
    return size == 1 ? 0 : size == 2 ? 1 : size == 4 ? 2 : 3;
}

/// The output of a block: small enough to stay in the first-level cache between its
/// writing and its copying out (real to complex conversions write the real values there
/// first and interleave them with zeros, so that every pair shares the contiguous kernels),
/// and small enough that the reading of a block and the streaming out of the one before
/// overlap in memory: blocks of 8 KiB took a quarter longer out of cache.
constexpr std::size_t kBlockBytes = 2048;
constexpr std::size_t kLineBytes = 64;

enum class Side { kInput, kOutput };

/// The bytes of one sample of a layout's input or output: complex samples take two values.
constexpr std::size_t SampleBytes(SampleLayout layout, std::size_t component, Side side) {
    const bool complex =
        side == Side::kInput
            ? layout == SampleLayout::kComplex || layout == SampleLayout::kComplexToReal
            : layout == SampleLayout::kComplex || layout == SampleLayout::kRealToComplex;
    return (complex ? 2 : 1) * kComponentSizes[component];
}

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

std::size_t SamplesBeforeLine(const void* samples, std::size_t sampleBytes, std::size_t count,
                              std::size_t streamBits) {
    const std::size_t toLine =
        (kLineBytes - reinterpret_cast<std::uintptr_t>(samples) % kLineBytes) % kLineBytes;
    const std::size_t head = toLine / sampleBytes;
    return toLine % sampleBytes == 0 && head * streamBits % 8 == 0 ? std::min(head, count) : 0;
}

void RunPromote(const KernelSet& kernels, SampleLayout layout, std::size_t from, std::size_t to,
                const void* src, void* dst, std::size_t count) {
    const std::size_t inSize = SampleBytes(layout, from, Side::kInput);
    const std::size_t outSize = SampleBytes(layout, to, Side::kOutput);
    const bool copyOut = count * outSize >= kCopyOutBytes;
    if (copyOut || layout == SampleLayout::kRealToComplex) {
        RunPromoteInBlocks(kernels, layout, from, to, src, dst, count, copyOut);
        return;
    }
    const auto run = [&](std::size_t first, std::size_t n) {
        const unsigned char* in = static_cast<const unsigned char*>(src) + first * inSize;
        unsigned char* out = static_cast<unsigned char*>(dst) + first * outSize;
        if (layout == SampleLayout::kReal) {
            kernels.convert[from][to](in, out, n);
        } else if (layout == SampleLayout::kComplex) {
            kernels.convert[from][to](in, out, 2 * n);
        } else {
            kernels.convertRealParts[from][to](in, out, n);
        }
    };
    // The wider side takes the more vector accesses: a widening's stores, a narrowing's
    // loads.
    const std::size_t head = outSize >= inSize ? SamplesBeforeLine(dst, outSize, count)
                                               : SamplesBeforeLine(src, inSize, count);
    if (head != 0) {
        run(0, head);
    }
    run(head, count - head);
}

void RunPromoteInBlocks(const KernelSet& kernels, SampleLayout layout, std::size_t from,
                        std::size_t to, const void* src, void* dst, std::size_t count,
                        bool copyOut) {
    const std::size_t inSize = SampleBytes(layout, from, Side::kInput);
    const std::size_t outSize = SampleBytes(layout, to, Side::kOutput);
    const std::size_t blockCount = kBlockBytes / outSize;
    alignas(64) unsigned char block[kBlockBytes];
    alignas(64) unsigned char values[kBlockBytes / 2];  // real values before interleaving
    // The first block ends where the destination reaches a cache line, so that the blocks
    // after it are copied out in whole lines.
    std::size_t n = SamplesBeforeLine(dst, outSize, blockCount);
    n = n != 0 ? n : blockCount;
    for (std::size_t done = 0; done < count; done += n, n = blockCount) {
        n = std::min(n, count - done);
        const unsigned char* in = static_cast<const unsigned char*>(src) + done * inSize;
        unsigned char* out = static_cast<unsigned char*>(dst) + done * outSize;
        unsigned char* target = copyOut ? block : out;
        if (copyOut) {
            const std::size_t next = std::min(blockCount, count - done - n);
            kora::kubo::detail::PrefetchForReading(in + n * inSize, next * inSize);
        }
        switch (layout) {
            case SampleLayout::kReal:
                kernels.convert[from][to](in, target, n);
                break;
            case SampleLayout::kComplex:
                kernels.convert[from][to](in, target, 2 * n);
                break;
            case SampleLayout::kComplexToReal:
                kernels.convertRealParts[from][to](in, target, n);
                break;
            case SampleLayout::kRealToComplex:
                kernels.convert[from][to](in, values, n);
                kernels.interleaveWithZeros[Log2(kComponentSizes[to])](values, target, n);
                break;
        }
        if (copyOut) {
            kernels.copyOut(block, out, n * outSize, done + n == count);
        }
    }
}

}  // namespace typeconv::detail
