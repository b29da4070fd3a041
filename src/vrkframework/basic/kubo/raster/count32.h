// Counts returned through 32-bit signatures, checked instead of truncated (private to the
// library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_COUNT32_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_COUNT32_H

#include <climits>  // UINT_MAX
#include <cstdint>  // std::uint64_t
#include <string>   // std::to_string

#include "vrkframework/platform/exception.h"

namespace kora::kubo::detail {

/// `count` as an unsigned int.
/// @throws kora::OutOfBoundsException, reported from `sourcePath` and `function`, when the
///   count does not fit: a truncated count would misdescribe the data.
inline unsigned int Count32(std::uint64_t count, const char* what, const char* sourcePath,
                            const char* function) {
    if (count > UINT_MAX) {
        throw kora::OutOfBoundsException(
            {}, std::string(what) + " of " + std::to_string(count) + " exceeds 4294967295",
            sourcePath, function, 0);
    }
    return static_cast<unsigned int>(count);
}

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_COUNT32_H
