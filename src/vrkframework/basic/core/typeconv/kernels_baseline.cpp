// The kernels compiled for the baseline instruction set of the target.
#include "vrkframework/basic/core/typeconv/kernelset_impl.h"

namespace typeconv::detail {

const KernelSet& BaselineKernelSet() { return kKernelSet; }

}  // namespace typeconv::detail
