// The demo's report: one aligned line per step, with timing helpers.
#ifndef KUBO_EXAMPLES_DEMO_REPORT_H
#define KUBO_EXAMPLES_DEMO_REPORT_H

#include <chrono>

namespace demo {

/// Seconds since construction (or the last Restart).
class Stopwatch {
public:
    Stopwatch() : m_start(Clock::now()) {}
    void Restart() { m_start = Clock::now(); }
    double Seconds() const { return std::chrono::duration<double>(Clock::now() - m_start).count(); }

private:
    using Clock = std::chrono::steady_clock;
    Clock::time_point m_start;
};

/// Bytes moved per second, in MB/s (10^6 bytes).
inline double MegabytesPerSecond(double bytes, double seconds) {
    return seconds > 0.0 ? bytes / seconds / 1e6 : 0.0;
}

inline double Mebibytes(double bytes) { return bytes / (1024.0 * 1024.0); }

/// Prints one line per step: the step's name in a column, then printf-style details.
void Line(const char* step, const char* format, ...)
#if defined(__GNUC__)
    __attribute__((format(printf, 2, 3)))
#endif
    ;

}  // namespace demo

#endif  // KUBO_EXAMPLES_DEMO_REPORT_H
