// The direct-index rule of the breakpoint tables, inline so that classic tables answer
// without a call into the library.
#ifndef VRKFRAMEWORK_BASIC_KUBO_LUTS_DIRECTINDEX_H
#define VRKFRAMEWORK_BASIC_KUBO_LUTS_DIRECTINDEX_H

#include <cstdint>  // std::int64_t, std::uint32_t
#include <vector>

namespace kora::kubo::detail {

/// Truncates toward zero as the processor's conversion does: NaN and values outside the
/// 64-bit range give the lowest value instead of undefined behaviour.
constexpr std::int64_t TruncateToInt64(double value) {
    // -2^63 is excluded only to keep both bounds exact; it converts to the lowest value.
    return value > -0x1p63 && value < 0x1p63 ? static_cast<std::int64_t>(value) : INT64_MIN;
}

/// The entry a whole input names directly, or null: entry k, where k is the low 32 bits of
/// the truncation of `x`, when it exists and its input equals `x`. Among equal inputs this
/// decides which one answers, so the rule is kept exactly, wrap-around included.
template <class Entry>
const Entry* FindDirect(const std::vector<Entry>& entries, double x) {
    const std::uint32_t k = static_cast<std::uint32_t>(TruncateToInt64(x));
    return k < entries.size() && entries[k].first == x ? &entries[k] : nullptr;
}

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_LUTS_DIRECTINDEX_H
