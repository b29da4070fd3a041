#include "vrkframework/basic/kubo/masks/coordinatemaskbuilder.h"

#include <gtest/gtest.h>

#include <climits>
#include <memory>
#include <utility>
#include <vector>

#include "vrkframework/basic/kubo/masks/mask.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace {

using kora::kubo::CoordinateMaskBuilder;
using kora::kubo::DataType;
using kora::kubo::Mask;
using kora::kubo::Raster;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;
using Pairs = std::vector<std::pair<int, int>>;

std::vector<unsigned int> SetBits(const Mask& mask) {
    std::vector<unsigned int> set;
    for (unsigned int i = 0; i < mask.GetBitCount(); ++i) {
        if (mask.GetBit(i)) {
            set.push_back(i);
        }
    }
    return set;
}

TEST(CoordinateMaskBuilder, KeepsCoordinatesSortedByRowThenColumnWithoutDuplicates) {
    CoordinateMaskBuilder builder;
    for (const auto& [row, column] : Pairs{{5, 1}, {2, 9}, {5, 0}, {2, 9}, {-1, 3}, {5, 1}}) {
        builder.AddValidCoordinate(row, column);
    }
    EXPECT_EQ(builder.GetCoordinates(), (Pairs{{-1, 3}, {2, 9}, {5, 0}, {5, 1}}));
}

TEST(CoordinateMaskBuilder, CopiesHoldTheirOwnSets) {
    CoordinateMaskBuilder builder;
    builder.AddValidCoordinate(1, 1);
    const CoordinateMaskBuilder copy(builder);
    CoordinateMaskBuilder assigned;
    assigned = builder;
    builder.AddValidCoordinate(0, 0);
    EXPECT_EQ(copy.GetCoordinates(), (Pairs{{1, 1}}));
    EXPECT_EQ(assigned.GetCoordinates(), (Pairs{{1, 1}}));
}

TEST(CoordinateMaskBuilder, WithoutCoordinatesEveryPixelIsBackground) {
    const Raster raster(RasterInfo(5, 4, 3, DataType::Type16S), RasterContext(1, 1, 0, 0));
    const std::unique_ptr<Mask> mask(CoordinateMaskBuilder().BuildMask(raster));
    EXPECT_EQ(mask->GetByteCount(), 6u);
    EXPECT_EQ(std::vector<unsigned char>(mask->GetBits(), mask->GetBits() + 6),
              std::vector<unsigned char>(6, 0));
}

TEST(CoordinateMaskBuilder, ThreePixelsWithTheOuterTwoValidGive0xA0) {
    CoordinateMaskBuilder builder;
    builder.AddValidCoordinate(0, 2);
    builder.AddValidCoordinate(0, 0);
    const std::unique_ptr<Mask> mask(
        builder.BuildMask(Raster(RasterInfo(3, 1, 1, DataType::Type8U), RasterContext())));
    EXPECT_EQ(mask->GetByteCount(), 1u);
    EXPECT_EQ(mask->GetBits()[0], 0xa0);
}

// Coordinates are in the whole image; margins shift the bits and are never set themselves.
TEST(CoordinateMaskBuilder, SetsOnlyCoordinatesInsideTheImageProper) {
    CoordinateMaskBuilder builder;
    for (const auto& [row, column] : Pairs{
             {50, 100}, {52, 103}, {49, 100}, {50, 99}, {53, 100}, {50, 104}, {0, 0}, {51, 102}}) {
        builder.AddValidCoordinate(row, column);
    }
    // 4 x 3 image at column 100, row 50, with margins 2 and 1: full width 8.
    const Raster raster(RasterInfo(4, 3, 1, DataType::Type8U), RasterContext(2, 1, 100, 50));
    const std::unique_ptr<Mask> mask(builder.BuildMask(raster));
    EXPECT_EQ(mask->GetBitCount(), 40u);
    EXPECT_EQ(mask->xOffset, 100u);
    EXPECT_EQ(SetBits(*mask), (std::vector<unsigned int>{1 * 8 + 2, 2 * 8 + 4, 3 * 8 + 5}));
}

// Offsets compare as signed 32-bit values, and the image may end at the end of the int range.
TEST(CoordinateMaskBuilder, OffsetsAreSignedAndImageEndsDoNotOverflow) {
    CoordinateMaskBuilder builder;
    for (const auto& [row, column] : Pairs{{INT_MAX - 1, -1}, {INT_MAX, 0}, {INT_MAX, 1}}) {
        builder.AddValidCoordinate(row, column);
    }
    const Raster raster(RasterInfo(2, 5, 1, DataType::Type8U),
                        RasterContext(0, 0, 4294967295u, static_cast<unsigned int>(INT_MAX - 1)));
    const std::unique_ptr<Mask> mask(builder.BuildMask(raster));
    EXPECT_EQ(SetBits(*mask), (std::vector<unsigned int>{0, 3}));
}

}  // namespace
