// The real to complex conversions of every pair of component types.
#include "vrkframework/basic/core/typeconv/real2complexpromote.h"

#include "vrkframework/basic/core/typeconv/promoteoperations_impl.h"

namespace typeconv {

#define KUBO_DETAIL_INSTANTIATE_FAMILY(A, B)                              \
    template class PromoteOperations<A, B, SampleLayout::kRealToComplex>; \
    template class Real2ComplexPromote<A, B>;
KUBO_FOR_EACH_COMPONENT_PAIR(KUBO_DETAIL_INSTANTIATE_FAMILY)
#undef KUBO_DETAIL_INSTANTIATE_FAMILY

}  // namespace typeconv
