// Local time stamps of the framework clock.
#include "vrkframework/platform/imptime.h"

#include <ctime>  // std::time, std::strftime

char* IMPTime(char* buffer, int format) {
    buffer[0] = '\0';
    if (format != kIMPTimeDateMinutes) {
        return buffer;
    }
    const std::time_t now = std::time(nullptr);
    std::tm local{};
#if defined(_WIN32)
    localtime_s(&local, &now);
#else
    localtime_r(&now, &local);  // reentrant: the library keeps no shared state
#endif
    std::strftime(buffer, 64, "%Y-%m-%d %H:%M", &local);
    return buffer;
}
