// Checkpoints into a stream of run counts, so that a seek starts its walk near its target
// instead of at the start of the stream (private to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_RUNCHECKPOINTS_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_RUNCHECKPOINTS_H

#include <algorithm>  // std::upper_bound
#include <cstddef>    // std::size_t
#include <cstdint>    // std::uint64_t
#include <iterator>   // std::prev
#include <memory>     // std::shared_ptr, std::make_shared
#include <vector>

namespace kora::kubo::detail {

/// The running total of the run counts at every `Spacing()`-th run of a stream whose runs
/// take `stride` bytes each, the count in the first. A checkpoint takes 8 bytes per 1 KiB of
/// stream, so the index stays under 1 % of what it indexes; the walk from a checkpoint to
/// any position covers at most 1 KiB.
class RunCheckpoints {
public:
    static constexpr std::size_t kStreamBytesPerCheckpoint = 1024;

    struct Checkpoint {
        std::size_t run;      ///< index of the run the checkpoint stands at
        std::uint64_t total;  ///< sum of the counts of the runs before it
    };

    /// The checkpoints of `runCount` runs, or none (null) when the stream is too short for
    /// a checkpoint past its first run.
    static std::shared_ptr<const RunCheckpoints> Of(const unsigned char* runs, std::size_t runCount,
                                                    std::size_t stride) {
        if (runCount <= kStreamBytesPerCheckpoint / stride) {
            return nullptr;
        }
        return std::make_shared<const RunCheckpoints>(runs, runCount, stride);
    }

    RunCheckpoints(const unsigned char* runs, std::size_t runCount, std::size_t stride)
        : m_spacing(kStreamBytesPerCheckpoint / stride) {
        m_totals.reserve((runCount + m_spacing - 1) / m_spacing);
        std::uint64_t total = 0;
        for (std::size_t first = 0; first < runCount; first += m_spacing) {
            m_totals.push_back(total);
            const std::size_t end = std::min(runCount, first + m_spacing);
            std::uint64_t sum = 0;
            for (std::size_t run = first; run < end; ++run) {
                sum += runs[run * stride];
            }
            total += sum;
        }
    }

    /// The last checkpoint whose total is at most `limit` (the first run's, total 0, at
    /// least).
    Checkpoint LastWithin(std::uint64_t limit) const {
        const auto after = std::upper_bound(m_totals.begin(), m_totals.end(), limit);
        const auto index = static_cast<std::size_t>(std::prev(after) - m_totals.begin());
        return {index * m_spacing, m_totals[index]};
    }

private:
    std::size_t m_spacing;
    std::vector<std::uint64_t> m_totals;  ///< m_totals[b]: counts of the runs before b x spacing
};

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_RUNCHECKPOINTS_H
