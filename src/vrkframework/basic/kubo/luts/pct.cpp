// Pseudocolour table construction, lookup and the classic-table test.
#include "vrkframework/basic/kubo/luts/pct.h"

#include <algorithm>  // std::min

#include "vrkframework/basic/kubo/luts/breakpoints.h"
#include "vrkframework/platform/exception.h"
#include "vrkframework/platform/formatstring.h"

namespace kora::kubo {
namespace {

constexpr char kSourcePath[] = "vrkframework/basic/kubo/luts/pct";

std::vector<PCT::Entry> ClassicEntries(const PCT::Colour* colours) {
    std::vector<PCT::Entry> entries(detail::kClassicEntryCount);
    for (std::size_t i = 0; i < entries.size(); ++i) {
        entries[i] = {static_cast<double>(i), colours[i]};
    }
    return entries;
}

std::vector<PCT::Colour> InterleavePlanes(const unsigned char* planes) {
    constexpr std::size_t kPlane = detail::kClassicEntryCount;
    std::vector<PCT::Colour> colours(kPlane);
    for (std::size_t i = 0; i < kPlane; ++i) {
        colours[i] = {planes[i], planes[kPlane + i], planes[2 * kPlane + i]};
    }
    return colours;
}

// The signed difference keeps a falling component right. With t in [0, 1] the result lies
// between the two components, so truncating it to an int is always defined.
unsigned char Blend(unsigned char lower, unsigned char upper, double t) {
    const int difference = upper - lower;
    return static_cast<unsigned char>(static_cast<int>(difference * t + lower));
}

}  // namespace

PCT::PCT(const std::vector<Colour>& colours) {
    if (colours.size() != detail::kClassicEntryCount) {
        throw kora::DataException(kora::FormatString("PCT must have 256 entries, %d given.",
                                                     static_cast<int>(colours.size())),
                                  kSourcePath,
                                  "__cdecl kora::kubo::PCT::PCT(const class std::vector<struct "
                                  "kora::kubo::RGBTuple<unsigned char>,class std::allocator<struct "
                                  "kora::kubo::RGBTuple<unsigned char> > > &)",
                                  54);
    }
    m_entries = ClassicEntries(colours.data());
}

PCT::PCT(const std::vector<Entry>& entries) : m_entries(entries) {
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
    detail::SortByInput(m_entries);
}

PCT::PCT(const unsigned char* planes)
    : m_entries(ClassicEntries(InterleavePlanes(planes).data())) {}

PCT::Colour PCT::GetSearchedValue(double x) const {
    const detail::Bracket at = detail::Search(m_entries, x);
    const Entry& upper = m_entries[at.index];
    if (!at.between) {
        return upper.second;
    }
    const Entry& lower = m_entries[at.index - 1];
    const double position = (x - lower.first) / (upper.first - lower.first);
    // Sorted finite inputs give a position in [0, 1]. Infinite inputs can give NaN (inf / inf)
    // and inputs left unsorted by NaN anything at all: those count as the lower breakpoint
    // or, past 1, the upper one, rather than overflowing the conversion.
    const double t = position >= 0.0 ? std::min(position, 1.0) : 0.0;
    return {Blend(lower.second.r, upper.second.r, t), Blend(lower.second.g, upper.second.g, t),
            Blend(lower.second.b, upper.second.b, t)};
}

PCT::Colour PCT::GetValueByIndex(unsigned long long i) const {
    return m_entries[std::min<unsigned long long>(i, m_entries.size() - 1)].second;
}

bool IsClassicPCT(const PCT& pct) { return detail::HasClassicInputs(pct.GetEntries()); }

}  // namespace kora::kubo
