// Lookup table: real values mapped through sorted breakpoints with linear interpolation.
#ifndef VRKFRAMEWORK_BASIC_KUBO_LUTS_LUT_H
#define VRKFRAMEWORK_BASIC_KUBO_LUTS_LUT_H

#include <vector>

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/luts/breakpointtable.h"

namespace kora::kubo {

/// Maps a real input to a real output through breakpoints (input, output) kept in
/// ascending order of input. An input between two breakpoints is interpolated linearly;
/// one at or beyond either end takes the output of that end.
///
/// Every table holds at least the breakpoints it was built from. There is no move: moving
/// a table copies it, so no table is ever left without breakpoints.
///
/// From its base it offers, with `Entry` = std::pair<double, double> (input, output):
/// `std::vector<Entry> GetEntries() const` and `void GetEntries(std::vector<Entry>& out)
/// const` (copies of the breakpoints), `unsigned int GetEntryCount() const` and
/// `void GetInputValueRange(double& min, double& max) const` (inputs of the first and the
/// last breakpoint).
class KUBO_API LUT : public detail::BreakpointTable<double> {
public:
    /// A classic 8-bit table: breakpoint i is (i, values[i]).
    /// @throws kora::DataException when `values` does not hold exactly 256 bytes.
    explicit LUT(const std::vector<unsigned char>& values);
    /// Copies `entries`, sorting them by input unless they already are in non-decreasing
    /// order (equal inputs then keep no defined order; NaN inputs sort last).
    /// @throws kora::ParameterException when fewer than 2 entries are given.
    explicit LUT(const std::vector<Entry>& entries);
    /// A classic 8-bit table from the 256 bytes at `values`, which must all be readable.
    explicit LUT(const unsigned char* values);

    /// @name Copying
    ///@{

    /// Copies the breakpoints; moving does the same.
    LUT(const LUT& other) = default;
    LUT& operator=(const LUT& other) = default;
    ///@}

    ~LUT() = default;

    /// The output for `x`. A whole `x` whose truncation indexes a breakpoint of that input
    /// answers directly; otherwise the first breakpoint not below `x` is searched: none
    /// gives the last output, the first breakpoint (also for NaN) or an equal input gives
    /// that output, anything else interpolates with the breakpoint before it.
    double GetValue(double x) const {
        // Inline so that a classic table answers without a call; the search is not.
        if (const Entry* direct = FindDirect(x)) {
            return direct->second;
        }
        return GetSearchedValue(x);
    }

    /// Output of breakpoint `i`. An index past the end is not checked against; it reads
    /// the last breakpoint rather than memory outside the table.
    double GetValueByIndex(unsigned long long i) const { return GetClampedValue(i); }

private:
    double GetSearchedValue(double x) const;
};

/// True when `lut` has 256 breakpoints with the inputs 0 to 255 and whole outputs from 0
/// to 255.
KUBO_API bool IsClassicLUT(const LUT& lut);

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_LUTS_LUT_H
