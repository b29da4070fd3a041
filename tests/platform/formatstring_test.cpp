#include "vrkframework/platform/formatstring.h"

#include <gtest/gtest.h>

namespace {

TEST(FormatString, FormatsLikePrintf) {
    EXPECT_EQ(kora::FormatString("LUT must have 256 entries, %d given.", 255),
              "LUT must have 256 entries, 255 given.");
    EXPECT_EQ(kora::FormatString("%s-%03u-%.2f", "a", 7u, 1.5), "a-007-1.50");
}

TEST(FormatString, ReturnsEmptyTextForEmptyFormat) { EXPECT_EQ(kora::FormatString("%s", ""), ""); }

TEST(FormatString, HandlesTextsLongerThanAnyFixedBuffer) {
    const std::string longText(5000, 'x');
    EXPECT_EQ(kora::FormatString("<%s>", longText.c_str()), "<" + longText + ">");
}

}  // namespace
