#include "vrkframework/platform/caseinsensitivecompare.h"

#include <gtest/gtest.h>

#include <map>

namespace {

TEST(CaseInsensitiveCompare, OrdersAndMatchesKeysWithoutRegardToCase) {
    const kora::datasources::detail::CaseInsensitiveCompare less;
    EXPECT_TRUE(less("alpha", "BETA"));
    EXPECT_TRUE(less("ALPHA", "beta"));
    EXPECT_TRUE(less("abc", "ABCD"));
    EXPECT_FALSE(less("\xe9", "\xe9"));  // bytes above 127 are fine
    std::map<std::string, std::string, kora::datasources::detail::CaseInsensitiveCompare> map;
    map["Sensor"] = "a";
    map["SENSOR"] = "b";
    ASSERT_EQ(map.size(), 1u);
    EXPECT_EQ(map.at("sensor"), "b");
}

}  // namespace
