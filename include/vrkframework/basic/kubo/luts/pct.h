// Pseudocolour table: real values mapped to colours through sorted breakpoints.
#ifndef VRKFRAMEWORK_BASIC_KUBO_LUTS_PCT_H
#define VRKFRAMEWORK_BASIC_KUBO_LUTS_PCT_H

#include <cstdint>  // std::uint32_t
#include <vector>

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/luts/breakpointtable.h"

namespace kora::kubo {

/// A colour: red, green and blue components in that order.
template <class T>
struct RGBTuple {
    T r;  ///< red
    T g;  ///< green
    T b;  ///< blue
};

/// Maps a real input to a colour through breakpoints (input, colour) kept in ascending
/// order of input, by the rules of `LUT`: direct index, search, clamping at both ends.
/// Between two breakpoints each component is interpolated on its own and truncated toward
/// zero to a byte.
///
/// Every table holds at least the breakpoints it was built from. There is no move: moving
/// a table copies it, so no table is ever left without breakpoints.
///
/// From its base it offers, with `Entry` = std::pair<double, Colour> (input, colour):
/// `std::vector<Entry> GetEntries() const` and `void GetEntries(std::vector<Entry>& out)
/// const` (copies of the breakpoints), `unsigned int GetEntryCount() const` and
/// `void GetInputValueRange(double& min, double& max) const` (inputs of the first and the
/// last breakpoint).
class KUBO_API PCT : public detail::BreakpointTable<RGBTuple<unsigned char>> {
public:
    /// The colour of a breakpoint: one byte per component.
    using Colour = RGBTuple<unsigned char>;

    /// A classic 8-bit table: breakpoint i is (i, colours[i]).
    /// @throws kora::DataException when `colours` does not hold exactly 256 colours.
    explicit PCT(const std::vector<Colour>& colours);
    /// Copies `entries`, sorting them by input unless they already are in non-decreasing
    /// order (equal inputs then keep no defined order; NaN inputs sort last).
    /// @throws kora::ParameterException when fewer than 2 entries are given.
    explicit PCT(const std::vector<Entry>& entries);
    /// A classic 8-bit table from three planes of 256 bytes (red, green, blue) at `planes`,
    /// which must all be readable: breakpoint i is (i, (planes[i], planes[256 + i],
    /// planes[512 + i])).
    explicit PCT(const unsigned char* planes);

    /// @name Copying
    ///@{

    /// Copies the breakpoints; moving does the same.
    PCT(const PCT& other) = default;
    PCT& operator=(const PCT& other) = default;
    ///@}

    ~PCT() = default;

    /// The colour for `x`, found as `LUT::GetValue` finds an output; between breakpoints
    /// each component is (upper - lower) x t + lower, with t the position of `x` between
    /// their inputs, truncated toward zero.
    Colour GetValue(double x) const {
        // Inline so that a classic table answers without a call; the search is not.
        if (const Entry* direct = FindDirect(x)) {
            return direct->second;
        }
        const std::uint32_t packed = GetSearchedColour(x);
        return {static_cast<unsigned char>(packed), static_cast<unsigned char>(packed >> 8),
                static_cast<unsigned char>(packed >> 16)};
    }

    /// Colour of breakpoint `i`. An index past the end is not checked against; it reads
    /// the last breakpoint rather than memory outside the table.
    Colour GetValueByIndex(unsigned long long i) const { return GetClampedValue(i); }

private:
    // The colour comes back as red | green << 8 | blue << 16, which travels in a register.
    std::uint32_t GetSearchedColour(double x) const;

    /// For the gap below each breakpoint after the first, its colour's components less
    /// those of the breakpoint before, then those of the breakpoint before: six doubles a
    /// gap, read where a search lands between two breakpoints.
    std::vector<double> m_gaps;
};

/// True when `pct` has 256 breakpoints with the inputs 0 to 255, whatever their colours.
KUBO_API bool IsClassicPCT(const PCT& pct);

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_LUTS_PCT_H
