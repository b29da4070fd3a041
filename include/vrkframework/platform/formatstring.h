// printf-style formatting into a std::string.
#ifndef VRKFRAMEWORK_PLATFORM_FORMATSTRING_H
#define VRKFRAMEWORK_PLATFORM_FORMATSTRING_H

#include <string>

#include "vrkframework/platform/platformapi.h"

namespace kora {

/// Formats like std::printf and returns the whole text, however long.
KORA_PLATFORM_API std::string FormatString(const char* format, ...)
#if defined(__GNUC__)
    __attribute__((format(printf, 1, 2)))
#endif
    ;

}  // namespace kora

#endif  // VRKFRAMEWORK_PLATFORM_FORMATSTRING_H
