#include "vrkframework/platform/caseinsensitivecompare.h"

#include <gtest/gtest.h>

#include <map>

namespace {

using kora::datasources::detail::CaseInsensitiveCompare;

TEST(CaseInsensitiveCompare, OrdersWithoutRegardToCase) {
    const CaseInsensitiveCompare less;
    EXPECT_FALSE(less("Sensor", "SENSOR"));
    EXPECT_FALSE(less("SENSOR", "Sensor"));
    EXPECT_TRUE(less("alpha", "BETA"));
    EXPECT_TRUE(less("ALPHA", "beta"));
    EXPECT_TRUE(less("abc", "ABCD"));
    EXPECT_FALSE(less("ABCD", "abc"));
}

TEST(CaseInsensitiveCompare, MakesKeysOfDifferentCaseOneMapKey) {
    std::map<std::string, std::string, CaseInsensitiveCompare> metadata;
    metadata["Sensor"] = "a";
    metadata["SENSOR"] = "b";
    ASSERT_EQ(metadata.size(), 1u);
    EXPECT_EQ(metadata.at("sensor"), "b");
}

TEST(CaseInsensitiveCompare, AcceptsBytesAbove127) {
    const CaseInsensitiveCompare less;
    EXPECT_TRUE(less("a", "\xe9"));
    EXPECT_FALSE(less("\xe9", "\xe9"));
}

}  // namespace
