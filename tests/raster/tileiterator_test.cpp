#include "vrkframework/basic/kubo/raster/tileiterator.h"

#include <gtest/gtest.h>

#include <tuple>

#include "support/expectfailure.h"

namespace {

using kora::kubo::Tile;
using kora::kubo::TileIterator;

constexpr char kSource[] = "vrkframework/basic/kubo/raster/tileiterator";

auto Fields(const Tile& tile) {
    return std::make_tuple(tile.xOffset, tile.yOffset, tile.xSize, tile.ySize);
}
auto Fields(unsigned int x, unsigned int y, unsigned int w, unsigned int h) {
    return std::make_tuple(x, y, w, h);
}

std::vector<Tile> Walk(TileIterator& iterator) {
    std::vector<Tile> tiles;
    for (Tile tile = iterator.GetFirstTile(); tile.xSize != 0; tile = iterator.GetNextTile()) {
        tiles.push_back(tile);
    }
    return tiles;
}

TEST(TileIterator, DefaultCutIsAQuarterOfEachSize) {
    TileIterator iterator(10, 7);
    const auto tiles = Walk(iterator);
    ASSERT_EQ(tiles.size(), 35u);
    for (unsigned int i = 0; i < tiles.size(); ++i) {
        EXPECT_EQ(Fields(tiles[i]), Fields(2 * (i % 5), i / 5, 2, 1)) << i;
    }
    EXPECT_EQ(iterator.GetTileRange(), 34u);
}

TEST(TileIterator, ZeroTileSizeSpansTheArea) {
    TileIterator iterator(3, 3);
    const auto tiles = Walk(iterator);
    ASSERT_EQ(tiles.size(), 1u);
    EXPECT_EQ(Fields(tiles[0]), Fields(0, 0, 3, 3));
}

TEST(TileIterator, ChunkSizeCutsRowMajorWithNarrowerLastRowAndColumn) {
    TileIterator iterator(10, 10);
    EXPECT_EQ(iterator.SetChunkSize(4u, 4u), 9u);
    const auto tiles = Walk(iterator);
    ASSERT_EQ(tiles.size(), 9u);
    EXPECT_EQ(Fields(tiles[0]), Fields(0, 0, 4, 4));
    EXPECT_EQ(Fields(tiles[2]), Fields(8, 0, 2, 4));
    EXPECT_EQ(Fields(tiles[3]), Fields(0, 4, 4, 4));
    EXPECT_EQ(Fields(tiles[8]), Fields(8, 8, 2, 2));
}

TEST(TileIterator, OffsetAreaStartsAtItsOffsetAndZeroChunkSpansToTheEnd) {
    TileIterator iterator(5, 6, 8, 4);
    iterator.SetChunkSize(0u, 3u);
    const auto tiles = Walk(iterator);
    // A zero width is replaced by xEnd (13), so one tile per row reaches the end.
    ASSERT_EQ(tiles.size(), 2u);
    EXPECT_EQ(Fields(tiles[0]), Fields(5, 6, 8, 3));
    EXPECT_EQ(Fields(tiles[1]), Fields(5, 9, 8, 1));
}

TEST(TileIterator, NumberOfTilesWorksFromTheEnds) {
    TileIterator iterator(100, 50);
    EXPECT_NE(iterator.SetNumberOfTiles(4), 0u);
    auto tiles = Walk(iterator);
    ASSERT_EQ(tiles.size(), 4u);
    EXPECT_EQ(Fields(tiles[3]), Fields(50, 25, 50, 25));

    EXPECT_EQ(iterator.SetNumberOfTiles(0), 0u);
    EXPECT_EQ(Walk(iterator).size(), 4u);  // unchanged

    // With an offset the tiles come from xEnd / yEnd: 20 / sqrt(4) = 10 on a 10-wide area.
    TileIterator offset(10, 10, 10, 10);
    offset.SetNumberOfTiles(4);
    tiles = Walk(offset);
    ASSERT_EQ(tiles.size(), 1u);
    EXPECT_EQ(Fields(tiles[0]), Fields(10, 10, 10, 10));
}

TEST(TileIterator, NumberOfTilesRoundsUpInSinglePrecision) {
    TileIterator iterator(10, 10);
    iterator.SetNumberOfTiles(3);  // side 1.7320508: ceil(5.7735) = 6
    const auto tiles = Walk(iterator);
    ASSERT_EQ(tiles.size(), 4u);
    EXPECT_EQ(Fields(tiles[0]), Fields(0, 0, 6, 6));
    EXPECT_EQ(Fields(tiles[3]), Fields(6, 6, 4, 4));
}

TEST(TileIterator, PixelsPerTileGivesAboutThatManyPixels) {
    TileIterator iterator(100, 50);
    EXPECT_NE(iterator.SetChunkSize(1250ul), 0u);  // 5000 / 1250 = 4 tiles
    EXPECT_EQ(Walk(iterator).size(), 4u);
    iterator.SetChunkSize(1300ul);  // ceil(3.85) = 4 as well
    EXPECT_EQ(Walk(iterator).size(), 4u);
    iterator.SetChunkSize(100000ul);  // one tile
    EXPECT_EQ(Walk(iterator).size(), 1u);
    EXPECT_EQ(iterator.SetChunkSize(0ul), 0u);
    EXPECT_EQ(Walk(iterator).size(), 1u);
}

TEST(TileIterator, WalkingPastTheEndReturnsZeroTilesAndKeepsCurrent) {
    TileIterator iterator(4, 4);
    iterator.SetChunkSize(2u, 4u);
    EXPECT_EQ(Fields(iterator.GetFirstTile()), Fields(0, 0, 2, 4));
    EXPECT_FALSE(iterator.IsDone());
    EXPECT_EQ(Fields(iterator.GetNextTile()), Fields(2, 0, 2, 4));
    EXPECT_TRUE(iterator.IsDone());
    EXPECT_EQ(Fields(iterator.GetNextTile()), Fields(0, 0, 0, 0));
    EXPECT_TRUE(iterator.IsDone());
    // A finished walk is not rewound by SetCurrentTile, only by GetFirstTile.
    iterator.SetCurrentTile(0);
    EXPECT_TRUE(iterator.IsDone());
    iterator.GetFirstTile();
    iterator.SetCurrentTile(1);
    EXPECT_EQ(Fields(iterator.GetNextTile()), Fields(2, 0, 2, 4));
}

TEST(TileIterator, SetCurrentTileDoesNotCheckTheIndex) {
    TileIterator iterator(4, 4);
    iterator.SetChunkSize(2u, 2u);
    iterator.GetFirstTile();
    iterator.SetCurrentTile(1000);
    EXPECT_TRUE(iterator.IsDone());
    EXPECT_EQ(Fields(iterator.GetNextTile()), Fields(0, 0, 0, 0));
}

TEST(TileIterator, GetTileAndItsOutOfBoundsFailure) {
    TileIterator iterator(4, 4);
    iterator.SetChunkSize(2u, 2u);
    EXPECT_EQ(Fields(iterator.GetTile(3)), Fields(2, 2, 2, 2));
    const auto failure = kubo_test::Catch<kora::OutOfBoundsException>([&] { iterator.GetTile(4); });
    ASSERT_TRUE(failure);
    kubo_test::ExpectReport(
        *failure, "Tile number out of bounds", kSource,
        "struct kora::kubo::Tile __cdecl kora::kubo::TileIterator::GetTile(unsigned int)", 211);
    EXPECT_EQ(failure->GetValues(), (std::vector<int>{0, 4}));
}

TEST(TileIterator, ZeroSizesAreRejected) {
    for (auto sizes : {std::make_pair(0u, 5u), std::make_pair(5u, 0u)}) {
        const auto small =
            kubo_test::Catch<kora::DataException>([&] { TileIterator(sizes.first, sizes.second); });
        ASSERT_TRUE(small);
        kubo_test::ExpectReport(
            *small, "Invalid tile size", kSource,
            "__cdecl kora::kubo::TileIterator::TileIterator(unsigned int,unsigned int)", 31);
        const auto offset = kubo_test::Catch<kora::DataException>(
            [&] { TileIterator(1, 1, sizes.first, sizes.second); });
        ASSERT_TRUE(offset);
        kubo_test::ExpectReport(*offset, "Invalid windows size", kSource,
                                "__cdecl kora::kubo::TileIterator::TileIterator(unsigned "
                                "int,unsigned int,unsigned int,unsigned int)",
                                61);
    }
}

TEST(TileIterator, TileIndexFindsTheFirstContainingTile) {
    TileIterator iterator(2, 3, 10, 10);
    iterator.SetChunkSize(4u, 4u);
    EXPECT_EQ(iterator.GetTileIndex(2, 3), 0u);
    EXPECT_EQ(iterator.GetTileIndex(6, 3), 1u);
    EXPECT_EQ(iterator.GetTileIndex(11, 12), 8u);
    EXPECT_EQ(iterator.GetTileIndex(1, 3), 9u);   // left of the area
    EXPECT_EQ(iterator.GetTileIndex(12, 3), 9u);  // one past the end
}

TEST(TileIterator, CheckCountsTheOffsetTwice) {
    const TileIterator iterator(2, 3, 10, 10);  // xEnd 12, yEnd 13
    EXPECT_TRUE(iterator.Check(14, 16));
    EXPECT_FALSE(iterator.Check(13, 16));
    EXPECT_FALSE(iterator.Check(14, 15));
    EXPECT_TRUE(TileIterator(5, 5).Check(5, 5));
}

TEST(TileIterator, CopiesKeepTheirOwnCutAndWalk) {
    TileIterator iterator(8, 8);
    iterator.GetFirstTile();
    TileIterator copy(iterator);
    copy.SetChunkSize(8u, 8u);
    EXPECT_EQ(iterator.GetTileRange(), 15u);
    EXPECT_EQ(copy.GetTileRange(), 0u);
    EXPECT_EQ(Fields(iterator.GetNextTile()), Fields(2, 0, 2, 2));
    copy = iterator;
    EXPECT_EQ(Fields(copy.GetNextTile()), Fields(4, 0, 2, 2));
}

// An empty cut only arises in a subclass; the range then wraps.
class EmptyCut : public TileIterator {
public:
    EmptyCut() : TileIterator(4, 4) { tiles.clear(); }
};

TEST(TileIterator, EmptyCutHasRangeOfAllOnesAndZeroFirstTile) {
    EmptyCut iterator;
    EXPECT_EQ(iterator.GetTileRange(), 4294967295u);
    EXPECT_EQ(Fields(iterator.GetFirstTile()), Fields(0, 0, 0, 0));
    EXPECT_TRUE(iterator.IsDone());
}

}  // namespace
