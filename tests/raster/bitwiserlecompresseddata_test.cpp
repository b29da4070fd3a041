#include "vrkframework/basic/kubo/raster/bitwiserlecompresseddata.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>

#include "support/compressedsamples.h"
#include "support/expectfailure.h"

namespace {

using kora::kubo::BitwiseRLECompressedData;
using kora::kubo::DataType;
using kora::kubo::RasterInfo;
using kubo_test::Bytes;

constexpr char kSource[] = "vrkframework/basic/kubo/raster/bitwiserlecompresseddata";
constexpr char kWindowDecode[] =
    "void __cdecl kora::kubo::BitwiseRLECompressedData::Decode(int,int,int,int,unsigned char *) "
    "const";

BitwiseRLECompressedData Compress(Bytes bytes, RasterInfo info) {
    return BitwiseRLECompressedData(bytes.data(), info);
}

BitwiseRLECompressedData Compress8U(const Bytes& bytes, unsigned int width, unsigned int height) {
    return Compress(bytes, RasterInfo(width, height, 1, DataType::Type8U));
}

Bytes Runs(const BitwiseRLECompressedData& data) {
    return Bytes(data.GetCompressedData(), data.GetCompressedData() + data.GetCompressedSize());
}

// Decodes into a buffer of `size` bytes filled with 0xEE, so untouched bytes show.
Bytes Window(const BitwiseRLECompressedData& data, int x, int y, int w, int h, std::size_t size) {
    Bytes out(size, 0xEE);
    data.Decode(x, y, w, h, out.data());
    return out;
}

TEST(BitwiseRLECompressedData, RunsAlternateStartingWithZeroBits) {
    EXPECT_EQ(Runs(Compress8U({0x0F}, 1, 1)), (Bytes{4, 4}));
    EXPECT_EQ(Runs(Compress8U({0xF0}, 1, 1)), (Bytes{0, 4, 4}));
    EXPECT_EQ(Runs(Compress8U({0xFF, 0xFF}, 2, 1)), (Bytes{0, 16}));
    EXPECT_EQ(Runs(Compress8U({0x5A}, 1, 1)), (Bytes{1, 1, 1, 2, 1, 1, 1}));
}

TEST(BitwiseRLECompressedData, RunsOver255GoOnAfterAZeroSeparator) {
    EXPECT_EQ(Runs(Compress8U(Bytes(75, 0), 75, 1)), (Bytes{255, 0, 255, 0, 90}));
    // 255 zero bits then a one: a full run that ends needs no separator.
    Bytes bytes(32, 0);
    bytes[31] = 0x01;
    EXPECT_EQ(Runs(Compress8U(bytes, 32, 1)), (Bytes{255, 1}));
    Bytes ones(33, 0xFF);
    ones[32] = 0;
    EXPECT_EQ(Runs(Compress8U(ones, 33, 1)), (Bytes{0, 255, 0, 1, 8}));
}

TEST(BitwiseRLECompressedData, AnEmptyRasterIsTheSingleRunZero) {
    const BitwiseRLECompressedData data = Compress8U({0xAB}, 0, 3);
    EXPECT_EQ(Runs(data), (Bytes{0}));
    unsigned char guard = 0xEE;
    data.Decode(&guard);
    EXPECT_EQ(guard, 0xEE);
}

TEST(BitwiseRLECompressedData, DescriptionIsTheInfoWithoutMargins) {
    const Bytes bytes = kubo_test::NoiseBytes(3 * 2 * 2 * 4, 1);
    const BitwiseRLECompressedData data = Compress(bytes, RasterInfo(3, 2, 2, DataType::Type32S));
    EXPECT_EQ(data.GetWidth(), 3u);
    EXPECT_EQ(data.GetHeight(), 2u);
    EXPECT_EQ(data.GetChansCount(), 2u);
    EXPECT_EQ(data.GetDataType(), DataType::Type32S);
    EXPECT_EQ(kubo_test::Take(data.Decode(), bytes.size()), bytes);
}

// Round trips over types and channels, on noise and on runs; the stream is canonical:
// a 0 only first or after a 255, and the runs add up to the bit count.
TEST(BitwiseRLECompressedData, WholeDecodingRestoresTheBytesOfEveryLayout) {
    const RasterInfo layouts[] = {{1, 1, 1, DataType::Type8U},  {37, 11, 1, DataType::Type8U},
                                  {10, 3, 3, DataType::Type8U}, {9, 7, 2, DataType::Type16S},
                                  {5, 5, 1, DataType::Type64R}, {64, 8, 1, DataType::Type1U}};
    unsigned int seed = 0;
    for (const RasterInfo& layout : layouts) {
        const std::size_t size = std::size_t{layout.width} * layout.height * layout.channels *
                                 ((layout.dataType.bits + 7) / 8);
        for (const Bytes& bytes :
             {kubo_test::NoiseBytes(size, ++seed), kubo_test::RunBytes(size, ++seed, {0, 0xFF}, 90),
              kubo_test::RunBytes(size, ++seed, {0x0F, 0x80, 0xFF}, 5)}) {
            const BitwiseRLECompressedData data = Compress(bytes, layout);
            EXPECT_EQ(kubo_test::Take(data.Decode(), size), bytes);
            Bytes out(size + 1, 0xEE);
            data.Decode(out.data());
            EXPECT_EQ(out, [&] {
                Bytes expected = bytes;
                expected.push_back(0xEE);
                return expected;
            }());

            const Bytes runs = Runs(data);
            std::size_t bits = 0;
            for (std::size_t i = 0; i < runs.size(); ++i) {
                if (runs[i] == 0 && i > 0) {
                    EXPECT_EQ(runs[i - 1], 255);
                }
                bits += runs[i];
            }
            EXPECT_EQ(bits, 8 * size);
        }
    }
}

TEST(BitwiseRLECompressedData, WindowsOfOneByteSamplesAreSlicesInAnyOrder) {
    const unsigned int width = 61;
    const unsigned int height = 23;
    std::mt19937 random(3);
    for (const Bytes& bytes : {kubo_test::RunBytes(width * height, 4, {0, 0xFF, 0x3C}, 200),
                               kubo_test::NoiseBytes(width * height, 5)}) {
        const BitwiseRLECompressedData data = Compress8U(bytes, width, height);
        // Random order moves the cursor forwards and backwards between windows.
        for (int i = 0; i < 300; ++i) {
            const int x = static_cast<int>(random() % width);
            const int y = static_cast<int>(random() % height);
            const int w = static_cast<int>(random() % (width - static_cast<unsigned>(x) + 1));
            const int h = static_cast<int>(random() % (height - static_cast<unsigned>(y) + 1));
            const Bytes expected = kubo_test::Slice(
                bytes, width, static_cast<std::size_t>(x), static_cast<std::size_t>(y),
                static_cast<std::size_t>(w), static_cast<std::size_t>(h));
            Bytes out = Window(data, x, y, w, h, expected.size() + 1);
            EXPECT_EQ(out.back(), 0xEE);
            out.pop_back();
            ASSERT_EQ(out, expected) << x << ' ' << y << ' ' << w << ' ' << h;
        }
        // Tiles side by side, row by row: each row of a tile starts where the same row of
        // the tile to its left ended.
        for (unsigned int y = 0; y < height; y += 8) {
            for (unsigned int x = 0; x < width; x += 16) {
                const unsigned int w = std::min(16u, width - x);
                const unsigned int h = std::min(8u, height - y);
                ASSERT_EQ(Window(data, static_cast<int>(x), static_cast<int>(y),
                                 static_cast<int>(w), static_cast<int>(h), w * h),
                          kubo_test::Slice(bytes, width, x, y, w, h))
                    << x << ' ' << y;
            }
        }
        // The same window twice: the second decode seeks backwards from where the first
        // ended.
        const Bytes first = Window(data, 3, 2, 40, 15, 40 * 15);
        EXPECT_EQ(Window(data, 3, 2, 40, 15, 40 * 15), first);
        EXPECT_EQ(first, kubo_test::Slice(bytes, width, 3, 2, 40, 15));
        // The whole raster as a window.
        EXPECT_EQ(
            kubo_test::Take(data.Decode(0, 0, static_cast<int>(width), static_cast<int>(height)),
                            bytes.size()),
            bytes);
    }
}

TEST(BitwiseRLECompressedData, WindowsReadBytesButPlaceRowsByPixels) {
    // 5 x 4 pixels of 2 channels of 2 bytes: rows of 20 bytes. x = 1 and w = 2 read
    // bytes 1 and 2 of each row; rows are placed 2 x 2 x 2 = 8 bytes apart.
    const Bytes bytes = kubo_test::NoiseBytes(5 * 4 * 2 * 2, 7);
    const BitwiseRLECompressedData data = Compress(bytes, RasterInfo(5, 4, 2, DataType::Type16U));
    Bytes expected(8 + 2 + 3, 0xEE);
    expected[0] = bytes[21];
    expected[1] = bytes[22];
    expected[8] = bytes[41];
    expected[9] = bytes[42];
    EXPECT_EQ(Window(data, 1, 1, 2, 2, expected.size()), expected);
    unsigned char* whole = data.Decode(1, 1, 2, 2);
    EXPECT_EQ(whole[8], bytes[41]);
    whole[bytes.size() - 1] = 0;  // the buffer holds the whole raster
    delete[] whole;
}

TEST(BitwiseRLECompressedData, NegativeColumnsPassTheCheckAndReadFromTheRowBefore) {
    const Bytes bytes = {1, 2, 3, 4, 5, 6, 7, 8};
    const BitwiseRLECompressedData data = Compress8U(bytes, 4, 2);
    EXPECT_EQ(Window(data, -1, 1, 3, 1, 3), (Bytes{4, 5, 6}));
}

TEST(BitwiseRLECompressedData, WindowsMustLieInsideTheRasterWhateverTheBuffer) {
    const Bytes bytes = kubo_test::NoiseBytes(8 * 5, 8);
    const BitwiseRLECompressedData data = Compress8U(bytes, 8, 5);
    EXPECT_EQ(Window(data, 5, 4, 3, 1, 3), kubo_test::Slice(bytes, 8, 5, 4, 3, 1));
    struct Case {
        int x, y, w, h;
    };
    Bytes buffer(64);
    for (const Case& c : {Case{5, 0, 4, 1}, Case{0, 3, 1, 3}, Case{0, 5, 1, 0}, Case{8, 0, 0, 1},
                          Case{0, 0, 1, 2147483647}, Case{1, 0, 2147483647, 1}}) {
        for (unsigned char* out : {static_cast<unsigned char*>(nullptr), buffer.data()}) {
            const auto failure = kubo_test::Catch<kora::OutOfBoundsException>(
                [&] { data.Decode(c.x, c.y, c.w, c.h, out); });
            ASSERT_TRUE(failure);
            kubo_test::ExpectReport(*failure, "Window is not in include in this compressed raster",
                                    kSource, kWindowDecode, 190);
            EXPECT_EQ(failure->GetValues(), (std::vector<int>{c.x, c.y, c.w, c.w}));
        }
    }
    EXPECT_TRUE(
        kubo_test::Catch<kora::OutOfBoundsException>([&] { delete[] data.Decode(0, 0, 9, 1); }));
}

TEST(BitwiseRLECompressedData, ANullBufferIsNotCompressed) {
    RasterInfo info(2, 2, 1, DataType::Type8U);
    const auto compress =
        kubo_test::Catch<kora::DataException>([&] { BitwiseRLECompressedData(nullptr, info); });
    ASSERT_TRUE(compress);
    kubo_test::ExpectReport(*compress, "pBuffer is NULL, cannot compress NULL buffer", kSource,
                            "__cdecl kora::kubo::BitwiseRLECompressedData::"
                            "BitwiseRLECompressedData(unsigned char *,class "
                            "kora::kubo::RasterInfo &)",
                            25);
}

TEST(BitwiseRLECompressedData, SeekingPastTheLastRunFailsInJumpThenInSeekUntilAReset) {
    // A short stream, and one long enough for the cursor to skip ahead through its index.
    for (const auto& [bytes, width] :
         {std::pair<Bytes, unsigned int>{{0x00, 0x0F, 0xFF, 0x81}, 2},
          std::pair<Bytes, unsigned int>{kubo_test::NoiseBytes(2000, 12), 1000}}) {
        const BitwiseRLECompressedData data = Compress8U(bytes, width, 2);
        // Column -1 of row 0 wraps to a byte offset far past the end.
        const auto jump =
            kubo_test::Catch<kora::DataException>([&] { Window(data, -1, 0, 1, 1, 1); });
        ASSERT_TRUE(jump);
        kubo_test::ExpectReport(
            *jump, "Uncompressed index not found.", kSource,
            "void __cdecl kora::kubo::BitwiseRLECompressedData::Jump(void) const", 343);

        // The failed jump left the cursor past the last run: seeking on from there fails at
        // once, also in a copy, which takes the cursor along.
        const BitwiseRLECompressedData copy(data);
        for (const BitwiseRLECompressedData* object : {&data, &copy}) {
            const auto seek =
                kubo_test::Catch<kora::DataException>([&] { Window(*object, -1, 0, 1, 1, 1); });
            ASSERT_TRUE(seek);
            kubo_test::ExpectReport(
                *seek, "Uncompressed index not found.", kSource,
                "void __cdecl kora::kubo::BitwiseRLECompressedData::Seek(unsigned long) const",
                318);
        }
        // A window before the cursor resets it.
        const int w = static_cast<int>(width);
        EXPECT_EQ(Window(data, 0, 0, w, 2, bytes.size()), bytes);
        EXPECT_EQ(Window(copy, w - 1, 1, 1, 1, 1), (Bytes{bytes.back()}));
    }
}

TEST(BitwiseRLECompressedData, ASeekIntoTheMiddleOfTheLastRunJumpsPastItAndFails) {
    // A row may read on into the last run, or start where it starts, but a seek to a bit
    // inside it jumps past the end before it could step back.
    Bytes bytes(35, 0xFF);
    bytes[0] = 0;
    const BitwiseRLECompressedData data = Compress8U(bytes, 35, 1);
    ASSERT_EQ(Runs(data), (Bytes{8, 255, 0, 17}));
    EXPECT_EQ(Window(data, 30, 0, 5, 1, 5), Bytes(5, 0xFF));
    Bytes bits(40, 0);
    bits[32] = 0x80;  // bit 256 set: the last run holds bits 257 to 319
    const BitwiseRLECompressedData tail = Compress8U(bits, 40, 1);
    ASSERT_EQ(Runs(tail), (Bytes{255, 0, 1, 1, 63}));
    EXPECT_EQ(Window(tail, 32, 0, 8, 1, 8), (Bytes{0x80, 0, 0, 0, 0, 0, 0, 0}));
    const auto failure =
        kubo_test::Catch<kora::DataException>([&] { Window(tail, 33, 0, 1, 1, 1); });
    ASSERT_TRUE(failure);
    kubo_test::ExpectReport(*failure, "Uncompressed index not found.", kSource,
                            "void __cdecl kora::kubo::BitwiseRLECompressedData::Jump(void) const",
                            343);

    // A row that starts where the cursor stands inside the last run reads on; once the
    // cursor has moved elsewhere, the same row fails again, although a row of an earlier
    // window ended there.
    Bytes rows(80, 0x5A);
    std::copy(bits.begin(), bits.end(), rows.begin() + 40);
    const BitwiseRLECompressedData two = Compress8U(rows, 40, 2);
    EXPECT_EQ(Window(two, 32, 1, 1, 1, 1), Bytes{0x80});
    EXPECT_EQ(Window(two, 33, 1, 1, 1, 1), Bytes{0});
    EXPECT_EQ(Window(two, 0, 0, 1, 1, 1), Bytes{0x5A});
    EXPECT_TRUE(kubo_test::Catch<kora::DataException>([&] { Window(two, 34, 1, 1, 1, 1); }));
}

}  // namespace
