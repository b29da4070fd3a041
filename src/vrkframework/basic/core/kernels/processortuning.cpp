// The table of processor families whose measurements call for kernels from the variant
// below, and the reading of the processor's family.
#include "vrkframework/basic/core/kernels/processortuning.h"

#include <cstring>  // std::memcmp

#if defined(__x86_64__) || defined(__i386__)
#include <cpuid.h>
#endif

#include "vrkframework/basic/core/typeconv/componenttraits.h"

namespace kora::kubo::detail {
namespace {

/// Which kernels a family takes from the variant below.
enum class FromBelow {
    /// Conversions between two integer types: they only clamp, widen or narrow.
    kIntegerConversions,
};

struct FamilyTuning {
    bool amd;
    unsigned int family;
    unsigned int vectorBits;  ///< the variants it applies to
    FromBelow kernels;
};

/// AMD family 25 (Zen 4) runs 512-bit vectors in two 256-bit halves: conversions between
/// integer types streamed out of cache faster from the 256-bit kernels there. Family 26 (Zen
/// 5), with full-width units, measured the 512-bit kernels at or ahead on every pair (up to
/// four times faster for the narrowings from 64-bit integers in cache). Intel family 6
/// (model 207) ran the 256-bit kernels faster on 1 of 56 integer pairs out of cache and 7
/// in cache, by at most 23 %, against a median gain of 20 % for the 512-bit ones: no row.
constexpr FamilyTuning kFamilyTunings[] = {
    {true, 25, 512, FromBelow::kIntegerConversions},
};

void TakeIntegerConversions(typeconv::detail::KernelSet& kernels,
                            const typeconv::detail::KernelSet& below) {
    using typeconv::detail::kComponentCount;
    using typeconv::detail::kComponentIsInteger;
    for (std::size_t from = 0; from < kComponentCount; ++from) {
        for (std::size_t to = 0; to < kComponentCount; ++to) {
            if (kComponentIsInteger[from] && kComponentIsInteger[to]) {
                kernels.convert[from][to] = below.convert[from][to];
                kernels.convertRealParts[from][to] = below.convertRealParts[from][to];
            }
        }
    }
}

}  // namespace

ProcessorFamily ThisProcessorFamily() {
    ProcessorFamily found;
#if defined(__x86_64__) || defined(__i386__)
    unsigned int highest = 0;
    unsigned int vendor[3] = {};
    if (__get_cpuid(0, &highest, &vendor[0], &vendor[2], &vendor[1]) == 0 || highest < 1) {
        return found;
    }
    found.amd = std::memcmp(vendor, "AuthenticAMD", sizeof vendor) == 0;
    unsigned int signature = 0;
    unsigned int unused[3] = {};
    __get_cpuid(1, &signature, &unused[0], &unused[1], &unused[2]);
    const unsigned int base = (signature >> 8) & 0xFu;
    found.family = base == 0xFu ? base + ((signature >> 20) & 0xFFu) : base;
#endif
    return found;
}

void TuneForFamily(KernelTables& tables, const KernelTables& below, ProcessorFamily family) {
    for (const FamilyTuning& tuning : kFamilyTunings) {
        if (tuning.amd != family.amd || tuning.family != family.family ||
            tuning.vectorBits != tables.vectorBits) {
            continue;
        }
        switch (tuning.kernels) {
            case FromBelow::kIntegerConversions:
                TakeIntegerConversions(tables.conversion, below.conversion);
                break;
        }
    }
}

}  // namespace kora::kubo::detail
