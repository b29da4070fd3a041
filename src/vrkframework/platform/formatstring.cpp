// printf-style formatting into a std::string.
#include "vrkframework/platform/formatstring.h"

#include <cstdarg>  // va_list
#include <cstdio>   // std::vsnprintf

namespace kora {

std::string FormatString(const char* format, ...) {
    va_list args;
    va_start(args, format);
    va_list measure;
    va_copy(measure, args);
    const int length = std::vsnprintf(nullptr, 0, format, measure);
    va_end(measure);
    std::string text;
    if (length > 0) {
        // vsnprintf writes the terminating zero too; std::string keeps room for it.
        text.resize(static_cast<std::size_t>(length));
        std::vsnprintf(&text[0], text.size() + 1, format, args);
    }
    va_end(args);
    return text;
}

}  // namespace kora
