// The packing loop as this program compiles it: the baseline instruction set (the library
// runs its fastest clone, covered through the Mask tests).
#include "vrkframework/basic/kubo/masks/flagpacking.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <vector>

namespace {

TEST(PackFlags, PacksEightFlagsPerByteMostSignificantFirstAndZeroesTheTail) {
    for (const std::size_t count : {0u, 1u, 7u, 8u, 9u, 17u, 1003u}) {
        std::vector<unsigned char> flags(count);
        for (std::size_t i = 0; i < count; ++i) {
            // Any non-zero byte is a set flag.
            const unsigned char values[] = {0, 1, 0x80, 0xff, 0, 2, 0, 0, 7};
            flags[i] = values[(i * 5) % 9];
        }
        const std::size_t bytes = (count + 7) / 8;
        std::vector<unsigned char> bits(bytes + 2, 0xcd);
        kora::kubo::detail::PackFlags(flags.data(), bits.data(), count);
        for (std::size_t b = 0; b < bytes; ++b) {
            unsigned int expected = 0;
            for (std::size_t k = 0; k < 8; ++k) {
                const std::size_t i = 8 * b + k;
                if (i < count && flags[i] != 0) {
                    expected += 128u >> k;
                }
            }
            ASSERT_EQ(bits[b], expected) << "count " << count << ", byte " << b;
        }
        EXPECT_EQ(bits[bytes], 0xcd);
        EXPECT_EQ(bits[bytes + 1], 0xcd);
    }
}

}  // namespace
