// The kernels compiled for AVX-512 F, BW, DQ and VL (this file alone is built with them);
// used only when the processor reports all four. They bring direct conversions between
// floating values and unsigned or 64-bit integers and wider integer to floating steps; the
// kernels that gain nothing from them are the AVX2 ones.
#include "vrkframework/basic/core/typeconv/kernelset_impl.h"

#if !defined(__AVX512F__) || !defined(__AVX512BW__) || !defined(__AVX512DQ__) || \
    !defined(__AVX512VL__)
#error "kernels_avx512.cpp must be compiled with AVX-512 F, BW, DQ and VL enabled"
#endif

namespace typeconv::detail {

const KernelSet& Avx512KernelSet() {
    static const KernelSet kernels = WithGapsFilled(kKernelSet, Avx2KernelSet());
    return kernels;
}

}  // namespace typeconv::detail
