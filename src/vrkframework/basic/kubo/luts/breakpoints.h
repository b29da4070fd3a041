// Breakpoint rules shared by the lookup and pseudocolour tables: their order and the search
// for an input that has no breakpoint of its own.
#ifndef VRKFRAMEWORK_BASIC_KUBO_LUTS_BREAKPOINTS_H
#define VRKFRAMEWORK_BASIC_KUBO_LUTS_BREAKPOINTS_H

#include <algorithm>  // std::adjacent_find, std::is_sorted, std::sort
#include <cmath>      // std::isnan
#include <cstddef>    // std::size_t
#include <cstdint>    // std::int64_t
#include <cstring>    // std::memcpy
#include <limits>
#include <vector>

#include "vrkframework/platform/exception.h"

namespace kora::kubo::detail {

/// Breakpoints of a classic 8-bit table, whose inputs are 0 to 255.
constexpr std::size_t kClassicEntryCount = 256;

/// The entries of a classic table: entry i is (i, values[i]) for i from 0 to 255.
template <class Entry, class Source>
std::vector<Entry> ClassicEntries(const Source* values) {
    std::vector<Entry> entries(kClassicEntryCount);
    for (std::size_t i = 0; i < kClassicEntryCount; ++i) {
        entries[i] = {static_cast<double>(i), values[i]};
    }
    return entries;
}

/// `bytes`, the 256 (or 3 x 256) bytes a classic table is read from.
/// @throws kora::DataException "The table bytes are NULL." when there are none.
inline const unsigned char* CheckedTableBytes(const unsigned char* bytes, const char* sourcePath,
                                              const char* function) {
    if (bytes == nullptr) {
        throw kora::DataException("The table bytes are NULL.", sourcePath, function, 0);
    }
    return bytes;
}

/// Sorts (input, value) entries by input unless no neighbour pair is out of order.
template <class Entry>
void SortByInput(std::vector<Entry>& entries) {
    const auto byInput = [](const Entry& a, const Entry& b) { return a.first < b.first; };
    if (std::is_sorted(entries.begin(), entries.end(), byInput)) {
        return;
    }
    // NaN is unordered against everything, which is no strict weak order and may send the
    // sort out of bounds; ranking NaN after every number restores one.
    std::sort(entries.begin(), entries.end(), [](const Entry& a, const Entry& b) {
        return a.first < b.first || (std::isnan(b.first) && !std::isnan(a.first));
    });
}

/// True when there are 256 entries whose inputs are 0 to 255 in order.
template <class Entry>
bool HasClassicInputs(const std::vector<Entry>& entries) {
    if (entries.size() != kClassicEntryCount) {
        return false;
    }
    for (std::size_t i = 0; i < kClassicEntryCount; ++i) {
        if (entries[i].first != static_cast<double>(i)) {
            return false;
        }
    }
    return true;
}

/// Index of the first of `count` (at least 1) entries whose input is not below `x`, or
/// `count` when there is none. The halving steps compile to conditional moves, so random
/// inputs cost no mispredicted branches; NaN is below nothing and yields 0.
template <class Entry>
std::size_t LowerBound(const Entry* entries, std::size_t count, double x) {
    const Entry* first = entries;
    // The answer stays within [first, first + count]; each step keeps the half holding it.
    while (count > 1) {
        const std::size_t half = count / 2;
        first = first[half].first < x ? first + half : first;
        count -= half;
    }
    return static_cast<std::size_t>(first - entries) + static_cast<std::size_t>(first->first < x);
}

/// Inputs a block holds, and blocks a table's inputs may fill before the search halves
/// instead of counting.
constexpr std::size_t kBlockInputs = 16;
constexpr std::size_t kMaxInputBlocks = 16;

/// How many of the 16 inputs at `block` are below `x`, two at a time in vector lanes: a
/// compare gives -1 in a lane whose input is below, which is subtracted. Unlike a halving
/// step no comparison waits for another, and four running counts keep the sums short, so a
/// lookup's search is a few cycles deep. Compilers without vector types count one by one.
inline std::size_t CountBelow(const double* block, double x) {
#if defined(__GNUC__)
    using Pair = double __attribute__((vector_size(16)));
    using Counts = std::int64_t __attribute__((vector_size(16)));
    constexpr std::size_t kLanes = 2;
    constexpr std::size_t kSums = 4;
    const Pair limit = {x, x};
    Counts below[kSums] = {};
    for (std::size_t i = 0; i < kBlockInputs; i += kLanes) {
        Pair inputs;
        std::memcpy(&inputs, block + i, sizeof inputs);
        below[i / kLanes % kSums] -= reinterpret_cast<Counts>(inputs < limit);
    }
    const Counts total = (below[0] + below[1]) + (below[2] + below[3]);
    return static_cast<std::size_t>(total[0] + total[1]);
#else
    std::size_t below = 0;
    for (std::size_t i = 0; i < kBlockInputs; ++i) {
        below += block[i] < x ? 1 : 0;
    }
    return below;
#endif
}

/// The inputs of `entries` laid out for `LowerBoundInBlocks`: up to 16 inputs make one block;
/// more make a block of every 16th input from the 16th on, then the inputs in blocks. Both are
/// padded with NaN, which is below nothing. Counting finds the lower bound only where the
/// inputs below any `x` come first, which NaN among numbers breaks; such tables, and those of
/// more than 256 entries, get no blocks.
template <class Entry>
std::vector<double> InputBlocks(const std::vector<Entry>& entries) {
    const std::size_t count = entries.size();
    const auto nanBeforeNumber = std::adjacent_find(
        entries.begin(), entries.end(),
        [](const Entry& a, const Entry& b) { return std::isnan(a.first) && !std::isnan(b.first); });
    if (count == 0 || count > kBlockInputs * kMaxInputBlocks || nanBeforeNumber != entries.end()) {
        return {};
    }
    const std::size_t blocks = (count + kBlockInputs - 1) / kBlockInputs;
    const std::size_t fences = blocks > 1 ? kBlockInputs : 0;
    std::vector<double> laidOut(fences + blocks * kBlockInputs,
                                std::numeric_limits<double>::quiet_NaN());
    for (std::size_t block = 1; block < blocks; ++block) {
        laidOut[block - 1] = entries[block * kBlockInputs].first;
    }
    for (std::size_t i = 0; i < count; ++i) {
        laidOut[fences + i] = entries[i].first;
    }
    return laidOut;
}

/// `LowerBound` through the blocks of `InputBlocks`: the count of every-16th inputs below `x`
/// names the block holding the answer, whose own count completes it.
inline std::size_t LowerBoundInBlocks(const std::vector<double>& inputBlocks, double x) {
    const double* inputs = inputBlocks.data();
    std::size_t block = 0;
    if (inputBlocks.size() > kBlockInputs) {
        block = CountBelow(inputs, x);
        inputs += kBlockInputs;
    }
    return block * kBlockInputs + CountBelow(inputs + block * kBlockInputs, x);
}

/// Where an input falls among the entries: `index` is the entry whose value answers as it
/// stands, or, when `between` is set, the upper of the two entries to interpolate.
struct Bracket {
    std::size_t index;
    bool between;
};

/// Places `x` among sorted entries (at least 1) once the direct index has missed: past the
/// last input the last entry answers, at or below the first (or NaN) the first, an equal
/// input its first entry; otherwise `x` lies between `index - 1` and `index`. Counts through
/// `inputBlocks` where the table has them (see `InputBlocks`), halves otherwise.
template <class Entry>
Bracket Search(const std::vector<Entry>& entries, const std::vector<double>& inputBlocks,
               double x) {
    const std::size_t count = entries.size();
    const std::size_t upper = inputBlocks.empty() ? LowerBound(entries.data(), count, x)
                                                  : LowerBoundInBlocks(inputBlocks, x);
    if (upper == count) {
        return {count - 1, false};
    }
    return {upper, upper != 0 && entries[upper].first != x};
}

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_LUTS_BREAKPOINTS_H
