// The conversion kernels behind the promote classes: one table of kernels per instruction
// set, the choice of the table this processor runs, and the drivers the classes call.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_KERNELS_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_KERNELS_H

#include <array>
#include <climits>  // CHAR_BIT, INT_MAX
#include <cstddef>  // std::size_t
#include <type_traits>

#include "vrkframework/basic/core/typeconv/promoteoperations.h"
#include "vrkframework/basic/kubo/kuboapi.h"

namespace typeconv::detail {

/// Number of component types; their indices follow the dispatch order of ComponentTypes.
constexpr std::size_t kComponentCount = 10;

/// Index of T in the dispatch order, from its traits (so `long long` is the 64-bit
/// signed type too).
template <class T>
constexpr std::size_t ComponentIndexOf() {
    static_assert(std::is_arithmetic_v<T> && !std::is_same_v<T, bool>, "a component type");
    if constexpr (std::is_floating_point_v<T>) {
        static_assert(sizeof(T) == 4 || sizeof(T) == 8, "float or double");
        return sizeof(T) == 4 ? 6 : 7;
    } else {
        constexpr std::size_t kSigned = std::is_signed_v<T> ? 0 : 1;
        return (sizeof(T) == 1 ? 0 : sizeof(T) == 2 ? 2 : sizeof(T) == 4 ? 4 : 8) + kSigned;
    }
}

template <class T>
constexpr unsigned int kBitsOf = static_cast<unsigned int>(sizeof(T) * CHAR_BIT);

/// `count` values of the source to `count` values of the destination.
using ConvertKernel = void (*)(const void* src, void* dst, std::size_t count);
/// `count` samples of `bits` bits from a packed stream into whole-byte samples.
using UnpackKernel = void (*)(const unsigned char* packed, void* samples, std::size_t count,
                              unsigned int bits);
/// `count` whole-byte samples into a packed stream of `bits`-bit samples.
using PackKernel = void (*)(const void* samples, unsigned char* packed, std::size_t count,
                            unsigned int bits);

/// Every kernel compiled for one instruction set.
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
};

/// The instruction sets kernels are compiled for.
enum class KernelVariant { kBaseline, kAvx2, kAvx512 };

/// Every variant, fastest last.
constexpr std::array<KernelVariant, 3> kKernelVariants = {
    KernelVariant::kBaseline, KernelVariant::kAvx2, KernelVariant::kAvx512};

/// The kernels of `variant`, or null when this build or this processor lacks them.
KUBO_API const KernelSet* FindKernels(KernelVariant variant);
/// The fastest kernels this processor runs, chosen on first use.
KUBO_API const KernelSet& ActiveKernels();

/// Runs the conversion of `count` samples of a family's layout.
KUBO_API void RunPromote(const KernelSet& kernels, SampleLayout layout, std::size_t from,
                         std::size_t to, const void* src, void* dst, std::size_t count);

/// Reports a null source or destination for a conversion that has samples to convert
/// (kora::DataException): no buffer can be read or written at a null address.
[[noreturn]] KUBO_API void ThrowNullBuffer();
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

/// The framework's spelling of each component type, as function texts show it.
constexpr std::array<const char*, kComponentCount> kComponentTypeNames = {
    "char",         "unsigned char", "short",  "unsigned short", "int",
    "unsigned int", "float",         "double", "__int64",        "unsigned __int64"};

/// `kernels` with every null kernel replaced by the one of `fallback`.
KernelSet WithGapsFilled(KernelSet kernels, const KernelSet& fallback);

// Defined by the kernel files, one per instruction set.
const KernelSet& BaselineKernelSet();
#if defined(KUBO_HAVE_X86_KERNELS)
const KernelSet& Avx2KernelSet();
const KernelSet& Avx512KernelSet();
#endif

}  // namespace typeconv::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_KERNELS_H
