// Member bodies of PromoteOperations, instantiated by the four family files.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_PROMOTEOPERATIONS_IMPL_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_PROMOTEOPERATIONS_IMPL_H

#include "vrkframework/basic/core/typeconv/conversionkernels.h"
#include "vrkframework/basic/core/typeconv/promoteoperations.h"

namespace typeconv {

template <class A, class B, SampleLayout Layout>
void PromoteOperations<A, B, Layout>::Promote(const void* src, void* dst, unsigned int count) {
    detail::CheckBuffers(src, dst, count);
    detail::RunPromote(detail::ActiveKernels(), Layout, detail::ComponentIndexOf<A>(),
                       detail::ComponentIndexOf<B>(), src, dst, count);
}

template <class A, class B, SampleLayout Layout>
unsigned int PromoteOperations<A, B, Layout>::GetInputBits() const {
    return detail::kBitsOf<A>;
}

template <class A, class B, SampleLayout Layout>
unsigned int PromoteOperations<A, B, Layout>::GetOutputBits() const {
    return detail::kBitsOf<B>;
}

}  // namespace typeconv

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_PROMOTEOPERATIONS_IMPL_H
