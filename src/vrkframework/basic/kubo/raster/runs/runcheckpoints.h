// Checkpoints into a stream of run counts, so that a seek starts its walk near its target
// instead of at the start of the stream (private to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_RUNCHECKPOINTS_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_RUNCHECKPOINTS_H

#include <algorithm>  // std::min, std::upper_bound
#include <cstddef>    // std::size_t
#include <cstdint>    // std::uint32_t, std::uint64_t
#include <vector>

#include "vrkframework/basic/core/kernels/prefetch.h"

namespace kora::kubo::detail {

/// Rows of a row mask index themselves every 1 KiB of runs with a 64-bit total each: 8 bytes
/// per KiB keeps such an index under 1 % of what it indexes.
constexpr unsigned int kCheckpointSpacingBits = 10;
constexpr std::size_t kStreamBytesPerCheckpoint = std::size_t{1} << kCheckpointSpacingBits;

/// Whole streams index themselves twice as densely, every 512 bytes of runs, in the same share
/// of memory: a 32-bit offset per checkpoint from a 64-bit base per group of 16 (4.5 bytes
/// per 512, 0.88 %). A window seek walks half as far from its checkpoint.
constexpr unsigned int kStreamCheckpointSpacingBits = 9;
constexpr unsigned int kCheckpointGroupBits = 4;

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

/// Calls `take` with the running total of the counts of `runCount` runs of `stride` (1 or 2)
/// bytes each, the count in the first, at every `spacing`-th run after the first while runs
/// remain beyond it: the b-th call gets the sum of the counts before run (b + 1) x spacing.
/// That makes (runCount - 1) / spacing calls.
template <class Take>
void ForEachCheckpointTotal(const unsigned char* runs, std::size_t runCount, std::size_t stride,
                            std::size_t spacing, Take take) {
    std::uint64_t total = 0;
    for (std::size_t first = 0; runCount - first > spacing; first += spacing) {
        const unsigned char* block = runs + first * stride;
        total += stride == 1 ? SumOfCounts<1>(block, spacing) : SumOfCounts<2>(block, spacing);
        take(total);
    }
}

/// Appends the checkpoint totals of ForEachCheckpointTotal to `totals`.
inline void AppendCheckpointTotals(const unsigned char* runs, std::size_t runCount,
                                   std::size_t stride, std::size_t spacing,
                                   std::vector<std::uint64_t>& totals) {
    ForEachCheckpointTotal(runs, runCount, stride, spacing,
                           [&](std::uint64_t total) { totals.push_back(total); });
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
        : m_spacingBits(kStreamCheckpointSpacingBits - (stride == 1 ? 0 : 1)) {
        m_offsets.reserve(runCount / Spacing());
        m_bases.reserve((runCount / Spacing() >> kCheckpointGroupBits) + 1);
        ForEachCheckpointTotal(runs, runCount, stride, Spacing(), [&](std::uint64_t total) {
            if (m_offsets.size() % (std::size_t{1} << kCheckpointGroupBits) == 0) {
                m_bases.push_back(total);
            }
            // A group spans 16 x 512 runs of at most 255 each: its offsets fit 32 bits.
            m_offsets.push_back(static_cast<std::uint32_t>(total - m_bases.back()));
        });
    }

    /// The last checkpoint after run `pastRun` whose total is at most `limit`, or the first
    /// run (total 0) when none is. A walk standing at `pastRun` asks in constant time whether
    /// a checkpoint lies between it and its target. `nearRun`, when ahead of `pastRun`, is a
    /// guess of where the target lies: the search starts there when its checkpoint is within
    /// the limit, and ends after one more comparison when the guess is right.
    Checkpoint LastWithin(std::uint64_t limit, std::size_t pastRun = 0,
                          std::size_t nearRun = 0) const {
        // Checkpoint b stands at run (b + 1) x spacing.
        const std::size_t count = m_offsets.size();
        std::size_t first = std::min(CheckpointAfter(pastRun), count);
        if (first == count || Total(first) > limit) {
            return Checkpoint{0, 0};
        }
        const std::size_t guess = CheckpointAfter(nearRun);
        if (guess > first && guess < count && Total(guess) <= limit) {
            first = guess;
        }
        // The target usually lies a few checkpoints ahead: steps that double from the walk's
        // own checkpoint bracket it, and halving steps search that bracket only, always
        // standing on a checkpoint within the limit.
        std::size_t checkpoint = first;
        std::size_t step = 1;
        while (count - checkpoint > step && Total(checkpoint + step) <= limit) {
            checkpoint += step;
            step *= 2;
        }
        for (std::size_t left = std::min(step, count - checkpoint); left > 1;) {
            const std::size_t half = left / 2;
            checkpoint = Total(checkpoint + half) <= limit ? checkpoint + half : checkpoint;
            left -= half;
        }
        return Checkpoint{(checkpoint + 1) << m_spacingBits, Total(checkpoint)};
    }

    /// The run of the last checkpoint at or before `run`, where a seek to a target within
    /// `run` starts its walk (the first run when none is).
    std::size_t WalkStart(std::size_t run) const {
        return std::min(CheckpointAfter(run), m_offsets.size()) << m_spacingBits;
    }

    /// Asks for the checkpoint that a search guessing `nearRun` reads first to be brought
    /// into the cache.
    void PrefetchNear(std::size_t nearRun) const {
        const std::size_t guess = CheckpointAfter(nearRun);
        if (guess < m_offsets.size()) {
            PrefetchForReading(&m_offsets[guess], sizeof m_offsets[guess]);
            PrefetchForReading(&m_bases[guess >> kCheckpointGroupBits], sizeof(std::uint64_t));
        }
    }

private:
    /// The first checkpoint that stands after `run` (past the last when none does).
    std::size_t CheckpointAfter(std::size_t run) const { return run >> m_spacingBits; }

    /// Runs from one checkpoint to the next.
    std::size_t Spacing() const { return std::size_t{1} << m_spacingBits; }

    std::uint64_t Total(std::size_t checkpoint) const {
        return m_bases[checkpoint >> kCheckpointGroupBits] + m_offsets[checkpoint];
    }

    unsigned int m_spacingBits;          ///< log2 of the spacing: a shift, not a division, per seek
    std::vector<std::uint64_t> m_bases;  ///< the total at the first checkpoint of each group
    std::vector<std::uint32_t> m_offsets;  ///< each checkpoint's total less its group's base
};

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_RUNCHECKPOINTS_H
