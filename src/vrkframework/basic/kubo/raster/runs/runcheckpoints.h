// Checkpoints into a stream of run counts, so that a seek starts its walk near its target
// instead of at the start of the stream (private to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_RUNCHECKPOINTS_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_RUNCHECKPOINTS_H

#include <algorithm>  // std::min, std::upper_bound
#include <cstddef>    // std::size_t
#include <cstdint>    // std::uint32_t, std::uint64_t
#include <vector>

namespace kora::kubo::detail {

/// Streams index themselves every 1 KiB of runs: 8 bytes of checkpoint per KiB keeps an index
/// under 1 % of what it indexes, and the walk from a checkpoint to any position covers at
/// most 1 KiB.
constexpr unsigned int kCheckpointSpacingBits = 10;
constexpr std::size_t kStreamBytesPerCheckpoint = std::size_t{1} << kCheckpointSpacingBits;

/// A place in a stream of runs: the index of a run and the sum of the counts before it.
struct Checkpoint {
    std::size_t run;
    std::uint64_t total;
};

/// The sum of the counts of `count` runs of kStride bytes each. A block's counts fit 32
/// bits, which lets the sum vectorise.
template <std::size_t kStride>
std::uint32_t SumOfCounts(const unsigned char* runs, std::size_t count) {
    std::uint32_t sum = 0;
    for (std::size_t run = 0; run < count; ++run) {
        sum += runs[run * kStride];
    }
    return sum;
}

/// Appends to `totals` the running total of the counts of `runCount` runs of `stride` (1 or
/// 2) bytes each, the count in the first, at every `spacing`-th run after the first while
/// runs remain beyond it: totals[b] is the sum of the counts before run (b + 1) x spacing.
/// That makes (runCount - 1) / spacing totals.
inline void AppendCheckpointTotals(const unsigned char* runs, std::size_t runCount,
                                   std::size_t stride, std::size_t spacing,
                                   std::vector<std::uint64_t>& totals) {
    std::uint64_t total = 0;
    for (std::size_t first = 0; runCount - first > spacing; first += spacing) {
        const unsigned char* block = runs + first * stride;
        total += stride == 1 ? SumOfCounts<1>(block, spacing) : SumOfCounts<2>(block, spacing);
        totals.push_back(total);
    }
}

/// The last checkpoint of `count` totals (as AppendCheckpointTotals makes them) whose total
/// is at most `limit`, or the first run when none is.
inline Checkpoint LastCheckpointWithin(const std::uint64_t* totals, std::size_t count,
                                       std::size_t spacing, std::uint64_t limit) {
    const std::size_t after =
        static_cast<std::size_t>(std::upper_bound(totals, totals + count, limit) - totals);
    return after == 0 ? Checkpoint{0, 0} : Checkpoint{after * spacing, totals[after - 1]};
}

/// The checkpoints of a whole stream whose runs take `stride` (1 or 2) bytes each.
class RunCheckpoints {
public:
    RunCheckpoints(const unsigned char* runs, std::size_t runCount, std::size_t stride)
        : m_spacingBits(kCheckpointSpacingBits - (stride == 1 ? 0 : 1)) {
        m_totals.reserve(runCount / Spacing());
        AppendCheckpointTotals(runs, runCount, stride, Spacing(), m_totals);
    }

    /// The last checkpoint after run `pastRun` whose total is at most `limit`, or the first
    /// run (total 0) when none is. A walk standing at `pastRun` asks in constant time whether
    /// a checkpoint lies between it and its target.
    Checkpoint LastWithin(std::uint64_t limit, std::size_t pastRun = 0) const {
        // Checkpoint b stands at run (b + 1) x spacing.
        const std::size_t first = std::min(pastRun >> m_spacingBits, m_totals.size());
        if (first == m_totals.size() || m_totals[first] > limit) {
            return Checkpoint{0, 0};
        }
        // The target usually lies a few checkpoints ahead: steps that double from the first
        // one bracket it, and the search runs within that bracket only.
        std::size_t within = first;
        std::size_t step = 1;
        while (m_totals.size() - within > step && m_totals[within + step] <= limit) {
            within += step;
            step *= 2;
        }
        const std::size_t end = std::min(within + step, m_totals.size());
        const Checkpoint found =
            LastCheckpointWithin(m_totals.data() + within, end - within, Spacing(), limit);
        return Checkpoint{found.run + (within << m_spacingBits), found.total};
    }

private:
    /// Runs from one checkpoint to the next.
    std::size_t Spacing() const { return std::size_t{1} << m_spacingBits; }

    unsigned int m_spacingBits;  ///< log2 of the spacing: a shift, not a division, per seek
    std::vector<std::uint64_t> m_totals;
};

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_RUNCHECKPOINTS_H
