// Conversion of complex sample buffers between any two component types.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_COMPLEXPROMOTE_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_COMPLEXPROMOTE_H

#include "vrkframework/basic/core/typeconv/promoteoperations.h"
#include "vrkframework/basic/core/typeconv/typelist.h"
#include "vrkframework/basic/kubo/kuboapi.h"

namespace typeconv {

/// Converts complex samples of components A into complex samples of components B: both
/// components of each sample, real part first, follow the rules of Promote<A, B>.
template <class A, class B>
class KUBO_API ComplexPromote
    : public PromoteOperations<priv::Component<A>, priv::Component<B>, SampleLayout::kComplex> {};

// Instantiated for every pair of component types inside the library.
#define KUBO_DETAIL_EXTERN_FAMILY(A, B)                                             \
    extern template class KUBO_API PromoteOperations<A, B, SampleLayout::kComplex>; \
    extern template class KUBO_API ComplexPromote<A, B>;
KUBO_FOR_EACH_COMPONENT_PAIR(KUBO_DETAIL_EXTERN_FAMILY)
#undef KUBO_DETAIL_EXTERN_FAMILY

}  // namespace typeconv

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_COMPLEXPROMOTE_H
