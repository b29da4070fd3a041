// Expecting a framework failure of one exact class in a fuzz target, and checking the four
// parts of its report.
#ifndef KUBO_FUZZ_FUZZFAILURE_H
#define KUBO_FUZZ_FUZZFAILURE_H

#include <cstdlib>  // std::abort
#include <string>
#include <typeinfo>

#include "fuzzinput.h"
#include "vrkframework/platform/exception.h"

namespace kubo_fuzz {

/// Runs `action`, which must throw a failure whose class is exactly `E`, and returns that
/// failure. Any other exception escapes and stops the run.
template <class E, class Action>
E ExpectFailure(Action&& action, const char* what) {
    try {
        action();
    } catch (const E& failure) {
        Check(typeid(failure) == typeid(E), what);
        return failure;
    }
    Check(false, what);
    std::abort();
}

/// Checks the message, source path, function signature and line of `failure`.
inline void CheckReport(const kora::Exception& failure, const std::string& message,
                        const char* sourceFile, const char* function, unsigned int line) {
    Check(failure.GetMessage() == message && failure.what() == message,
          "a failure reports its message");
    Check(failure.GetSourceFile() == sourceFile && failure.GetFunction() == function &&
              failure.GetLine() == line,
          "a failure reports its source path, signature and line");
}

}  // namespace kubo_fuzz

#endif  // KUBO_FUZZ_FUZZFAILURE_H
