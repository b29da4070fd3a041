// Pseudocolour table construction, lookup and the classic-table test.
#include "vrkframework/basic/kubo/luts/pct.h"

#include <cstddef>   // std::size_t
#include <cstdint>   // std::uint32_t
#include <iterator>  // std::begin, std::end

#include "vrkframework/basic/kubo/luts/breakpoints.h"
#include "vrkframework/platform/exception.h"
#include "vrkframework/platform/formatstring.h"

namespace kora::kubo {
namespace {

constexpr char kSourcePath[] = "vrkframework/basic/kubo/luts/pct";

// The colours of a classic table, once their count is checked.
const PCT::Colour* ClassicColours(const std::vector<PCT::Colour>& colours) {
    if (colours.size() != detail::kClassicEntryCount) {
        throw kora::DataException(kora::FormatString("PCT must have 256 entries, %d given.",
                                                     static_cast<int>(colours.size())),
                                  kSourcePath,
                                  "__cdecl kora::kubo::PCT::PCT(const class std::vector<struct "
                                  "kora::kubo::RGBTuple<unsigned char>,class std::allocator<struct "
                                  "kora::kubo::RGBTuple<unsigned char> > > &)",
                                  54);
    }
    return colours.data();
}

std::vector<PCT::Colour> InterleavePlanes(const unsigned char* planes) {
    constexpr std::size_t kPlane = detail::kClassicEntryCount;
    std::vector<PCT::Colour> colours(kPlane);
    for (std::size_t i = 0; i < kPlane; ++i) {
        colours[i] = {planes[i], planes[kPlane + i], planes[2 * kPlane + i]};
    }
    return colours;
}

// The six doubles of each gap between neighbouring breakpoints (see PCT::m_gaps): the
// difference of two whole components is exact, so a falling component comes out right.
std::vector<double> Gaps(const std::vector<PCT::Entry>& entries) {
    std::vector<double> gaps;
    gaps.reserve(6 * (entries.size() - 1));
    for (std::size_t i = 1; i < entries.size(); ++i) {
        const PCT::Colour& lower = entries[i - 1].second;
        const PCT::Colour& upper = entries[i].second;
        const double lowers[] = {static_cast<double>(lower.r), static_cast<double>(lower.g),
                                 static_cast<double>(lower.b)};
        const double uppers[] = {static_cast<double>(upper.r), static_cast<double>(upper.g),
                                 static_cast<double>(upper.b)};
        for (std::size_t c = 0; c < 3; ++c) {
            gaps.push_back(uppers[c] - lowers[c]);
        }
        gaps.insert(gaps.end(), std::begin(lowers), std::end(lowers));
    }
    return gaps;
}

// difference x t + lower: with t in [0, 1] the result lies between the two components, so
// it truncates to a byte value without any masking.
std::uint32_t Blend(double difference, double lower, double t) {
    return static_cast<std::uint32_t>(static_cast<int>(difference * t + lower));
}

// The colour travels as red | green << 8 | blue << 16: an integer is returned in a register,
// where a three-byte struct gets assembled in memory and reloaded at a store-forwarding stall.
std::uint32_t Pack(std::uint32_t r, std::uint32_t g, std::uint32_t b) {
    return r | g << 8 | b << 16;
}

std::uint32_t Pack(const PCT::Colour& colour) { return Pack(colour.r, colour.g, colour.b); }

}  // namespace

PCT::PCT(const std::vector<Colour>& colours)
    : BreakpointTable(detail::ClassicEntries<Entry>(ClassicColours(colours))),
      m_gaps(Gaps(m_entries)) {}

PCT::PCT(const std::vector<Entry>& entries) : BreakpointTable(entries) {
    if (entries.size() < 2) {
        throw kora::ParameterException(
            "PCT", kora::ParameterException::PARAMETER_TOO_FEW_ITEMS,
            kora::FormatString("A %d PCT entries", static_cast<int>(entries.size())),
            "At least 2 PCT entries", "desc", kSourcePath,
            "__cdecl kora::kubo::PCT::PCT(const class std::vector<struct std::pair<double,struct "
            "kora::kubo::RGBTuple<unsigned char> >,class std::allocator<struct "
            "std::pair<double,struct kora::kubo::RGBTuple<unsigned char> > > > &)",
            80);
    }
    m_gaps = Gaps(m_entries);
}

PCT::PCT(const unsigned char* planes)
    : BreakpointTable(detail::ClassicEntries<Entry>(
          InterleavePlanes(
              detail::CheckedTableBytes(planes, kSourcePath,
                                        "__cdecl kora::kubo::PCT::PCT(const unsigned char *)"))
              .data())),
      m_gaps(Gaps(m_entries)) {}

std::uint32_t PCT::GetSearchedColour(double x) const {
    const detail::Bracket at = detail::Search(m_entries, m_inputBlocks, x);
    const Entry& upper = m_entries[at.index];
    if (!at.between) {
        return Pack(upper.second);
    }
    const Entry& lower = m_entries[at.index - 1];
    const double position = (x - lower.first) / (upper.first - lower.first);
    // Sorted finite inputs give a position in [0, 1]. Infinite inputs can give NaN (inf / inf)
    // and inputs left unsorted by NaN anything at all: those are clamped to [0, 1], NaN to 1,
    // so that no conversion overflows.
    const double below = position < 1.0 ? position : 1.0;
    const double t = below > 0.0 ? below : 0.0;
    const double* gap = &m_gaps[6 * (at.index - 1)];
    return Pack(Blend(gap[0], gap[3], t), Blend(gap[1], gap[4], t), Blend(gap[2], gap[5], t));
}

bool IsClassicPCT(const PCT& pct) { return detail::HasClassicInputs(pct.GetEntries()); }

}  // namespace kora::kubo
