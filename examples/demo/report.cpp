// The demo's report lines.
#include "report.h"

#include <cstdarg>
#include <cstdio>

namespace demo {

void Line(const char* step, const char* format, ...) {
    std::printf("  %-15s ", step);
    va_list args;
    va_start(args, format);
    std::vprintf(format, args);
    va_end(args);
    std::printf("\n");
}

}  // namespace demo
