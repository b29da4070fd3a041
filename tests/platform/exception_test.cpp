#include "vrkframework/platform/exception.h"

#include <gtest/gtest.h>

namespace {

TEST(Exception, KeepsItsFourPartsAndReturnsTheMessageFromWhat) {
    const kora::Exception failure("message", "a/b/c", "void f(int)", 42);
    EXPECT_STREQ(failure.what(), "message");
    EXPECT_EQ(failure.GetMessage(), "message");
    EXPECT_EQ(failure.GetSourceFile(), "a/b/c");
    EXPECT_EQ(failure.GetFunction(), "void f(int)");
    EXPECT_EQ(failure.GetLine(), 42u);
}

TEST(Exception, DerivedFailuresAreCaughtAsTheBaseAndAsStdException) {
    try {
        throw kora::DataException("bad data", "src", "fn", 7);
    } catch (const std::exception& failure) {
        EXPECT_STREQ(failure.what(), "bad data");
        EXPECT_NE(dynamic_cast<const kora::DataException*>(&failure), nullptr);
        EXPECT_NE(dynamic_cast<const kora::Exception*>(&failure), nullptr);
    }
}

TEST(ParameterException, KeepsParameterTypeReceivedAndExpected) {
    const kora::ParameterException failure("LUT", kora::ParameterException::Type(8), "A 1",
                                           "At least 2", "desc", "src", "fn", 80);
    EXPECT_EQ(failure.GetParameterName(), "LUT");
    EXPECT_EQ(static_cast<int>(failure.GetType()), 8);
    EXPECT_EQ(failure.GetReceived(), "A 1");
    EXPECT_EQ(failure.GetExpected(), "At least 2");
    EXPECT_EQ(failure.GetMessage(), "desc");
    EXPECT_EQ(failure.GetLine(), 80u);
    EXPECT_EQ(static_cast<int>(kora::ParameterException::PARAMETER_INVALID_VALUE), 1);
    EXPECT_EQ(static_cast<int>(kora::ParameterException::PARAMETER_TOO_FEW_ITEMS), 8);
}

TEST(OutOfBoundsException, KeepsItsValues) {
    const kora::OutOfBoundsException failure({1, 2, 3, 3}, "outside", "src", "fn", 190);
    EXPECT_EQ(failure.GetValues(), (std::vector<int>{1, 2, 3, 3}));
    EXPECT_STREQ(failure.what(), "outside");
}

}  // namespace
