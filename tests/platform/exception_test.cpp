#include "vrkframework/platform/exception.h"

#include <gtest/gtest.h>

namespace {

TEST(Exception, EveryClassKeepsItsReportAndIsCaughtAsTheBase) {
    try {
        throw kora::DataException("bad data", "a/b/c", "void f(int)", 42);
    } catch (const std::exception& failure) {
        const auto* base = dynamic_cast<const kora::Exception*>(&failure);
        ASSERT_NE(base, nullptr);
        EXPECT_STREQ(failure.what(), "bad data");
        EXPECT_EQ(base->GetSourceFile(), "a/b/c");
        EXPECT_EQ(base->GetFunction(), "void f(int)");
        EXPECT_EQ(base->GetLine(), 42u);
    }
    const kora::ParameterException parameter("LUT",
                                             kora::ParameterException::PARAMETER_TOO_FEW_ITEMS,
                                             "A 1", "At least 2", "desc", "src", "fn", 80);
    EXPECT_EQ(parameter.GetParameterName(), "LUT");
    EXPECT_EQ(static_cast<int>(parameter.GetType()), 8);
    EXPECT_EQ(static_cast<int>(kora::ParameterException::PARAMETER_INVALID_VALUE), 1);
    EXPECT_EQ(parameter.GetReceived(), "A 1");
    EXPECT_EQ(parameter.GetExpected(), "At least 2");
    EXPECT_EQ(parameter.GetMessage(), "desc");
    const kora::OutOfBoundsException bounds({1, 2, 3, 3}, "outside", "src", "fn", 190);
    EXPECT_EQ(bounds.GetValues(), (std::vector<int>{1, 2, 3, 3}));
}

}  // namespace
