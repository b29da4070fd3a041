// The conversion operations between packed N-bit streams and whole-byte integer samples,
// shared by the bit-depth kernels and the packed converters.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDOPERATIONS_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDOPERATIONS_H

#include <cstdint>  // std::int64_t, std::uint64_t

#include "vrkframework/basic/core/typeconv/ipromote.h"
#include "vrkframework/basic/kubo/kuboapi.h"

/// Applies X(N, T) to every packed bit count N and integer component type T.
#define KUBO_FOR_EACH_PACKED_LAYOUT(X)               \
    KUBO_DETAIL_PACKED_BIT_COUNTS(X, char)           \
    KUBO_DETAIL_PACKED_BIT_COUNTS(X, unsigned char)  \
    KUBO_DETAIL_PACKED_BIT_COUNTS(X, short)          \
    KUBO_DETAIL_PACKED_BIT_COUNTS(X, unsigned short) \
    KUBO_DETAIL_PACKED_BIT_COUNTS(X, int)            \
    KUBO_DETAIL_PACKED_BIT_COUNTS(X, unsigned int)   \
    KUBO_DETAIL_PACKED_BIT_COUNTS(X, std::int64_t)   \
    KUBO_DETAIL_PACKED_BIT_COUNTS(X, std::uint64_t)

// clang-format off
#define KUBO_DETAIL_PACKED_BIT_COUNTS(X, T)                                                    \
    X(1, T) X(2, T) X(3, T) X(4, T) X(5, T) X(6, T) X(7, T) X(9, T) X(10, T) X(11, T) X(12, T) \
    X(13, T) X(14, T) X(15, T) X(17, T) X(18, T) X(19, T) X(20, T) X(21, T) X(22, T)         \
    X(23, T) X(24, T) X(25, T) X(26, T) X(27, T) X(28, T) X(29, T) X(30, T) X(31, T)
// clang-format on

namespace typeconv::detail {

/// Implements IPromote between a packed stream of N-bit unsigned samples and samples of
/// the integer component type T: direction S = 0 unpacks, S = 1 packs. Sample i occupies
/// stream bits N*i to N*i+N-1, most significant bit first, and stream bit k is bit
/// 7 - k%8 of byte k/8; a stream of `count` samples takes (count * N + 7) / 8 bytes.
template <unsigned int N, class T, unsigned int S>
class KUBO_API PackedOperations : public IPromote {
public:
    /// Unpacking zero-extends whatever the sign of T (a 12-bit 0xFFF gives 4095 in
    /// short). Packing clears the stream's bytes, then ORs the samples in; values are not
    /// clamped to N bits: a sample within one byte loses its bits above bit N-1, but a
    /// sample spanning two or more bytes ORs its higher bits into the first byte it
    /// touches, that is into the previous sample. A count of 0, or one of 2^31 or more,
    /// converts nothing.
    /// @throws kora::Exception "Invalid type promote, the number of bit is bigger than the
    /// type requested for conversion" (line 390 unpacking, 395 packing, reported from
    /// BitDepthPromote) when N exceeds the bits of T, before anything is written.
    void Promote(const void* src, void* dst, unsigned int count) override;
    /// N when unpacking, the bits of T when packing.
    unsigned int GetInputBits() const override;
    /// The bits of T when unpacking, N when packing.
    unsigned int GetOutputBits() const override;
};

#define KUBO_DETAIL_EXTERN_PACKED(N, T)                       \
    extern template class KUBO_API PackedOperations<N, T, 0>; \
    extern template class KUBO_API PackedOperations<N, T, 1>;
KUBO_FOR_EACH_PACKED_LAYOUT(KUBO_DETAIL_EXTERN_PACKED)
#undef KUBO_DETAIL_EXTERN_PACKED

}  // namespace typeconv::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDOPERATIONS_H
