// Checkpoints into a stream of run counts, so that a seek starts its walk near its target
// instead of at the start of the stream (private to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_RUNCHECKPOINTS_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_RUNCHECKPOINTS_H

#include <algorithm>  // std::upper_bound
#include <atomic>
#include <cstddef>   // std::size_t
#include <cstdint>   // std::uint32_t, std::uint64_t
#include <iterator>  // std::prev
#include <memory>    // std::unique_ptr, std::make_unique
#include <vector>

namespace kora::kubo::detail {

/// The running total of the run counts at every `spacing`-th run of a stream whose runs
/// take `stride` bytes each, the count in the first; the first checkpoint stands at run 0. A
/// checkpoint takes 8 bytes per 1 KiB of stream, so the index stays under 1 % of what it indexes;
/// the walk from a checkpoint to any position covers at most 1 KiB.
class RunCheckpoints {
public:
    static constexpr std::size_t kStreamBytesPerCheckpoint = 1024;

    struct Checkpoint {
        std::size_t run;      ///< index of the run the checkpoint stands at
        std::uint64_t total;  ///< sum of the counts of the runs before it
    };

    RunCheckpoints(const unsigned char* runs, std::size_t runCount, std::size_t stride)
        : m_spacing(kStreamBytesPerCheckpoint / stride), m_totals{0} {
        m_totals.reserve(runCount / m_spacing + 1);
        std::uint64_t total = 0;
        for (std::size_t first = 0; runCount - first > m_spacing; first += m_spacing) {
            const unsigned char* block = runs + first * stride;
            total +=
                stride == 1 ? SumOfCounts<1>(block, m_spacing) : SumOfCounts<2>(block, m_spacing);
            m_totals.push_back(total);
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
    // A block's counts fit 32 bits, which lets the sum vectorise.
    template <std::size_t kStride>
    static std::uint32_t SumOfCounts(const unsigned char* runs, std::size_t count) {
        std::uint32_t sum = 0;
        for (std::size_t run = 0; run < count; ++run) {
            sum += runs[run * kStride];
        }
        return sum;
    }

    std::size_t m_spacing;
    std::vector<std::uint64_t> m_totals;  ///< m_totals[b]: counts of the runs before b x spacing
};

/// The checkpoints of a stream, made by the first window decode that needs them, so that
/// making and whole decoding never pay for them. Threads that ask at once may each make
/// them; one set is kept. Copies of a stream share one.
class LazyRunCheckpoints {
public:
    LazyRunCheckpoints() = default;
    LazyRunCheckpoints(const LazyRunCheckpoints&) = delete;
    LazyRunCheckpoints& operator=(const LazyRunCheckpoints&) = delete;
    ~LazyRunCheckpoints() { delete m_checkpoints.load(); }

    /// The checkpoints of `runCount` runs of `stride` bytes at `runs`; every call passes the
    /// same stream.
    const RunCheckpoints& Get(const unsigned char* runs, std::size_t runCount, std::size_t stride) {
        const RunCheckpoints* kept = m_checkpoints.load(std::memory_order_acquire);
        if (kept == nullptr) {
            auto made = std::make_unique<const RunCheckpoints>(runs, runCount, stride);
            if (m_checkpoints.compare_exchange_strong(kept, made.get(),
                                                      std::memory_order_acq_rel)) {
                kept = made.release();
            }
        }
        return *kept;
    }

private:
    std::atomic<const RunCheckpoints*> m_checkpoints{nullptr};
};

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_RUNCHECKPOINTS_H
