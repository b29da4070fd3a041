// The kernels compiled for AVX2 (this file alone is built with -mavx2); used only when
// the processor reports AVX2.
#include "vrkframework/basic/core/typeconv/kernelset_impl.h"

#if !defined(__AVX2__)
#error "kernels_avx2.cpp must be compiled with AVX2 enabled"
#endif

namespace typeconv::detail {

const KernelSet& Avx2KernelSet() { return kKernelSet; }

}  // namespace typeconv::detail
