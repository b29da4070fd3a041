// The conversion kernels behind the promote classes: the table of one kernel variant, the
// table in use, and the drivers the classes call (private to the library).
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_CONVERSIONKERNELS_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_CONVERSIONKERNELS_H

#include <array>
#include <climits>  // INT_MAX
#include <cstddef>  // std::size_t

#include "vrkframework/basic/core/typeconv/componenttraits.h"
#include "vrkframework/basic/core/typeconv/promoteoperations.h"

namespace typeconv::detail {

/// `count` values of the source to `count` values of the destination.
using ConvertKernel = void (*)(const void* src, void* dst, std::size_t count);
/// `count` samples of `bits` bits from a packed stream into whole-byte samples.
using UnpackKernel = void (*)(const unsigned char* packed, void* samples, std::size_t count,
                              unsigned int bits);
/// `count` whole-byte samples into a packed stream of `bits`-bit samples.
using PackKernel = void (*)(const void* samples, unsigned char* packed, std::size_t count,
                            unsigned int bits);
/// `bytes` bytes from a block in the first-level cache to memory, past the caches; with
/// `fence` set, every such store of the thread so far is then ordered before its later
/// stores. A driver sets it on its last block only: a fence drains the write-combining
/// buffers, which between blocks would stall the stores.
using CopyOutKernel = void (*)(const void* block, void* dst, std::size_t bytes, bool fence);

/// Every conversion kernel of one kernel variant; a null entry is taken from the variant
/// before it.
struct KernelSet {
    /// [source index][destination index]: contiguous values, rule per value.
    std::array<std::array<ConvertKernel, kComponentCount>, kComponentCount> convert;
    /// [source index][destination index]: the real parts of (real, imaginary) pairs.
    std::array<std::array<ConvertKernel, kComponentCount>, kComponentCount> convertRealParts;
    /// [log2 of the value size]: values to (value, 0) pairs.
    std::array<ConvertKernel, 4> interleaveWithZeros;
    /// [component index]: null for float and double.
    std::array<UnpackKernel, kComponentCount> unpack;
    std::array<PackKernel, kComponentCount> pack;
    CopyOutKernel copyOut;
};

/// Replaces every null kernel of `kernels` by the one of `before`.
void FillGaps(KernelSet& kernels, const KernelSet& before);

/// The conversion kernels of the kernel variant in use.
const KernelSet& ActiveKernels();

/// Conversions whose output is at least this large write it past the caches: so large a
/// result would leave the caches before it is read again, and writing it past them saves
/// the reading of every destination line before it is overwritten.
constexpr std::size_t kCopyOutBytes = std::size_t{4} << 20;

/// How many of `count` samples of `sampleBytes` bytes lie before `samples` reaches a cache
/// line, where that many end on a byte of a packed stream of `streamBits` bits a sample; 0
/// where no such count gets there. Drivers run those samples in a call of their own, so
/// that no vector access of the call for the rest spans two lines.
std::size_t SamplesBeforeLine(const void* samples, std::size_t sampleBytes, std::size_t count,
                              std::size_t streamBits = 8);

/// Runs the conversion of `count` samples of a family's layout: through RunPromoteInBlocks
/// with `copyOut` set when the output takes at least kCopyOutBytes, else in place, the
/// samples before the wider side's first cache line apart.
void RunPromote(const KernelSet& kernels, SampleLayout layout, std::size_t from, std::size_t to,
                const void* src, void* dst, std::size_t count);

/// Runs the conversion block by block through a buffer in the first-level cache, each block
/// then copied to `dst`, past the caches where `copyOut` is set.
void RunPromoteInBlocks(const KernelSet& kernels, SampleLayout layout, std::size_t from,
                        std::size_t to, const void* src, void* dst, std::size_t count,
                        bool copyOut);

/// Reports a null source or destination for a conversion that has samples to convert
/// (kora::DataException): no buffer can be read or written at a null address.
[[noreturn]] void ThrowNullBuffer();
inline void CheckBuffers(const void* src, const void* dst, std::size_t count) {
    if (count != 0 && (src == nullptr || dst == nullptr)) {
        ThrowNullBuffer();
    }
}

/// The bit-depth kernels treat counts as signed 32-bit values: below 1 converts nothing.
constexpr bool IsPackedCountPositive(unsigned int count) {
    return count != 0 && count <= static_cast<unsigned int>(INT_MAX);
}

/// Reports N above the bits of the element type (kora::Exception, line 390 for unpacking
/// and 395 for packing); `typeName` is the framework's spelling of the element type.
[[noreturn]] void ThrowUnpackBitsTooWide(unsigned int bits, const char* typeName);
[[noreturn]] void ThrowPackBitsTooWide(unsigned int bits, const char* typeName);

}  // namespace typeconv::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_CONVERSIONKERNELS_H
