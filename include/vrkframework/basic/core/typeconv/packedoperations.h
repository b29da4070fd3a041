// The conversion operations between packed N-bit streams and whole-byte integer samples,
// shared by the bit-depth kernels and the packed converters.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDOPERATIONS_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDOPERATIONS_H

#include "vrkframework/basic/core/typeconv/ipromote.h"
#include "vrkframework/basic/core/typeconv/typelist.h"  // KUBO_FOR_EACH_PACKED_LAYOUT
#include "vrkframework/basic/kubo/kuboapi.h"

namespace typeconv {

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

}  // namespace typeconv

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDOPERATIONS_H
