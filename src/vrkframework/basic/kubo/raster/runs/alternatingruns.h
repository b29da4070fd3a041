// The run format shared by the bit-stream and the row mask encoders: one byte per run,
// runs alternately clear and set starting with clear, a 0 after a run of 255 whose value
// goes on, and a leading 0 when the data starts set (private to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_ALTERNATINGRUNS_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_ALTERNATINGRUNS_H

#include <cstddef>  // std::size_t
#include <cstdint>  // std::uint64_t

#include "vrkframework/basic/kubo/raster/runs/bytesink.h"

namespace kora::kubo::detail {

/// Encodes `count` values. `findRunEnd(position, value)` returns the first position at
/// or after `position` whose value differs from `value` (or `count`). No data gives the
/// single run 0, as does data starting set for its first run.
template <class FindRunEnd>
void AppendAlternatingRuns(std::uint64_t count, FindRunEnd findRunEnd, ByteSink& sink) {
    std::uint64_t position = 0;
    bool value = false;
    do {
        const std::uint64_t end = findRunEnd(position, value);
        std::uint64_t length = end - position;
        unsigned char* out = sink.Reserve(static_cast<std::size_t>(1 + 2 * (length / 255)));
        for (; length > 255; length -= 255) {
            *out++ = 255;
            *out++ = 0;
        }
        *out++ = static_cast<unsigned char>(length);
        sink.Commit(out);
        position = end;
        value = !value;
    } while (position < count);
}

/// Reads runs from `runs[index]` on: returns the length of the next run joined with the
/// runs that 0 separators continue, as long as the length is below `enough`, and moves
/// `index` past them. The value of the stretch is that of the run at the first index; a
/// joined pair of runs keeps it.
inline std::uint64_t NextStretch(const unsigned char* runs, std::size_t count, std::size_t& index,
                                 std::uint64_t enough = UINT64_MAX) {
    std::uint64_t length = runs[index++];
    while (length < enough && index + 1 < count && runs[index] == 0) {
        length += runs[index + 1];
        index += 2;
    }
    return length;
}

/// The value of the run at `index`: runs alternate starting with clear.
inline bool RunValue(std::size_t index) { return index % 2 == 1; }

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_ALTERNATINGRUNS_H
