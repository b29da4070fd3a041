// Catching a framework failure of one exact class and checking its report.
#ifndef KUBO_TESTS_SUPPORT_EXPECTFAILURE_H
#define KUBO_TESTS_SUPPORT_EXPECTFAILURE_H

#include <gtest/gtest.h>

#include <optional>
#include <typeinfo>

#include "vrkframework/platform/exception.h"

namespace kubo_test {

/// Runs `action` and returns the exception it throws when its dynamic class is exactly
/// `E`; records a test failure (and returns nothing) otherwise.
template <class E, class Action>
std::optional<E> Catch(Action&& action) {
    try {
        action();
    } catch (const E& failure) {
        if (typeid(failure) == typeid(E)) {
            return failure;
        }
        ADD_FAILURE() << "threw " << typeid(failure).name() << " instead of " << typeid(E).name()
                      << ": " << failure.what();
        return std::nullopt;
    } catch (const std::exception& other) {
        ADD_FAILURE() << "threw " << typeid(other).name() << ": " << other.what();
        return std::nullopt;
    }
    ADD_FAILURE() << "nothing was thrown";
    return std::nullopt;
}

/// Checks the four parts every failure reports.
inline void ExpectReport(const kora::Exception& failure, const char* message,
                         const char* sourceFile, const char* function, unsigned int line) {
    EXPECT_EQ(failure.GetMessage(), message);
    EXPECT_STREQ(failure.what(), message);
    EXPECT_EQ(failure.GetSourceFile(), sourceFile);
    EXPECT_EQ(failure.GetFunction(), function);
    EXPECT_EQ(failure.GetLine(), line);
}

}  // namespace kubo_test

#endif  // KUBO_TESTS_SUPPORT_EXPECTFAILURE_H
