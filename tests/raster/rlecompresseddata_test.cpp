#include "vrkframework/basic/kubo/raster/rlecompresseddata.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <numeric>
#include <random>

#include "support/compressedsamples.h"
#include "support/expectfailure.h"

namespace {

using kora::kubo::DataType;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;
using kora::kubo::RLECompressedData;
using kubo_test::Bytes;

constexpr char kSource[] = "vrkframework/basic/kubo/raster/rlecompresseddata";

RLECompressedData Compress(Bytes bytes, RasterInfo info, RasterContext context = {}) {
    return RLECompressedData(bytes.data(), info, context);
}

RLECompressedData Compress8U(const Bytes& bytes, unsigned int width, unsigned int height) {
    return Compress(bytes, RasterInfo(width, height, 1, DataType::Type8U));
}

Bytes Pairs(const RLECompressedData& data) {
    return Bytes(data.GetCompressedData(), data.GetCompressedData() + data.GetCompressedSize());
}

Bytes Window(const RLECompressedData& data, int x, int y, int w, int h) {
    Bytes out(static_cast<std::size_t>(std::max(w, 0) * h) + 1, 0xEE);
    data.Decode(x, y, w, h, out.data());
    EXPECT_EQ(out.back(), 0xEE) << "wrote past the window";
    out.pop_back();
    return out;
}

Bytes Reference(const RLECompressedData& data, int x, int y, int w, int h) {
    const unsigned int pixel = (data.GetDataType().bits + 7) / 8 * data.GetChansCount();
    return kubo_test::PairWindowReference(data.GetCompressedData(), data.GetCompressedSize(),
                                          data.GetWidth(), pixel, x, y, w, h);
}

TEST(RLECompressedData, RunsLongerThan255SplitIntoPairsOfTheSameValue) {
    EXPECT_EQ(Pairs(Compress8U(Bytes(300, 9), 300, 1)), (Bytes{255, 9, 45, 9}));
    EXPECT_EQ(Pairs(Compress8U(Bytes(255, 9), 255, 1)), (Bytes{255, 9}));
    EXPECT_EQ(Pairs(Compress8U(Bytes(511, 0), 511, 1)), (Bytes{255, 0, 255, 0, 1, 0}));
}

TEST(RLECompressedData, EveryChangeStartsAPairSoDataWithoutRepeatsDoubles) {
    const RLECompressedData data = Compress8U({1, 2, 3}, 3, 1);
    EXPECT_EQ(Pairs(data), (Bytes{1, 1, 1, 2, 1, 3}));
    EXPECT_EQ(data.GetCompressedSize(), 6u);
    EXPECT_EQ(Pairs(Compress8U({4, 4, 5, 4}, 4, 1)), (Bytes{2, 4, 1, 5, 1, 4}));
}

TEST(RLECompressedData, ARunAcrossARowEndIsOnePair) {
    EXPECT_EQ(Pairs(Compress8U({5, 5, 5, 5, 7, 7}, 3, 2)), (Bytes{4, 5, 2, 7}));
}

TEST(RLECompressedData, DescriptionIncludesTheMarginsAndSamplesRoundUpToBytes) {
    // 3 x 2 image with margins 1 and 2: 5 x 6 pixels of 2 channels of 2 bytes.
    const Bytes bytes = kubo_test::NoiseBytes(5 * 6 * 2 * 2, 1);
    const RLECompressedData data =
        Compress(bytes, RasterInfo(3, 2, 2, DataType::Type16S), RasterContext(1, 2, 7, 9));
    EXPECT_EQ(data.GetWidth(), 5u);
    EXPECT_EQ(data.GetHeight(), 6u);
    EXPECT_EQ(data.GetChansCount(), 2u);
    EXPECT_EQ(data.GetDataType(), DataType::Type16S);
    EXPECT_EQ(kubo_test::Take(data.Decode(), bytes.size()), bytes);

    // A packed 12-bit sample takes 2 bytes; a complex one counts one component only.
    const DataType packed(12, false, false, 12, 0, false);
    for (const DataType& type : {packed, DataType::TypeC16S}) {
        const RLECompressedData pairs = Compress(Bytes(8, 3), RasterInfo(2, 1, 1, type));
        EXPECT_EQ(Pairs(pairs), (Bytes{4, 3}));
    }
}

TEST(RLECompressedData, AnEmptyRasterGivesAnEmptyStreamAndDecodesNothing) {
    unsigned char guard = 0xEE;
    RasterInfo info(0, 4, 1, DataType::Type8U);
    RasterContext context;
    const RLECompressedData data(&guard, info, context);
    EXPECT_EQ(data.GetCompressedSize(), 0u);
    data.Decode(&guard);
    EXPECT_EQ(guard, 0xEE);
    delete[] data.Decode();
}

// Round trips over types, channels and margins, on noise and on runs: the whole
// decoders restore every byte, and the stream is canonical (counts 1 to 255, a value
// repeats in the next pair only after a full pair).
TEST(RLECompressedData, WholeDecodingRestoresTheBytesOfEveryLayout) {
    struct Layout {
        unsigned int width, height, channels;
        DataType type;
        RasterContext margins;
    };
    const Layout layouts[] = {{1, 1, 1, DataType::Type8U, {}},
                              {17, 9, 1, DataType::Type8U, {3, 1, 0, 0}},
                              {33, 7, 3, DataType::Type8U, {}},
                              {13, 5, 2, DataType::Type16U, {2, 2, 0, 0}},
                              {7, 11, 1, DataType::Type32R, {1, 0, 0, 0}},
                              {9, 4, 2, DataType::Type64S, {0, 3, 0, 0}}};
    unsigned int seed = 0;
    for (const Layout& layout : layouts) {
        const std::size_t size = std::size_t{layout.width + 2 * layout.margins.xMargin} *
                                 (layout.height + 2 * layout.margins.yMargin) * layout.channels *
                                 ((layout.type.bits + 7) / 8);
        for (const Bytes& bytes :
             {kubo_test::NoiseBytes(size, ++seed), kubo_test::RunBytes(size, ++seed, {0, 255}),
              kubo_test::RunBytes(size, ++seed, {1, 2, 3}, 40)}) {
            const RLECompressedData data = Compress(
                bytes, RasterInfo(layout.width, layout.height, layout.channels, layout.type),
                layout.margins);
            EXPECT_EQ(kubo_test::Take(data.Decode(), size), bytes);
            Bytes out(size + 1, 0xEE);
            data.Decode(out.data());
            EXPECT_EQ(out.back(), 0xEE);
            out.pop_back();
            EXPECT_EQ(out, bytes);

            const Bytes pairs = Pairs(data);
            std::size_t total = 0;
            for (std::size_t i = 0; i < pairs.size(); i += 2) {
                ASSERT_GE(pairs[i], 1);
                total += pairs[i];
                if (i >= 2 && pairs[i + 1] == pairs[i - 1]) {
                    EXPECT_EQ(pairs[i - 2], 255);
                }
            }
            EXPECT_EQ(total, size);
        }
    }
}

TEST(RLECompressedData, AOneRowWindowIsTheStreamFromItsStart) {
    // Three channels: x counts pixels, w bytes, and one row may run on into the next.
    const Bytes bytes = kubo_test::RunBytes(40 * 10 * 3, 5, {0, 9, 200}, 300);
    const RLECompressedData data = Compress(bytes, RasterInfo(40, 10, 3, DataType::Type8U));
    std::mt19937 random(6);
    for (int i = 0; i < 300; ++i) {
        const int x = static_cast<int>(random() % 40);
        const int y = static_cast<int>(random() % 10);
        const auto start = static_cast<std::size_t>((y * 40 + x) * 3);
        const int w = static_cast<int>(random() % (bytes.size() - start + 1));
        EXPECT_EQ(Window(data, x, y, w, 1),
                  Bytes(bytes.begin() + static_cast<std::ptrdiff_t>(start),
                        bytes.begin() + static_cast<std::ptrdiff_t>(start) + w));
    }
    // Starting inside a run yields the rest of that run first.
    const RLECompressedData runs = Compress8U({4, 4, 4, 4, 4, 6, 6}, 7, 1);
    EXPECT_EQ(Window(runs, 2, 0, 4, 1), (Bytes{4, 4, 4, 6}));
}

TEST(RLECompressedData, LaterWindowRowsSeekOnTheTotalOfThePairsEntered) {
    // Pairs (2, 1) (3, 2) (3, 3). Row 0 starts in the first pair and enters the second,
    // adding 3 where leaving the first would add 2, so row 1 comes out one byte early.
    const RLECompressedData data = Compress8U({1, 1, 2, 2, 2, 3, 3, 3}, 4, 2);
    EXPECT_EQ(Window(data, 1, 0, 2, 2), (Bytes{1, 2, 2, 3}));
    EXPECT_NE(Window(data, 1, 0, 2, 2), (Bytes{1, 2, 3, 3}));  // the plain slice
    EXPECT_EQ(Window(data, 1, 1, 2, 1), (Bytes{3, 3}));
}

TEST(RLECompressedData, MultiRowWindowsFollowTheRunningTotalRule) {
    // Streams of a few hundred to many thousand pairs, so that windows start their walk
    // from the stream's index as well as from its start.
    const unsigned int width = 300;
    const unsigned int height = 60;
    std::mt19937 random(8);
    for (const Bytes& bytes : {kubo_test::RunBytes(width * height, 9, {0, 1}, 600),
                               kubo_test::RunBytes(width * height, 10, {7, 8, 9}, 30),
                               kubo_test::NoiseBytes(width * height, 11)}) {
        const RLECompressedData data = Compress8U(bytes, width, height);
        for (int i = 0; i < 200; ++i) {
            const int x = static_cast<int>(random() % width);
            const int y = static_cast<int>(random() % height);
            const int w = static_cast<int>(random() % (width - static_cast<unsigned>(x) + 1));
            const int h = static_cast<int>(random() % (height - static_cast<unsigned>(y) + 1));
            EXPECT_EQ(Window(data, x, y, w, h), Reference(data, x, y, w, h));
        }
        for (const auto& window :
             {std::array<int, 4>{-7, -2, 40, 3}, std::array<int, 4>{250, 58, 90, 4},
              std::array<int, 4>{0, 61, 5, 2}}) {
            EXPECT_EQ(Window(data, window[0], window[1], window[2], window[3]),
                      Reference(data, window[0], window[1], window[2], window[3]));
        }
    }
    // Where every pair has the same count the rule gives the plain slice.
    Bytes distinct(width * height);
    std::iota(distinct.begin(), distinct.end(), 0);
    const RLECompressedData data = Compress8U(distinct, width, height);
    EXPECT_EQ(Window(data, 7, 3, 20, 9), kubo_test::Slice(distinct, width, 7, 3, 20, 9));
}

TEST(RLECompressedData, AllocatingWindowDecodeReturnsAWholeRasterBuffer) {
    const Bytes bytes = kubo_test::RunBytes(30 * 4, 11, {0, 5});
    const RLECompressedData data = Compress8U(bytes, 30, 4);
    unsigned char* out = data.Decode(29, 3, 1, 1);
    EXPECT_EQ(out[0], bytes.back());
    out[bytes.size() - 1] = 0;  // the buffer holds the whole raster
    delete[] out;
    // A window larger than the raster fills the buffer and stops at its end.
    EXPECT_EQ(kubo_test::Take(data.Decode(0, 0, 1000, 3), bytes.size()), bytes);
}

TEST(RLECompressedData, UncheckedWindowsReadNothingPastThePairs) {
    const Bytes bytes = {3, 3, 8, 8, 8, 6};
    const RLECompressedData data = Compress8U(bytes, 3, 2);
    // From the end of the stream on, pairs read as empty pairs of value 0; before the
    // start, the position wraps far past the end and the last pair's value repeats.
    EXPECT_EQ(Window(data, 0, 2, 4, 1), Bytes(4, 0));
    EXPECT_EQ(Window(data, -1, 0, 3, 1), Bytes(3, 6));
    EXPECT_EQ(Window(data, 2, 1, 5, 1), (Bytes{6, 0, 0, 0, 0}));
    for (const auto& window : {std::array<int, 4>{0, 5, 3, 3}, std::array<int, 4>{-7, -2, 4, 2},
                               std::array<int, 4>{2, 1, 6, 3}}) {
        EXPECT_EQ(Window(data, window[0], window[1], window[2], window[3]),
                  Reference(data, window[0], window[1], window[2], window[3]));
    }
    EXPECT_EQ(Window(data, 0, 0, -3, 2), Bytes());
    EXPECT_EQ(Window(data, 0, 0, 3, 0), Bytes());
}

TEST(RLECompressedData, ANullBufferIsNotCompressed) {
    RasterInfo info(2, 2, 1, DataType::Type8U);
    RasterContext context;
    const auto compress =
        kubo_test::Catch<kora::DataException>([&] { RLECompressedData(nullptr, info, context); });
    ASSERT_TRUE(compress);
    kubo_test::ExpectReport(*compress, "pBuffer is NULL, cannot compress NULL buffer", kSource,
                            "__cdecl kora::kubo::RLECompressedData::RLECompressedData(unsigned "
                            "char *,class kora::kubo::RasterInfo &,class "
                            "kora::kubo::RasterContext &)",
                            30);
}

}  // namespace
