// The one place where a processor family changes which kernel runs: the kernels that
// measurement on that family found faster in the variant below the widest it supports
// (private to the library).
#ifndef VRKFRAMEWORK_BASIC_CORE_KERNELS_PROCESSORTUNING_H
#define VRKFRAMEWORK_BASIC_CORE_KERNELS_PROCESSORTUNING_H

#include "vrkframework/basic/core/kernels/kerneltables.h"

namespace kora::kubo::detail {

/// A processor family as the processor names it: vendor and family number (AMD's family 25
/// and 26 are Zen 4 and Zen 5). Zero and empty where the processor does not say.
struct ProcessorFamily {
    bool amd = false;
    unsigned int family = 0;
};

/// The family of the processor running this code.
ProcessorFamily ThisProcessorFamily();

/// Replaces in `tables` (a variant with vectors of `tables.vectorBits` bits) the kernels that
/// `family` runs faster from `below`, the variant before it; leaves other families' tables
/// as compiled.
void TuneForFamily(KernelTables& tables, const KernelTables& below, ProcessorFamily family);

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_KERNELS_PROCESSORTUNING_H
