// The kernel tables of one variant. The build compiles this file once per kernel variant,
// with that variant's instruction set and KUBO_KERNEL_VARIANT set to its name.
#include "vrkframework/basic/core/kernels/kerneltables.h"
#include "vrkframework/basic/core/typeconv/conversiontable_impl.h"
#include "vrkframework/basic/kubo/masks/maskloops_impl.h"

#if !defined(KUBO_KERNEL_VARIANT)
#error "varianttables.cpp is compiled once per kernel variant, with KUBO_KERNEL_VARIANT set"
#endif

namespace kora::kubo::detail {

#define KUBO_DETAIL_DEFINE_TABLES(name) KUBO_DETAIL_TABLES_FUNCTION(name)
const KernelTables& KUBO_DETAIL_DEFINE_TABLES(KUBO_KERNEL_VARIANT)() {
    static constexpr KernelTables kTables = {typeconv::detail::kConversionKernels, kMaskLoops,
                                             kVectorBits};
    return kTables;
}
#undef KUBO_DETAIL_DEFINE_TABLES

}  // namespace kora::kubo::detail
