#include "vrkframework/basic/kubo/masks/mask.h"

#include <gtest/gtest.h>

#include <cstring>
#include <vector>

namespace {

using kora::kubo::DataType;
using kora::kubo::Mask;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;

std::vector<unsigned char> BytesOf(const Mask& mask) {
    return std::vector<unsigned char>(mask.GetBits(), mask.GetBits() + mask.GetByteCount());
}

TEST(Mask, DescribesOneBitPerPixelOfTheFullExtentAllBackground) {
    const Mask mask(RasterInfo(3, 1, 4, DataType::TypeC32R), RasterContext(2, 1, 7, 9));
    EXPECT_EQ(mask.width, 3u);
    EXPECT_EQ(mask.height, 1u);
    EXPECT_EQ(mask.channels, 1u);
    EXPECT_EQ(mask.dataType, DataType::Type1U);
    EXPECT_EQ(mask.xMargin, 2u);
    EXPECT_EQ(mask.yMargin, 1u);
    EXPECT_EQ(mask.xOffset, 7u);
    EXPECT_EQ(mask.yOffset, 9u);
    EXPECT_EQ(mask.GetFullWidth(), 7);
    EXPECT_EQ(mask.GetFullHeight(), 3);
    EXPECT_EQ(mask.GetBitCount(), 21u);
    EXPECT_EQ(mask.GetByteCount(), 3u);
    EXPECT_EQ(BytesOf(mask), (std::vector<unsigned char>{0, 0, 0}));
    for (unsigned int i = 0; i < 24; ++i) {
        EXPECT_FALSE(mask.GetBit(i));
    }
}

TEST(Mask, AnEmptyExtentHasNoBytes) {
    const Mask mask(RasterInfo(0, 5, 1, DataType::Type8U), RasterContext());
    EXPECT_EQ(mask.GetBitCount(), 0u);
    EXPECT_EQ(mask.GetByteCount(), 0u);
    unsigned char flag = 1;
    const Mask fromFlags(RasterInfo(0, 5, 1, DataType::Type8U), RasterContext(), &flag, false,
                         false);
    EXPECT_EQ(fromFlags.GetByteCount(), 0u);
    EXPECT_FALSE(fromFlags.GetBit(0));
}

TEST(Mask, ThreeFlagsPackIntoTheHighBitsOfOneByte) {
    unsigned char flags[3] = {1, 0, 1};
    const Mask mask(RasterInfo(3, 1, 1, DataType::Type8U), RasterContext(), flags, false, false);
    EXPECT_EQ(mask.GetBitCount(), 3u);
    EXPECT_EQ(BytesOf(mask), std::vector<unsigned char>{0xa0});
}

// Rows are not padded: with a full width of 5 the second row starts at bit 5 of byte 0.
TEST(Mask, FlagBitsRunOnAcrossRowEndsMostSignificantBitFirst) {
    const RasterInfo info(3, 1, 1, DataType::Type16U);
    const RasterContext context(1, 1, 0, 0);  // full extent 5 x 3
    std::vector<unsigned char> flags(15);
    for (unsigned int i = 0; i < 15; ++i) {
        flags[i] = (i % 3 == 0 || i == 14) ? static_cast<unsigned char>(1 + 60 * (i % 5)) : 0;
    }
    const Mask mask(info, context, flags.data(), false, false);
    // Bits 0, 3, 6, 9, 12, 14 set: 1001 0010 | 0100 1010.
    EXPECT_EQ(BytesOf(mask), (std::vector<unsigned char>{0x92, 0x4a}));
    for (unsigned int i = 0; i < 16; ++i) {
        EXPECT_EQ(mask.GetBit(i), i < 15 && flags[i] != 0) << i;
    }
}

TEST(Mask, PackedBytesAreCopiedAsTheyAre) {
    unsigned char bits[3] = {0x5a, 0xff, 0x77};
    const Mask mask(RasterInfo(5, 3, 1, DataType::Type8U), RasterContext(), bits, false, true);
    EXPECT_EQ(mask.GetByteCount(), 2u);
    EXPECT_EQ(BytesOf(mask), (std::vector<unsigned char>{0x5a, 0xff}));
    EXPECT_TRUE(mask.GetBit(14));
    EXPECT_FALSE(mask.GetBit(15));  // past the last pixel
}

// The checkers of the sanitizer build see a buffer released twice or never.
TEST(Mask, ReleasesTheBufferOnlyWhenAskedTo) {
    auto* owned = new unsigned char[4]{1, 1, 0, 1};
    const Mask fromOwned(RasterInfo(4, 1, 1, DataType::Type8U), RasterContext(), owned, true,
                         false);
    EXPECT_EQ(BytesOf(fromOwned), std::vector<unsigned char>{0xd0});
    auto* packed = new unsigned char[1]{0xc0};
    const Mask fromPacked(RasterInfo(4, 1, 1, DataType::Type8U), RasterContext(), packed, true,
                          true);
    EXPECT_EQ(BytesOf(fromPacked), std::vector<unsigned char>{0xc0});
    unsigned char kept[4] = {0, 1, 0, 0};
    const Mask fromKept(RasterInfo(4, 1, 1, DataType::Type8U), RasterContext(), kept, false, false);
    EXPECT_EQ(kept[1], 1);
    EXPECT_EQ(BytesOf(fromKept), std::vector<unsigned char>{0x40});
}

TEST(Mask, NoBufferLeavesEveryPixelBackground) {
    const Mask mask(RasterInfo(9, 2, 1, DataType::Type8U), RasterContext(), nullptr, true, false);
    EXPECT_EQ(BytesOf(mask), (std::vector<unsigned char>{0, 0, 0}));
}

TEST(Mask, CopiesOwnTheirBits) {
    unsigned char flags[4] = {1, 0, 0, 0};
    Mask original(RasterInfo(2, 2, 1, DataType::Type8U), RasterContext(0, 0, 3, 4), flags, false,
                  false);
    const Mask copy(original);
    Mask assigned(RasterInfo(1, 1, 1, DataType::Type8U), RasterContext());
    assigned = original;
    original.GetBits()[0] = 0x30;
    EXPECT_EQ(BytesOf(copy), std::vector<unsigned char>{0x80});
    EXPECT_EQ(BytesOf(assigned), std::vector<unsigned char>{0x80});
    EXPECT_EQ(assigned.GetFullWidth(), 2);
    EXPECT_EQ(assigned.xOffset, 3u);
    EXPECT_TRUE(original.GetBit(2));
}

}  // namespace
