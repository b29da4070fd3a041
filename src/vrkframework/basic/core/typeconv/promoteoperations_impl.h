// Member bodies of PromoteOperations, instantiated by the four family files.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_PROMOTEOPERATIONS_IMPL_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_PROMOTEOPERATIONS_IMPL_H

#include "vrkframework/basic/core/typeconv/conversionkernels.h"
#include "vrkframework/basic/core/typeconv/promoteoperations.h"

namespace typeconv::detail {

template <class A, class B, SampleLayout Layout>
void PromoteOperations<A, B, Layout>::Promote(const void* src, void* dst, unsigned int count) {
    CheckBuffers(src, dst, count);
    RunPromote(ActiveKernels(), Layout, ComponentIndexOf<A>(), ComponentIndexOf<B>(), src, dst,
               count);
}

template <class A, class B, SampleLayout Layout>
unsigned int PromoteOperations<A, B, Layout>::GetInputBits() const {
    return kBitsOf<A>;
}

template <class A, class B, SampleLayout Layout>
unsigned int PromoteOperations<A, B, Layout>::GetOutputBits() const {
    return kBitsOf<B>;
}

}  // namespace typeconv::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_PROMOTEOPERATIONS_IMPL_H
