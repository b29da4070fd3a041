// Conversion of real sample buffers between any two component types.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_PROMOTE_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_PROMOTE_H

#include "vrkframework/basic/core/typeconv/promoteoperations.h"
#include "vrkframework/basic/core/typeconv/typelist.h"
#include "vrkframework/basic/kubo/kuboapi.h"

namespace typeconv {

/// Converts samples of component type A into samples of B, one value per sample:
/// integers saturate to the range of B (with the documented exceptions: signed 8/16/32-bit
/// sources give no negatives in 64-bit destinations, 64-bit signed sources only clamp
/// from above and keep the low bits otherwise, 64-bit signed to unsigned is a bit copy);
/// floating values are rounded (half away from zero for char, short, int; +0.5 then
/// truncation for the unsigned 8/16/32-bit types; truncation for 64-bit integers) and
/// saturated with thresholds in the source precision; NaN gives 0 in 8/16-bit and
/// unsigned int destinations, INT_MIN in int and the top bit alone in 64-bit ones;
/// integers convert to the nearest floating value; double to float overflows to infinity.
/// Create it with new (or through kora::kubo::PromoteFactory) and call it through IPromote.
template <class A, class B>
class KUBO_API Promote
    : public PromoteOperations<priv::Component<A>, priv::Component<B>, SampleLayout::kReal> {};

// Instantiated for every pair of component types inside the library.
#define KUBO_DETAIL_EXTERN_FAMILY(A, B)                                          \
    extern template class KUBO_API PromoteOperations<A, B, SampleLayout::kReal>; \
    extern template class KUBO_API Promote<A, B>;
KUBO_FOR_EACH_COMPONENT_PAIR(KUBO_DETAIL_EXTERN_FAMILY)
#undef KUBO_DETAIL_EXTERN_FAMILY

}  // namespace typeconv

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_PROMOTE_H
