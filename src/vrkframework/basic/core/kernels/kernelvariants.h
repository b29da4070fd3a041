// The registry of kernel variants: every instruction set the kernels are compiled for, which
// of them this processor runs, and the one in use (private to the library). The variants
// are listed once, by the build (cmake/kuboKernelVariants.cmake), slowest first.
#ifndef VRKFRAMEWORK_BASIC_CORE_KERNELS_KERNELVARIANTS_H
#define VRKFRAMEWORK_BASIC_CORE_KERNELS_KERNELVARIANTS_H

#include <cstddef>   // std::size_t
#include <iterator>  // std::size

#include "vrkframework/basic/core/kernels/kerneltables.h"

namespace kora::kubo::detail {

/// A kernel variant, by its place in the registry: 0 is the baseline, higher ones run on
/// fewer processors and faster.
using KernelVariant = std::size_t;

#define KUBO_DETAIL_VARIANT_NAME(name, supported) #name,
/// The names of the variants, as test and benchmark names show them ("baseline", "avx2",
/// ...), slowest first.
inline constexpr const char* kKernelVariantNames[] = {
    KUBO_FOR_EACH_KERNEL_VARIANT(KUBO_DETAIL_VARIANT_NAME)};
#undef KUBO_DETAIL_VARIANT_NAME

/// Number of variants this build compiles.
constexpr std::size_t kKernelVariantCount = std::size(kKernelVariantNames);

/// The variant's name, as test and benchmark names show it ("baseline", "avx2", ...).
const char* KernelVariantName(KernelVariant variant);
/// Whether this processor runs the variant.
bool IsKernelVariantSupported(KernelVariant variant);
/// The variant's tables, gaps filled from the variants before it.
const KernelTables& KernelTablesOf(KernelVariant variant);
/// The variant in use: the last one the processor runs, unless one is forced.
KernelVariant ActiveKernelVariant();
/// Makes `variant`, which the processor must run, the one in use from now on, for every
/// thread: tests and benchmarks compare the variants through the public classes with it.
void ForceKernelVariant(KernelVariant variant);

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_KERNELS_KERNELVARIANTS_H
