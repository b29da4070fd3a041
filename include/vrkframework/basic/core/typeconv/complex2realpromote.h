// Conversion of complex sample buffers into real ones.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_COMPLEX2REALPROMOTE_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_COMPLEX2REALPROMOTE_H

#include "vrkframework/basic/core/typeconv/promoteoperations.h"
#include "vrkframework/basic/core/typeconv/typelist.h"
#include "vrkframework/basic/kubo/kuboapi.h"

namespace typeconv {

/// Converts complex samples of components A into real samples of B: the real part follows
/// the rules of Promote<A, B>; the imaginary part is ignored (no magnitude is taken).
template <class A, class B>
class KUBO_API Complex2RealPromote
    : public PromoteOperations<priv::Component<A>, priv::Component<B>,
                               SampleLayout::kComplexToReal> {};

// Instantiated for every pair of component types inside the library.
#define KUBO_DETAIL_EXTERN_FAMILY(A, B)                                                   \
    extern template class KUBO_API PromoteOperations<A, B, SampleLayout::kComplexToReal>; \
    extern template class KUBO_API Complex2RealPromote<A, B>;
KUBO_FOR_EACH_COMPONENT_PAIR(KUBO_DETAIL_EXTERN_FAMILY)
#undef KUBO_DETAIL_EXTERN_FAMILY

}  // namespace typeconv

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_COMPLEX2REALPROMOTE_H
