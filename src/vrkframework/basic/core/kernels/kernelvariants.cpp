// The registry of kernel variants: names, processor support, filled tables and the choice
// of the variant in use.
#include "vrkframework/basic/core/kernels/kernelvariants.h"

#include <array>
#include <atomic>

#include "vrkframework/basic/core/kernels/processortuning.h"

namespace kora::kubo::detail {
namespace {

// The processor's answer for every variant, asked once.
std::array<bool, kKernelVariantCount> AskProcessor() {
#define KUBO_DETAIL_VARIANT_SUPPORT(name, supported) static_cast<bool>(supported),
    return {{KUBO_FOR_EACH_KERNEL_VARIANT(KUBO_DETAIL_VARIANT_SUPPORT)}};
#undef KUBO_DETAIL_VARIANT_SUPPORT
}

const std::array<bool, kKernelVariantCount>& Support() {
    static const std::array<bool, kKernelVariantCount> support = AskProcessor();
    return support;
}

// Every variant's tables with the gaps filled from the one before, and the kernels this
// processor's family runs faster from the one before taken from there, built once.
std::array<KernelTables, kKernelVariantCount> FillAll() {
#define KUBO_DETAIL_VARIANT_TABLES(name, supported) KUBO_DETAIL_TABLES_FUNCTION(name)(),
    std::array<KernelTables, kKernelVariantCount> tables = {
        {KUBO_FOR_EACH_KERNEL_VARIANT(KUBO_DETAIL_VARIANT_TABLES)}};
#undef KUBO_DETAIL_VARIANT_TABLES
    const ProcessorFamily family = ThisProcessorFamily();
    for (std::size_t variant = 1; variant < tables.size(); ++variant) {
        FillGaps(tables[variant], tables[variant - 1]);
        TuneForFamily(tables[variant], tables[variant - 1], family);
    }
    return tables;
}

KernelVariant FastestSupported() {
    KernelVariant fastest = 0;
    for (KernelVariant variant = 0; variant < kKernelVariantCount; ++variant) {
        fastest = Support()[variant] ? variant : fastest;
    }
    return fastest;
}

// The variant in use: the fastest supported unless a test or benchmark forces another.
std::atomic<KernelVariant>& InUse() {
    static std::atomic<KernelVariant> inUse(FastestSupported());
    return inUse;
}

}  // namespace

const char* KernelVariantName(KernelVariant variant) { return kKernelVariantNames[variant]; }

bool IsKernelVariantSupported(KernelVariant variant) {
    return variant < kKernelVariantCount && Support()[variant];
}

const KernelTables& KernelTablesOf(KernelVariant variant) {
    static const std::array<KernelTables, kKernelVariantCount> tables = FillAll();
    return tables[variant];
}

KernelVariant ActiveKernelVariant() { return InUse().load(std::memory_order_relaxed); }

void ForceKernelVariant(KernelVariant variant) {
    if (IsKernelVariantSupported(variant)) {
        InUse().store(variant, std::memory_order_relaxed);
    }
}

const KernelTables& ActiveKernelTables() { return KernelTablesOf(ActiveKernelVariant()); }

}  // namespace kora::kubo::detail
