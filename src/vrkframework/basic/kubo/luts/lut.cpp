// Lookup table construction, lookup and the classic-table test.
#include "vrkframework/basic/kubo/luts/lut.h"

#include <algorithm>  // std::all_of

#include "vrkframework/basic/kubo/luts/breakpoints.h"
#include "vrkframework/platform/exception.h"
#include "vrkframework/platform/formatstring.h"

namespace kora::kubo {
namespace {

constexpr char kSourcePath[] = "vrkframework/basic/kubo/luts/lut";

// The bytes of a classic table, once their count is checked.
const unsigned char* ClassicBytes(const std::vector<unsigned char>& values) {
    if (values.size() != detail::kClassicEntryCount) {
        throw kora::DataException(
            kora::FormatString("LUT must have 256 entries, %d given.",
                               static_cast<int>(values.size())),
            kSourcePath,
            "__cdecl kora::kubo::LUT::LUT(const class std::vector<unsigned char,class "
            "std::allocator<unsigned char> > &)",
            50);
    }
    return values.data();
}

// A whole output from 0 to 255 survives truncation to a byte and back unchanged.
bool IsByteValue(double output) {
    return static_cast<double>(static_cast<unsigned char>(detail::TruncateToInt64(output))) ==
           output;
}

}  // namespace

LUT::LUT(const std::vector<unsigned char>& values) : LUT(ClassicBytes(values)) {}

LUT::LUT(const std::vector<Entry>& entries) : BreakpointTable(entries) {
    if (entries.size() < 2) {
        throw kora::ParameterException(
            "LUT", kora::ParameterException::PARAMETER_TOO_FEW_ITEMS,
            kora::FormatString("A %d LUT entries", static_cast<int>(entries.size())),
            "At least 2 LUT entries", "desc", kSourcePath,
            "__cdecl kora::kubo::LUT::LUT(const class std::vector<struct "
            "std::pair<double,double>,class std::allocator<struct std::pair<double,double> > > "
            "&)",
            80);
    }
}

LUT::LUT(const unsigned char* values)
    : BreakpointTable(detail::ClassicEntries<Entry>(detail::CheckedTableBytes(
          values, kSourcePath, "__cdecl kora::kubo::LUT::LUT(const unsigned char *)"))) {}

double LUT::GetSearchedValue(double x) const {
    const detail::Bracket at = detail::Search(m_entries, m_inputBlocks, x);
    const Entry& upper = m_entries[at.index];
    if (!at.between) {
        return upper.second;
    }
    const Entry& lower = m_entries[at.index - 1];
    // Kept in this order of operations: a precomputed slope would round differently.
    return (x - lower.first) / (upper.first - lower.first) * (upper.second - lower.second) +
           lower.second;
}

bool IsClassicLUT(const LUT& lut) {
    const std::vector<LUT::Entry> entries = lut.GetEntries();
    return detail::HasClassicInputs(entries) &&
           std::all_of(entries.begin(), entries.end(),
                       [](const LUT::Entry& entry) { return IsByteValue(entry.second); });
}

}  // namespace kora::kubo
