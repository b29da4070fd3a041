// Decoded output: filling it with one value, and new buffers handed to the caller
// (private to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_DECODEDBYTES_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_DECODEDBYTES_H

#include <cstddef>  // std::size_t
#include <cstring>  // std::memset
#include <memory>   // std::unique_ptr

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

/// A new buffer of `size` bytes filled by `decode(buffer)`, for the caller to free with
/// delete[]; freed here when `decode` throws.
template <class Decode>
unsigned char* NewDecoded(std::size_t size, Decode decode) {
    std::unique_ptr<unsigned char[]> out(new unsigned char[size]);
    decode(out.get());
    return out.release();
}

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_DECODEDBYTES_H
