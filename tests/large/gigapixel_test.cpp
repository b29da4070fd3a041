// One raster just over 4 GiB (66000 x 66000 8U with 1-pixel margins: 66002 x 66002 bytes)
// through every part of the library that addresses a raster by offset, checked on its
// bottom rows, where byte offsets pass 2^32. Needs about 9 GiB; prints what each step took.
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "support/compressedsamples.h"
#include "vrkframework/basic/kubo/kubo.h"

namespace {

using namespace kora::kubo;
using kubo_test::Bytes;

constexpr unsigned int kSide = 66000;
constexpr unsigned int kFull = kSide + 2;                       // margins included
constexpr std::uint64_t kBytes = std::uint64_t{kFull} * kFull;  // 4,356,264,004
constexpr unsigned int kBand = 300;  // buffer rows with content, at the bottom
constexpr std::uint64_t kBandStart = std::uint64_t{kFull - kBand} * kFull;

// Runs of 0 to 3 of varied lengths, so that every form has work across row ends.
unsigned char BandValue(std::uint64_t x, std::uint64_t y) {
    const std::uint64_t run = (x * 7 + y * 13) / (1 + (x + y) % 29);
    return static_cast<unsigned char>(run % 4);
}

double Seconds(const std::function<void()>& step) {
    const auto start = std::chrono::steady_clock::now();
    step();
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

void Report(const char* step, double seconds) {
    std::printf("[ timing   ] %-44s %9.3f ms\n", step, seconds * 1e3);
}

// The rows from `y` of `bytes`, `w` bytes from column `x`, as the source holds them.
Bytes SliceOf(const unsigned char* bytes, std::uint64_t rowBytes, std::uint64_t x, std::uint64_t y,
              std::uint64_t w, std::uint64_t h, bool asFlags) {
    Bytes slice;
    for (std::uint64_t row = y; row < y + h; ++row) {
        for (std::uint64_t i = 0; i < w; ++i) {
            const unsigned char byte = bytes[row * rowBytes + x + i];
            slice.push_back(asFlags ? byte != 0 : byte);
        }
    }
    return slice;
}

// Times the 256 x 256 window at the bottom right of `data` (`side` columns and rows), then
// the one to its left: the first pays for the cold cache.
template <class Compressed>
void ReportBottomWindows(const char* form, const Compressed& data, unsigned int side,
                         Bytes& bottom) {
    Bytes left(bottom.size());
    const int x = static_cast<int>(side) - 256;
    const int y = static_cast<int>(side) - 256;
    Report((std::string(form) + ": 256 x 256 window at the bottom").c_str(),
           Seconds([&] { data.Decode(x, y, 256, 256, bottom.data()); }));
    Report((std::string(form) + ": the next window to its left").c_str(),
           Seconds([&] { data.Decode(x - 256, y, 256, 256, left.data()); }));
}

class Gigapixel : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        Report("allocate and fill", Seconds([] {
                   raster = new Raster(RasterInfo(kSide, kSide, 1, DataType::Type8U),
                                       RasterContext(1, 1, 0, 0));
                   std::memset(raster->data, 0, kBandStart);
                   for (std::uint64_t i = kBandStart; i < kBytes; ++i) {
                       raster->data[i] = BandValue(i % kFull, i / kFull);
                   }
               }));
    }
    static void TearDownTestSuite() {
        delete raster;
        raster = nullptr;
    }

    static Raster* raster;
};

Raster* Gigapixel::raster = nullptr;

TEST_F(Gigapixel, HasTheExtentItsFieldsDescribe) {
    EXPECT_EQ(raster->byteSize, kBytes);
    EXPECT_EQ(raster->lineStride, kFull);
    EXPECT_EQ(raster->bufferHeight, kFull);
}

TEST_F(Gigapixel, ConvertsTheBottomRowsThroughTheFactory) {
    const std::unique_ptr<typeconv::IPromote> toFloat(
        PromoteFactory().Create(DataType::Type8U, DataType::Type32R));
    std::vector<float> floats(kBytes - kBandStart);
    Report("convert bottom rows 8U to 32R", Seconds([&] {
               toFloat->Promote(raster->data + kBandStart, floats.data(),
                                static_cast<unsigned int>(floats.size()));
           }));
    for (std::size_t i = 0; i < floats.size(); ++i) {
        ASSERT_EQ(floats[i], static_cast<float>(raster->data[kBandStart + i])) << i;
    }
}

// The whole raster has more pixels than a mask counts; a tile of its bottom rows, wrapped
// where it lies, masks exactly.
TEST_F(Gigapixel, MasksTheBottomRowsAsATileAndRefusesTheWhole) {
    const MaskDecisionBuilder builder(0.0, BkgdAnyChan);
    EXPECT_THROW(builder.BuildMask(*raster), kora::OutOfBoundsException);
    Raster tile;
    tile.width = kFull;
    tile.height = kBand;
    tile.channels = 1;
    tile.dataType = DataType::Type8U;
    tile.lineStride = kFull;
    tile.bufferHeight = kBand;
    tile.data = raster->data + kBandStart;
    tile.byteSize = kBytes - kBandStart;
    std::unique_ptr<Mask> mask;
    Report("mask of the bottom rows", Seconds([&] { mask.reset(builder.BuildMask(tile)); }));
    ASSERT_EQ(mask->GetBitCount(), kFull * kBand);
    for (unsigned int i = 0; i < mask->GetBitCount(); ++i) {
        ASSERT_EQ(mask->GetBit(i), tile.data[i] != 0) << i;
    }
}

TEST_F(Gigapixel, ByteRunsDecodeWholeAndByWindowNearTheBottom) {
    RasterInfo info(kSide, kSide, 1, DataType::Type8U);
    RasterContext context(1, 1, 0, 0);
    std::unique_ptr<RLECompressedData> compressed;
    Report("byte runs: compress", Seconds([&] {
               compressed = std::make_unique<RLECompressedData>(raster->data, info, context);
           }));
    {
        std::unique_ptr<unsigned char[]> whole;
        Report("byte runs: decode whole", Seconds([&] { whole.reset(compressed->Decode()); }));
        ASSERT_EQ(std::memcmp(whole.get(), raster->data, kBytes), 0);
    }
    // Rows 65998 to 66001, columns 65800 to 65999, by the running-total rule.
    const Bytes expected = kubo_test::PairWindowReference(compressed->GetCompressedData(),
                                                          compressed->GetCompressedSize(), kFull, 1,
                                                          65800, 65998, 200, 4);
    Bytes window(expected.size());
    compressed->Decode(65800, 65998, 200, 4, window.data());
    EXPECT_EQ(window, expected);
    EXPECT_EQ(Bytes(window.begin(), window.begin() + 200),
              SliceOf(raster->data, kFull, 65800, 65998, 200, 1, false));
    Bytes bottom(256 * 256);
    ReportBottomWindows("byte runs", *compressed, kFull, bottom);
}

TEST_F(Gigapixel, BitRunsDecodeWholeAndByWindowNearTheBottom) {
    RasterInfo info(kFull, kFull, 1, DataType::Type8U);
    std::unique_ptr<BitwiseRLECompressedData> compressed;
    Report("bit runs: compress", Seconds([&] {
               compressed = std::make_unique<BitwiseRLECompressedData>(raster->data, info);
           }));
    {
        std::unique_ptr<unsigned char[]> whole;
        Report("bit runs: decode whole", Seconds([&] { whole.reset(compressed->Decode()); }));
        ASSERT_EQ(std::memcmp(whole.get(), raster->data, kBytes), 0);
    }
    Bytes bottom(256 * 256);
    ReportBottomWindows("bit runs", *compressed, kFull, bottom);
    EXPECT_EQ(bottom, SliceOf(raster->data, kFull, kFull - 256, kFull - 256, 256, 256, false));
}

TEST_F(Gigapixel, RowMaskDecodesWholeAndByWindowNearTheBottom) {
    std::unique_ptr<LineRLECompressedBitMask> compressed;
    Report("row mask: compress",
           Seconds([&] { compressed = std::make_unique<LineRLECompressedBitMask>(*raster); }));
    {
        std::unique_ptr<unsigned char[]> whole;
        Report("row mask: decode whole", Seconds([&] { whole.reset(compressed->Decode()); }));
        for (std::uint64_t row = kSide - kBand; row < kSide; ++row) {
            ASSERT_EQ(Bytes(whole.get() + row * kSide, whole.get() + (row + 1) * kSide),
                      SliceOf(raster->data, kFull, 1, row + 1, kSide, 1, true))
                << row;
        }
    }
    Bytes bottom(256 * 256);
    ReportBottomWindows("row mask", *compressed, kSide, bottom);
    EXPECT_EQ(bottom, SliceOf(raster->data, kFull, kSide - 255, kSide - 255, 256, 256, true));
}

TEST_F(Gigapixel, TilesCoverTheWholeArea) {
    TileIterator tiles(kSide, kSide);
    EXPECT_EQ(tiles.SetChunkSize(4096u, 4096u), 17u * 17u);
    for (const unsigned long pixels : {4096ul * 4096ul, 1ul << 30}) {
        tiles.SetChunkSize(pixels);
        std::uint64_t area = 0;
        for (Tile tile = tiles.GetFirstTile(); tile.xSize != 0; tile = tiles.GetNextTile()) {
            area += std::uint64_t{tile.xSize} * tile.ySize;
        }
        EXPECT_EQ(area, std::uint64_t{kSide} * kSide) << pixels;
        EXPECT_EQ(tiles.GetTileIndex(kSide - 1, kSide - 1), tiles.GetTileRange());
    }
}

// Runs last: it writes the margins the other steps read.
TEST_F(Gigapixel, ZFillsTheMarginsOfTheBottomRows) {
    Report("mirror every margin",
           Seconds([] { FillRasterMargins(raster, MARGIN_MIRROR, MARGIN_ALL); }));
    const unsigned char* data = raster->data;
    const auto at = [&](std::uint64_t x, std::uint64_t y) { return data[y * kFull + x]; };
    for (std::uint64_t x = 1; x <= kSide; ++x) {
        ASSERT_EQ(at(x, kFull - 1), at(x, kFull - 2)) << x;  // below the last line
    }
    for (std::uint64_t y = kFull - kBand; y < kFull; ++y) {
        ASSERT_EQ(at(0, y), at(1, y)) << y;                  // left of the first column
        ASSERT_EQ(at(kFull - 1, y), at(kFull - 2, y)) << y;  // right of the last column
    }
}

}  // namespace
