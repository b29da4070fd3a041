// Time stamp texts of the framework clock.
#ifndef VRKFRAMEWORK_PLATFORM_IMPTIME_H
#define VRKFRAMEWORK_PLATFORM_IMPTIME_H

#include "vrkframework/platform/platformapi.h"

/// Format code of the local "YYYY-MM-DD HH:MM" time stamp.
constexpr int kIMPTimeDateMinutes = 13;

/// Writes the current local time into `buffer` (at least 64 chars) and returns
/// `buffer`. Format 13 writes "YYYY-MM-DD HH:MM"; any other code writes an empty text.
KORA_PLATFORM_API char* IMPTime(char* buffer, int format);

#endif  // VRKFRAMEWORK_PLATFORM_IMPTIME_H
