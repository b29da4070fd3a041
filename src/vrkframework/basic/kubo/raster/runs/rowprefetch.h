// Where a window's next row lies in a stream of runs, guessed from the rows before it, for
// the seek to start near and for the cache to fetch while the current row decodes (private
// to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_ROWPREFETCH_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_ROWPREFETCH_H

#include <algorithm>  // std::min
#include <cstddef>    // std::size_t

#include "vrkframework/basic/core/kernels/prefetch.h"
#include "vrkframework/basic/kubo/raster/runs/runcheckpoints.h"

namespace kora::kubo::detail {

/// A window's rows lie in a stream of runs at steps that change little from one row to the
/// next: the next row starts about as many runs past this one as this one past the last,
/// and reads about as many. Each row touches a stretch of the stream and of its checkpoints
/// that no row before it did; asking for the guessed stretch of the next row while this
/// one decodes hides the wait for those lines, and the guess is where the next seek looks
/// for its checkpoint first. A wrong guess costs the lines asked for and one comparison.
class RowPrefetch {
public:
    /// At most this many bytes of runs are asked for per row, so that a row of busy runs
    /// does not push the window's own lines out of the first-level cache.
    static constexpr std::size_t kMaxBytes = 2048;

    /// A stream smaller than this stays in the second-level cache from row to row: asking
    /// for its lines would only cost time.
    static constexpr std::size_t kCachedBytes = std::size_t{1} << 20;

    /// `runCount` runs of `runBytes` bytes each from `stream`, indexed by `checkpoints`.
    RowPrefetch(const unsigned char* stream, std::size_t runCount, std::size_t runBytes,
                const RunCheckpoints& checkpoints)
        : m_stream(stream),
          m_runCount(runCount),
          m_runBytes(runBytes),
          m_checkpoints(checkpoints),
          m_fetches(runCount * runBytes >= kCachedBytes) {}

    /// The run where the next row is guessed to start: 0 (no guess) before two rows started.
    std::size_t NextRow() const { return m_next; }

    /// The row about to decode starts in run `first` (at most the run count): guesses the
    /// next row and asks for its runs and its checkpoint.
    void RowStarts(std::size_t first) {
        m_next = 0;
        if (m_started && first > m_first && first < m_runCount &&
            first - m_first < m_runCount - first) {
            m_next = first + (first - m_first);
            if (m_fetches) {
                // The seek walks from the checkpoint before the guess, then the row reads on.
                const std::size_t from = m_checkpoints.WalkStart(m_next);
                const std::size_t end = std::min(m_next + m_span, m_runCount);
                const std::size_t bytes = std::min((end - from) * m_runBytes, kMaxBytes);
                PrefetchForReading(m_stream + from * m_runBytes, bytes);
                m_checkpoints.PrefetchNear(m_next);
            }
        }
        m_first = first;
        m_started = true;
    }

    /// As RowStarts, where the next row is known to start in run `next` without a seek: it
    /// takes up where an earlier read of that row ended, in lines that read touched, and
    /// nothing is asked for. Asking cost bit-run windows of long runs a tenth of their time
    /// and gained nothing on busy ones, whose rows read on in order.
    void RowStarts(std::size_t first, std::size_t next) {
        m_next = next;
        m_first = first;
        m_started = true;
    }

    /// The row that started last ended in run `last`.
    void RowEnds(std::size_t last) { m_span = last >= m_first ? last - m_first + 1 : 0; }

private:
    const unsigned char* m_stream;
    std::size_t m_runCount;
    std::size_t m_runBytes;
    const RunCheckpoints& m_checkpoints;
    bool m_fetches;           ///< whether the stream is large enough to fetch ahead
    bool m_started = false;   ///< whether a row started
    std::size_t m_first = 0;  ///< the run where the last row started
    std::size_t m_span = 0;   ///< the runs the last row read
    std::size_t m_next = 0;
};

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_ROWPREFETCH_H
