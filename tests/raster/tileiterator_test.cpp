#include "vrkframework/basic/kubo/raster/tileiterator.h"

#include <gtest/gtest.h>

#include <tuple>

#include "support/expectfailure.h"

namespace {

using kora::kubo::Tile;
using kora::kubo::TileIterator;
using Box = std::tuple<unsigned int, unsigned int, unsigned int, unsigned int>;

constexpr char kSource[] = "vrkframework/basic/kubo/raster/tileiterator";

Box Fields(const Tile& t) { return {t.xOffset, t.yOffset, t.xSize, t.ySize}; }

std::vector<Box> Walk(TileIterator& iterator) {
    std::vector<Box> tiles;
    for (Tile tile = iterator.GetFirstTile(); tile.xSize != 0; tile = iterator.GetNextTile()) {
        tiles.push_back(Fields(tile));
    }
    return tiles;
}

TEST(TileIterator, CutsRowMajorWithNarrowerLastRowAndColumn) {
    TileIterator quarter(10, 7);  // tiles of 10/4 x 7/4 = 2 x 1
    const auto tiles = Walk(quarter);
    ASSERT_EQ(tiles.size(), 35u);
    EXPECT_EQ(tiles[6], Box(2, 1, 2, 1));
    EXPECT_EQ(quarter.GetTileRange(), 34u);

    TileIterator whole(3, 3);  // 0 x 0 becomes the whole area
    EXPECT_EQ(Walk(whole), (std::vector<Box>{{0, 0, 3, 3}}));

    TileIterator iterator(10, 10);
    EXPECT_EQ(iterator.SetChunkSize(4u, 4u), 9u);
    const auto cut = Walk(iterator);
    EXPECT_EQ(cut[2], Box(8, 0, 2, 4));
    EXPECT_EQ(cut[3], Box(0, 4, 4, 4));
    EXPECT_EQ(cut[8], Box(8, 8, 2, 2));

    TileIterator offset(5, 6, 8, 4);  // a zero width spans to xEnd
    offset.SetChunkSize(0u, 3u);
    EXPECT_EQ(Walk(offset), (std::vector<Box>{{5, 6, 8, 3}, {5, 9, 8, 1}}));
}

TEST(TileIterator, SizingByCountOrPixelsWorksFromTheEnds) {
    TileIterator iterator(100, 50);
    EXPECT_NE(iterator.SetNumberOfTiles(4), 0u);
    EXPECT_EQ(Walk(iterator).back(), Box(50, 25, 50, 25));
    EXPECT_EQ(iterator.SetNumberOfTiles(0), 0u);  // no change
    EXPECT_EQ(Walk(iterator).size(), 4u);
    iterator.SetChunkSize(1300ul);  // ceil(5000 / 1300) = 4 tiles
    EXPECT_EQ(Walk(iterator).size(), 4u);
    iterator.SetChunkSize(100000ul);
    EXPECT_EQ(Walk(iterator).size(), 1u);
    EXPECT_EQ(iterator.SetChunkSize(0ul), 0u);

    TileIterator rounding(10, 10);
    rounding.SetNumberOfTiles(3);  // single precision: ceil(10 / 1.7320508) = 6
    EXPECT_EQ(Walk(rounding).front(), Box(0, 0, 6, 6));

    TileIterator shifted(10, 10, 10, 10);  // 20 / sqrt(4) = 10 on a 10-wide area
    shifted.SetNumberOfTiles(4);
    EXPECT_EQ(Walk(shifted), (std::vector<Box>{{10, 10, 10, 10}}));
}

TEST(TileIterator, WalkingRules) {
    TileIterator iterator(4, 4);
    iterator.SetChunkSize(2u, 4u);
    EXPECT_EQ(Fields(iterator.GetFirstTile()), Box(0, 0, 2, 4));
    EXPECT_EQ(Fields(iterator.GetNextTile()), Box(2, 0, 2, 4));
    EXPECT_TRUE(iterator.IsDone());
    EXPECT_EQ(Fields(iterator.GetNextTile()), Box(0, 0, 0, 0));
    iterator.SetCurrentTile(0);  // a finished walk is not rewound by SetCurrentTile
    EXPECT_TRUE(iterator.IsDone());
    iterator.GetFirstTile();
    iterator.SetCurrentTile(1);
    EXPECT_EQ(Fields(iterator.GetNextTile()), Box(2, 0, 2, 4));
    iterator.GetFirstTile();
    iterator.SetCurrentTile(1000);  // not checked
    EXPECT_TRUE(iterator.IsDone());

    TileIterator copy(iterator);
    copy.SetChunkSize(4u, 4u);
    EXPECT_EQ(iterator.GetTileRange(), 1u);  // copies keep their own cut
}

TEST(TileIterator, TileLookupAndCheck) {
    TileIterator iterator(2, 3, 10, 10);
    iterator.SetChunkSize(4u, 4u);
    EXPECT_EQ(iterator.GetTileIndex(6, 3), 1u);
    EXPECT_EQ(iterator.GetTileIndex(11, 12), 8u);
    EXPECT_EQ(iterator.GetTileIndex(12, 3), 9u);  // none: the tile count
    EXPECT_EQ(Fields(iterator.GetTile(8)), Box(10, 11, 2, 2));
    // The offset counts twice: 2 + 12 <= 14 and 3 + 13 <= 16.
    EXPECT_TRUE(iterator.Check(14, 16));
    EXPECT_FALSE(iterator.Check(13, 16));
    EXPECT_FALSE(iterator.Check(14, 15));
}

TEST(TileIterator, Failures) {
    TileIterator iterator(4, 4);
    iterator.SetChunkSize(2u, 2u);
    const auto outside = kubo_test::Catch<kora::OutOfBoundsException>([&] { iterator.GetTile(4); });
    ASSERT_TRUE(outside);
    kubo_test::ExpectReport(
        *outside, "Tile number out of bounds", kSource,
        "struct kora::kubo::Tile __cdecl kora::kubo::TileIterator::GetTile(unsigned int)", 211);
    EXPECT_EQ(outside->GetValues(), (std::vector<int>{0, 4}));

    for (auto [w, h] : {std::make_pair(0u, 5u), std::make_pair(5u, 0u)}) {
        const auto size =
            kubo_test::Catch<kora::DataException>([w = w, h = h] { TileIterator(w, h); });
        ASSERT_TRUE(size);
        kubo_test::ExpectReport(
            *size, "Invalid tile size", kSource,
            "__cdecl kora::kubo::TileIterator::TileIterator(unsigned int,unsigned int)", 31);
        const auto window =
            kubo_test::Catch<kora::DataException>([w = w, h = h] { TileIterator(1, 1, w, h); });
        ASSERT_TRUE(window);
        kubo_test::ExpectReport(*window, "Invalid windows size", kSource,
                                "__cdecl kora::kubo::TileIterator::TileIterator(unsigned "
                                "int,unsigned int,unsigned int,unsigned int)",
                                61);
    }
}

// Ends and indices are 32-bit: an area reaching past 4294967295 and a cut into more tiles
// than an unsigned int counts are refused, the previous cut kept.
TEST(TileIterator, RefusesWhatItsFieldsCannotDescribe) {
    const auto area =
        kubo_test::Catch<kora::OutOfBoundsException>([] { TileIterator(4294967000u, 0, 296, 10); });
    ASSERT_TRUE(area.has_value());
    kubo_test::ExpectReport(*area, "An area of 296 pixels from 4294967000 ends past 4294967295",
                            kSource,
                            "__cdecl kora::kubo::TileIterator::TileIterator(unsigned "
                            "int,unsigned int,unsigned int,unsigned int)",
                            0);
    TileIterator last(4294967000u, 0, 295, 10);
    const Tile end = last.GetTile(last.GetTileRange());
    EXPECT_EQ(end.xOffset + end.xSize, 4294967295u);

    TileIterator gigapixel(66000, 66000);
    const auto cut =
        kubo_test::Catch<kora::OutOfBoundsException>([&] { gigapixel.SetChunkSize(1u, 1u); });
    ASSERT_TRUE(cut.has_value());
    kubo_test::ExpectReport(
        *cut, "A cut into 4356000000 tiles exceeds 4294967295 tiles", kSource,
        "unsigned int __cdecl kora::kubo::TileIterator::Cuthem(unsigned int,unsigned int)", 0);
    EXPECT_EQ(gigapixel.GetTileRange(), 15u);
}

// An end within 128 of 4294967295 is 2^32 in single precision: a count of 1 then sizes the
// tiles 4294967295 wide, which still cut one tile across, instead of overflowing.
TEST(TileIterator, SizingByCountNearTheTopOfTheRangeSpansTheArea) {
    TileIterator whole(4294967295u, 8);
    EXPECT_EQ(whole.SetNumberOfTiles(1), 1u);
    EXPECT_EQ(Fields(whole.GetTile(0)), Box(0, 0, 4294967295u, 8));
    TileIterator shifted(4294967000u, 0, 200, 8);
    EXPECT_EQ(shifted.SetChunkSize(100000000000ul), 1u);  // ceil(8 x 4294967200 / 1e11) = 1
    EXPECT_EQ(Fields(shifted.GetTile(0)), Box(4294967000u, 0, 200, 8));
}

// An empty cut only arises in a subclass; the range then wraps.
class EmptyCut : public TileIterator {
public:
    EmptyCut() : TileIterator(4, 4) { tiles.clear(); }
};

TEST(TileIterator, EmptyCutHasRangeOfAllOnesAndZeroFirstTile) {
    EmptyCut iterator;
    EXPECT_EQ(iterator.GetTileRange(), 4294967295u);
    EXPECT_EQ(Fields(iterator.GetFirstTile()), Box(0, 0, 0, 0));
}

}  // namespace
