// What the lookup and pseudocolour tables share: their entries, the accessors of those and
// the direct-index rule, inline so that classic tables answer without a call.
#ifndef VRKFRAMEWORK_BASIC_KUBO_LUTS_BREAKPOINTTABLE_H
#define VRKFRAMEWORK_BASIC_KUBO_LUTS_BREAKPOINTTABLE_H

#include <algorithm>  // std::min
#include <cstdint>    // std::int64_t, std::uint32_t
#include <utility>    // std::pair
#include <vector>

namespace kora::kubo::detail {

/// Truncates toward zero as the processor's conversion does: NaN and values outside the
/// 64-bit range give the lowest value instead of undefined behaviour.
constexpr std::int64_t TruncateToInt64(double value) {
    // -2^63 is excluded only to keep both bounds exact; it converts to the lowest value.
    return value > -0x1p63 && value < 0x1p63 ? static_cast<std::int64_t>(value) : INT64_MIN;
}

/// Breakpoints (input, value) in ascending order of input. Base of `LUT` and `PCT`, which
/// construct them and never leave them empty.
template <class Value>
class BreakpointTable {
public:
    using Entry = std::pair<double, Value>;

    std::vector<Entry> GetEntries() const { return m_entries; }
    void GetEntries(std::vector<Entry>& out) const { out = m_entries; }
    unsigned int GetEntryCount() const { return static_cast<unsigned int>(m_entries.size()); }
    /// Inputs of the first and the last breakpoint.
    void GetInputValueRange(double& min, double& max) const {
        min = m_entries.front().first;
        max = m_entries.back().first;
    }

protected:
    /// Takes `entries`, sorted by input unless no neighbour pair is out of order (NaN inputs
    /// then last), and lays out their inputs for the search.
    explicit BreakpointTable(std::vector<Entry> entries);
    // Copies only: a move would leave a table without breakpoints.
    BreakpointTable(const BreakpointTable&) = default;
    BreakpointTable& operator=(const BreakpointTable&) = default;
    ~BreakpointTable() = default;

    /// The entry a whole input names directly, or null: entry k, where k is the low 32 bits
    /// of the truncation of `x`, when it exists and its input equals `x`. Among equal inputs
    /// this decides which one answers, so the rule is kept exactly, wrap-around included.
    const Entry* FindDirect(double x) const {
        const auto k = static_cast<std::uint32_t>(TruncateToInt64(x));
        return k < m_entries.size() && m_entries[k].first == x ? &m_entries[k] : nullptr;
    }

    /// Value of breakpoint `i`; an index past the end reads the last one rather than memory
    /// outside the table.
    const Value& GetClampedValue(unsigned long long i) const {
        return m_entries[std::min<unsigned long long>(i, m_entries.size() - 1)].second;
    }

    std::vector<Entry> m_entries;
    /// The inputs again, in blocks of 16 that a search counts through; empty where the
    /// search halves the entries instead.
    std::vector<double> m_inputBlocks;
};

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_LUTS_BREAKPOINTTABLE_H
