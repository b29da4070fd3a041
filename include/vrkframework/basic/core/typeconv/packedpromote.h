// The converters between packed N-bit streams and whole-byte integer samples.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDPROMOTE_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDPROMOTE_H

#include "vrkframework/basic/core/typeconv/packedoperations.h"
#include "vrkframework/basic/core/typeconv/typelist.h"
#include "vrkframework/basic/kubo/kuboapi.h"

namespace typeconv {

/// Converts between a packed stream of N-bit samples and samples of the integer type T:
/// direction S = 0 unpacks (BitDepthPromote<N, T, 0, 0>::Promote), S = 1 packs
/// (BitDepthPromote<N, T, 0, 0>::Pack). Holds no data; created by
/// kora::kubo::PromoteFactory, deleted through IPromote. When N exceeds the bits of T,
/// Promote throws what the bit-depth kernel throws.
template <unsigned int N, class T, unsigned int S>
class KUBO_API SpecialPromote : public PackedOperations<N, priv::Component<T>, S> {};

#define KUBO_DETAIL_EXTERN_SPECIAL(N, T)                    \
    extern template class KUBO_API SpecialPromote<N, T, 0>; \
    extern template class KUBO_API SpecialPromote<N, T, 1>;
KUBO_FOR_EACH_PACKED_LAYOUT(KUBO_DETAIL_EXTERN_SPECIAL)
#undef KUBO_DETAIL_EXTERN_SPECIAL

}  // namespace typeconv

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDPROMOTE_H
