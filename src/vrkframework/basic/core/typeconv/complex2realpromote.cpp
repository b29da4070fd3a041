// The complex to real conversions of every pair of component types.
#include "vrkframework/basic/core/typeconv/complex2realpromote.h"

#include "vrkframework/basic/core/typeconv/promoteoperations_impl.h"

namespace typeconv {

#define KUBO_DETAIL_INSTANTIATE_FAMILY(A, B)                              \
    template class PromoteOperations<A, B, SampleLayout::kComplexToReal>; \
    template class Complex2RealPromote<A, B>;
KUBO_FOR_EACH_COMPONENT_PAIR(KUBO_DETAIL_INSTANTIATE_FAMILY)
#undef KUBO_DETAIL_INSTANTIATE_FAMILY

}  // namespace typeconv
