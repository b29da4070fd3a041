#include "vrkframework/platform/imptime.h"

#include <gtest/gtest.h>

#include <cctype>
#include <cstring>

namespace {

TEST(IMPTime, Format13WritesLocalDateAndMinutes) {
    char buffer[64];
    const char* stamp = IMPTime(buffer, 13);
    ASSERT_EQ(stamp, buffer);
    ASSERT_EQ(std::strlen(stamp), 16u);
    const char* shape = "dddd-dd-dd dd:dd";
    for (std::size_t i = 0; i < 16; ++i) {
        if (shape[i] == 'd') {
            EXPECT_TRUE(std::isdigit(static_cast<unsigned char>(stamp[i]))) << stamp;
        } else {
            EXPECT_EQ(stamp[i], shape[i]) << stamp;
        }
    }
}

TEST(IMPTime, OtherFormatsWriteAnEmptyText) {
    char buffer[64] = "stale";
    EXPECT_STREQ(IMPTime(buffer, 0), "");
}

}  // namespace
