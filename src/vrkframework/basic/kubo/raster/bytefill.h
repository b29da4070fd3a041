// Filling decoded output with one byte value (private to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_BYTEFILL_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_BYTEFILL_H

#include <cstddef>  // std::size_t
#include <cstring>  // std::memset

namespace kora::kubo::detail {

/// Writes `count` copies of `value`. Runs of one, the rule in noisy data, and empty
/// ones, frequent at the ends of partial rows, are not worth a call.
inline void FillBytes(unsigned char* out, unsigned char value, std::size_t count) {
    if (count > 1) {
        std::memset(out, value, count);
    } else if (count == 1) {
        *out = value;
    }
}

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_BYTEFILL_H
