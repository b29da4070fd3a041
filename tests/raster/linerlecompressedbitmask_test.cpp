#include "vrkframework/basic/kubo/raster/linerlecompressedbitmask.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <numeric>
#include <random>

#include "support/compressedsamples.h"
#include "support/expectfailure.h"

namespace {

using kora::kubo::DataType;
using kora::kubo::LineRLECompressedBitMask;
using kora::kubo::Raster;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;
using kubo_test::Bytes;

constexpr char kSource[] = "vrkframework/basic/kubo/raster/linerlecompressedbitmask";

// A mask of `bytes` (row after row) through the (width, height) constructor.
LineRLECompressedBitMask MaskOf(Bytes bytes, unsigned int width, unsigned int height) {
    LineRLECompressedBitMask mask(width, height);
    for (unsigned int row = 0; row < height; ++row) {
        mask.CompressRow(bytes.data() + std::size_t{row} * width, row);
    }
    return mask;
}

Bytes Runs(const LineRLECompressedBitMask& mask, unsigned long row) {
    const unsigned char* runs = mask.GetCompressedRow(row);
    return Bytes(runs, runs + mask.GetCompressedRowSize(row));
}

Bytes Flags(const Bytes& bytes) {
    Bytes flags(bytes.size());
    for (std::size_t i = 0; i < bytes.size(); ++i) {
        flags[i] = bytes[i] != 0 ? 1 : 0;
    }
    return flags;
}

Bytes Window(const LineRLECompressedBitMask& mask, int x, int y, int w, int h) {
    Bytes out(static_cast<std::size_t>(w * h) + 1, 0xEE);
    mask.Decode(x, y, w, h, out.data());
    EXPECT_EQ(out.back(), 0xEE) << "wrote past the window";
    out.pop_back();
    return out;
}

TEST(LineRLECompressedBitMask, RowsAreAlternatingRunsOfClearAndSetPixels) {
    const LineRLECompressedBitMask mask = MaskOf({0, 0, 7, 7, 0, 200, 0, 0, 0, 0}, 5, 2);
    EXPECT_EQ(Runs(mask, 0), (Bytes{2, 2, 1}));
    EXPECT_EQ(Runs(mask, 1), (Bytes{0, 1, 4}));  // starts set
    EXPECT_EQ(kubo_test::Take(mask.DecodeRow(0), 5), (Bytes{0, 0, 1, 1, 0}));
    EXPECT_EQ(Runs(MaskOf(Bytes(300, 1), 300, 1), 0), (Bytes{0, 255, 0, 45}));
    EXPECT_EQ(Runs(MaskOf(Bytes(510, 0), 510, 1), 0), (Bytes{255, 0, 255}));
    EXPECT_EQ(Runs(MaskOf({}, 0, 2), 1), (Bytes{0}));
}

TEST(LineRLECompressedBitMask, DescriptionIsOneChannelOfOneBit) {
    const LineRLECompressedBitMask mask(7, 3);
    EXPECT_EQ(mask.GetWidth(), 7u);
    EXPECT_EQ(mask.GetHeight(), 3u);
    EXPECT_EQ(mask.GetChansCount(), 1u);
    EXPECT_EQ(mask.GetDataType(), DataType(1, false, false, 1, 0, false));
    EXPECT_EQ(mask.GetBytesPerPixel(), 1u);
    EXPECT_EQ(mask.GetRowSize(), 7u);
    EXPECT_EQ(mask.GetBufferSize(), 21u);
}

TEST(LineRLECompressedBitMask, ARasterIsReadFromItsVisibleArea) {
    Raster raster(RasterInfo(4, 2, 1, DataType::Type8U), RasterContext(2, 1, 0, 0));
    const Bytes bytes = {9, 9, 9, 9, 9, 9, 9, 9,  //
                         9, 9, 0, 5, 5, 0, 9, 9,  //
                         9, 9, 3, 0, 0, 0, 9, 9,  //
                         9, 9, 9, 9, 9, 9, 9, 9};
    std::copy(bytes.begin(), bytes.end(), raster.data);
    LineRLECompressedBitMask mask(raster);
    EXPECT_EQ(mask.GetWidth(), 4u);
    EXPECT_EQ(mask.GetHeight(), 2u);
    EXPECT_EQ(kubo_test::Take(mask.Decode(), 8), (Bytes{0, 1, 1, 0, 1, 0, 0, 0}));
    Bytes row = {0, 0, 0, 8};
    mask.CompressRow(row.data(), 0);
    EXPECT_EQ(kubo_test::Take(mask.Decode(), 8), (Bytes{0, 0, 0, 1, 1, 0, 0, 0}));

    // Two channels: a row is read from its first pixel, one byte per mask pixel.
    Raster pairs(RasterInfo(2, 2, 2, DataType::Type8U), RasterContext(1, 0, 0, 0));
    const Bytes interleaved = {7, 7, 0, 4, 4, 0, 7, 7,  //
                               7, 7, 4, 0, 0, 0, 7, 7};
    std::copy(interleaved.begin(), interleaved.end(), pairs.data);
    EXPECT_EQ(kubo_test::Take(LineRLECompressedBitMask(pairs).Decode(), 4), (Bytes{0, 1, 1, 0}));
}

TEST(LineRLECompressedBitMask, DecodingGivesZeroAndOneForAnyInputValues) {
    const unsigned int width = 333;
    const unsigned int height = 17;
    unsigned int seed = 0;
    for (const Bytes& bytes : {kubo_test::NoiseBytes(width * height, ++seed),
                               kubo_test::RunBytes(width * height, ++seed, {0, 1, 77, 255}, 600),
                               kubo_test::RunBytes(width * height, ++seed, {0, 2}, 4)}) {
        const Bytes flags = Flags(bytes);
        const LineRLECompressedBitMask mask = MaskOf(bytes, width, height);
        EXPECT_EQ(kubo_test::Take(mask.Decode(), flags.size()), flags);
        Bytes out(flags.size() + 1, 0xEE);
        mask.Decode(out.data());
        EXPECT_EQ(out.back(), 0xEE);
        out.pop_back();
        EXPECT_EQ(out, flags);
        for (unsigned long row = 0; row < height; ++row) {
            Bytes decoded(width, 0xEE);
            mask.DecodeRow(row, decoded.data());
            EXPECT_EQ(decoded, kubo_test::Slice(flags, width, 0, row, width, 1));
        }
    }
}

TEST(LineRLECompressedBitMask, WindowsAreSlicesOfTheMask) {
    const unsigned int width = 700;
    const unsigned int height = 12;
    const Bytes flags = Flags(kubo_test::RunBytes(width * height, 4, {0, 1}, 400));
    const LineRLECompressedBitMask mask = MaskOf(flags, width, height);
    std::mt19937 random(5);
    for (int i = 0; i < 300; ++i) {
        const int x = static_cast<int>(random() % width);
        const int y = static_cast<int>(random() % height);
        const int w = static_cast<int>(random() % (width - static_cast<unsigned>(x) + 1));
        const int h = static_cast<int>(random() % (height - static_cast<unsigned>(y) + 1));
        ASSERT_EQ(
            Window(mask, x, y, w, h),
            kubo_test::Slice(flags, width, static_cast<std::size_t>(x), static_cast<std::size_t>(y),
                             static_cast<std::size_t>(w), static_cast<std::size_t>(h)));
    }
    unsigned char* out = mask.Decode(699, 11, 1, 1);
    EXPECT_EQ(out[0], flags.back());
    out[flags.size() - 1] = 0;  // the buffer holds the whole mask
    delete[] out;
}

// Rows of thousands of runs are decoded from checkpoints inside the row; a window must not
// tell, wherever it starts: in noise, inside a set run long enough to be split into 255 + 0 +
// ... pieces, at the row's end or past it.
TEST(LineRLECompressedBitMask, WindowsFarAlongLongRowsAreSlicesOfTheMask) {
    const unsigned int width = 40000;
    const unsigned int height = 3;
    Bytes flags = Flags(kubo_test::RunBytes(width * height, 9, {0, 1}, 6));
    std::fill_n(flags.begin() + width + 20000, 3000, 1);
    std::fill_n(flags.begin() + width + 23500, 3000, 0);
    const LineRLECompressedBitMask mask = MaskOf(flags, width, height);
    ASSERT_GT(mask.GetCompressedRowSize(1), 4096u);
    std::mt19937 random(3);
    for (int i = 0; i < 400; ++i) {
        const int x = i == 0 ? 20500 : static_cast<int>(random() % width);
        const int y = static_cast<int>(random() % height);
        const int w = static_cast<int>(random() % std::min(300u, width - static_cast<unsigned>(x)));
        ASSERT_EQ(Window(mask, x, y, w, 1),
                  kubo_test::Slice(flags, width, static_cast<std::size_t>(x),
                                   static_cast<std::size_t>(y), static_cast<std::size_t>(w), 1))
            << x << "," << y;
    }
    // Around the pixels where every 1024th run starts.
    const Bytes runs = Runs(mask, 1);
    std::size_t start = 0;
    for (std::size_t run = 0; run + 1024 < runs.size(); run += 1024) {
        start = std::accumulate(runs.begin() + static_cast<std::ptrdiff_t>(run),
                                runs.begin() + static_cast<std::ptrdiff_t>(run) + 1024, start);
        for (const std::size_t x : {start - 1, start, start + 1}) {
            ASSERT_EQ(Window(mask, static_cast<int>(x), 1, 5, 1),
                      kubo_test::Slice(flags, width, x, 1, 5, 1))
                << x;
        }
    }
    // Windows too wide to be filled ahead, over long pieces of either value.
    EXPECT_EQ(Window(mask, 19000, 1, 5000, 1), kubo_test::Slice(flags, width, 19000, 1, 5000, 1));
    EXPECT_EQ(Window(mask, 0, 0, width, 3), flags);
    EXPECT_EQ(Window(mask, width, 2, 2, 1), (Bytes{0, 0}));
    Bytes out(1);
    EXPECT_THROW(mask.Decode(width + 1, 2, 1, 1, out.data()), kora::DataException);
}

TEST(LineRLECompressedBitMask, PartialRowsStartInsideARun) {
    const LineRLECompressedBitMask mask = MaskOf({0, 0, 1, 1, 0}, 5, 1);
    EXPECT_EQ(Window(mask, 3, 0, 2, 1), (Bytes{1, 0}));
    EXPECT_EQ(Window(mask, 2, 0, 1, 1), (Bytes{1}));
    // A start at the row's end is found when the runs add up to it exactly; pixels past
    // the end read as clear.
    EXPECT_EQ(Window(mask, 5, 0, 0, 1), Bytes());
    EXPECT_EQ(Window(mask, 5, 0, 2, 1), (Bytes{0, 0}));
    EXPECT_EQ(Window(mask, 3, 0, 4, 1), (Bytes{1, 0, 0, 0}));
}

TEST(LineRLECompressedBitMask, RowsWithoutRunsReadAsClear) {
    LineRLECompressedBitMask mask(4, 3);
    EXPECT_EQ(mask.GetCompressedRow(1), nullptr);
    EXPECT_EQ(mask.GetCompressedRowSize(1), 0u);
    Bytes row = {5, 0, 5, 5};
    mask.CompressRow(row.data(), 1);
    EXPECT_EQ(kubo_test::Take(mask.Decode(), 12), (Bytes{0, 0, 0, 0, 1, 0, 1, 1, 0, 0, 0, 0}));
    // Rows past the last one store nothing and read as clear.
    mask.CompressRow(row.data(), 3);
    EXPECT_EQ(mask.GetCompressedRow(3), nullptr);
    EXPECT_EQ(mask.GetCompressedRowSize(99), 0u);
    EXPECT_EQ(kubo_test::Take(mask.DecodeRow(3), 4), Bytes(4, 0));
    EXPECT_EQ(Window(mask, 0, 1, 4, 4), (Bytes{1, 0, 1, 1, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0}));
    EXPECT_EQ(Window(mask, 0, -1, 2, 2), (Bytes{0, 0, 0, 0}));
    // A window larger than the mask fills the allocated buffer and stops at its end.
    EXPECT_EQ(kubo_test::Take(mask.Decode(0, 1, 1000, 5), 12),
              (Bytes{1, 0, 1, 1, 0, 0, 0, 0, 0, 0, 0, 0}));
}

TEST(LineRLECompressedBitMask, ReplacingARowReleasesTheOldOneAndCopiesSeeTheNewOne) {
    LineRLECompressedBitMask mask = MaskOf({0, 0, 1, 1, 1, 1}, 3, 2);
    const LineRLECompressedBitMask copy(mask);
    LineRLECompressedBitMask assigned(1, 1);
    assigned = mask;
    Bytes row = {1, 1, 0};
    mask.CompressRow(row.data(), 0);
    const LineRLECompressedBitMask* views[] = {&mask, &copy, &assigned};
    for (const LineRLECompressedBitMask* view : views) {
        EXPECT_EQ(view->GetCompressedRow(0), mask.GetCompressedRow(0));
        EXPECT_EQ(kubo_test::Take(view->Decode(), 6), (Bytes{1, 1, 0, 1, 1, 1}));
    }
}

TEST(LineRLECompressedBitMask, AStartPastTheRowsRunsIsNotFound) {
    const LineRLECompressedBitMask mask = MaskOf({0, 1, 1, 0, 0, 1}, 3, 2);
    // A start past the row's runs, also a negative one, which wraps far out, and any
    // start in a row that holds no runs.
    for (const auto& start : {std::make_pair(4, 0), std::make_pair(-1, 0), std::make_pair(1, 2)}) {
        Bytes out(4);
        const auto partial = kubo_test::Catch<kora::DataException>(
            [&] { mask.Decode(start.first, start.second, 1, 1, out.data()); });
        ASSERT_TRUE(partial);
        kubo_test::ExpectReport(*partial, "Uncompressed index not found.", kSource,
                                "void __cdecl kora::kubo::LineRLECompressedBitMask::"
                                "DecodePartialRow(unsigned long,unsigned long,unsigned "
                                "long,unsigned char *) const",
                                327);
    }
}

// A raster whose buffer cannot give one byte per pixel of every visible row is refused
// before anything is read: no channels or 0-bit samples (every row then starts at byte 0
// of a 0-byte buffer), no buffer, or a byte size short of the last row; so are null rows.
TEST(LineRLECompressedBitMask, RefusesRastersWhoseBufferDoesNotHoldTheRows) {
    Raster noChannels(RasterInfo(4, 2, 0, DataType::Type8U), RasterContext());
    Raster noBits(RasterInfo(4, 2, 1, DataType()), RasterContext(1, 1, 0, 0));
    Raster noBuffer;
    noBuffer.width = noBuffer.height = noBuffer.channels = 1;
    noBuffer.dataType = DataType::Type8U;
    Raster shortBuffer(RasterInfo(4, 2, 1, DataType::Type8U), RasterContext());
    shortBuffer.byteSize = 7;
    for (Raster* raster : {&noChannels, &noBits, &noBuffer, &shortBuffer}) {
        const auto failure =
            kubo_test::Catch<kora::DataException>([&] { LineRLECompressedBitMask mask(*raster); });
        ASSERT_TRUE(failure.has_value());
        kubo_test::ExpectReport(
            *failure, "The raster buffer does not hold one byte per pixel of every row to compress",
            kSource,
            "__cdecl kora::kubo::LineRLECompressedBitMask::LineRLECompressedBitMask(class "
            "kora::kubo::Raster &)",
            0);
    }
    // Row operations need a buffer when the row has pixels.
    LineRLECompressedBitMask mask(4, 2);
    const auto compress =
        kubo_test::Catch<kora::DataException>([&] { mask.CompressRow(nullptr, 0); });
    ASSERT_TRUE(compress.has_value());
    EXPECT_EQ(compress->GetMessage(), "pBuffer is NULL, cannot compress NULL buffer");
    const auto decode = kubo_test::Catch<kora::DataException>([&] { mask.DecodeRow(0, nullptr); });
    ASSERT_TRUE(decode.has_value());
    EXPECT_EQ(decode->GetFunction(),
              "void __cdecl kora::kubo::LineRLECompressedBitMask::DecodeRow(unsigned long,unsigned "
              "char *) const");
    // An empty visible area reads nothing, whatever the buffer.
    Raster empty(RasterInfo(0, 3, 0, DataType()), RasterContext());
    EXPECT_EQ(LineRLECompressedBitMask(empty).GetCompressedRowSize(2), 1u);
}

}  // namespace
