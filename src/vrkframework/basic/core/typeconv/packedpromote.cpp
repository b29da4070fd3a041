// The packed converters of every bit count and integer type.
#include "vrkframework/basic/core/typeconv/packedpromote.h"

#include "vrkframework/basic/core/typeconv/packedpromote_impl.h"

namespace typeconv {

#define KUBO_DETAIL_INSTANTIATE_PACKED(N, T)  \
    template class PackedOperations<N, T, 0>; \
    template class PackedOperations<N, T, 1>; \
    template class SpecialPromote<N, T, 0>;   \
    template class SpecialPromote<N, T, 1>;
KUBO_FOR_EACH_PACKED_LAYOUT(KUBO_DETAIL_INSTANTIATE_PACKED)
#undef KUBO_DETAIL_INSTANTIATE_PACKED

}  // namespace typeconv
