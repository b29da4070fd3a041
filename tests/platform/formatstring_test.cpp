#include "vrkframework/platform/formatstring.h"

#include <gtest/gtest.h>

namespace {

TEST(FormatString, FormatsLikePrintfAtAnyLength) {
    EXPECT_EQ(kora::FormatString("LUT must have 256 entries, %d given.", 255),
              "LUT must have 256 entries, 255 given.");
    EXPECT_EQ(kora::FormatString("%s", ""), "");
    const std::string longText(5000, 'x');
    EXPECT_EQ(kora::FormatString("<%s>", longText.c_str()), "<" + longText + ">");
}

}  // namespace
