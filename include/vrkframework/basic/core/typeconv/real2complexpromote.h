// Conversion of real sample buffers into complex ones.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_REAL2COMPLEXPROMOTE_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_REAL2COMPLEXPROMOTE_H

#include "vrkframework/basic/core/typeconv/promoteoperations.h"
#include "vrkframework/basic/core/typeconv/typelist.h"
#include "vrkframework/basic/kubo/kuboapi.h"

namespace typeconv {

/// Converts real samples of A into complex samples of components B: the real part follows
/// the rules of Promote<A, B>, the imaginary part is 0.
template <class A, class B>
class KUBO_API Real2ComplexPromote
    : public PromoteOperations<priv::Component<A>, priv::Component<B>,
                               SampleLayout::kRealToComplex> {};

// Instantiated for every pair of component types inside the library.
#define KUBO_DETAIL_EXTERN_FAMILY(A, B)                                                   \
    extern template class KUBO_API PromoteOperations<A, B, SampleLayout::kRealToComplex>; \
    extern template class KUBO_API Real2ComplexPromote<A, B>;
KUBO_FOR_EACH_COMPONENT_PAIR(KUBO_DETAIL_EXTERN_FAMILY)
#undef KUBO_DETAIL_EXTERN_FAMILY

}  // namespace typeconv

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_REAL2COMPLEXPROMOTE_H
