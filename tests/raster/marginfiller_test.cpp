#include "vrkframework/basic/kubo/raster/marginfiller.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <vector>

#include "support/expectfailure.h"
#include "support/marginreference.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace {

using kora::kubo::DataType;
using kora::kubo::FillRasterMargins;
using kora::kubo::Raster;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;

// Every byte different from its neighbours, margins included, so a read from the wrong
// pixel or a margin read before or after its band was filled shows.
Raster PatternRaster(const DataType& type, unsigned int channels, unsigned int width,
                     unsigned int height, unsigned int xMargin, unsigned int yMargin) {
    Raster raster(RasterInfo(width, height, channels, type), RasterContext(xMargin, yMargin, 0, 0));
    for (std::uint64_t i = 0; i < raster.byteSize; ++i) {
        raster.data[i] = static_cast<unsigned char>((i * 167u + 13u) ^ (i >> 8));
    }
    return raster;
}

std::vector<unsigned char> Bytes(const Raster& raster) {
    return std::vector<unsigned char>(raster.data, raster.data + raster.byteSize);
}

TEST(FillRasterMargins, MatchesThePixelRulesForEveryFormatBehaviourAndBandSet) {
    // Each pixel size with a reversal of its own (1, 2, 3, 4, 6, 8, 12, 16 bytes), one read at
    // run time (24), packed 12-bit samples (pixel rules) and 1U (no whole byte: nothing written).
    const struct {
        DataType type;
        unsigned int channels;
    } formats[] = {{DataType::Type8U, 1},   {DataType::Type16S, 1},
                   {DataType::Type8U, 3},   {DataType::Type32R, 1},
                   {DataType::Type16U, 3},  {DataType::TypeC32R, 1},
                   {DataType::Type32S, 3},  {DataType::TypeC64R, 1},
                   {DataType::TypeC32U, 3}, {DataType(12, false, false, 12, 0, false), 3},
                   {DataType::Type1U, 1}};
    // Line rules: one-byte reversals of 8-pixel bodies and tails (side runs of 1, 8, 9, 17
    // pixels, top and bottom runs one longer), a margin of 0 on either axis, a margin as wide
    // as the image. Pixel rules: margins wider than the image, empty images.
    const struct {
        unsigned int width, height, xMargin, yMargin;
    } sizes[] = {{3, 2, 1, 1}, {16, 3, 8, 2}, {9, 4, 9, 1}, {20, 3, 17, 0}, {4, 6, 0, 2},
                 {2, 3, 3, 4}, {5, 2, 8, 1},  {0, 2, 2, 1}, {3, 0, 1, 2}};
    for (const auto& format : formats) {
        for (const auto& size : sizes) {
            for (int behaviour = 1; behaviour <= 3; ++behaviour) {
                for (unsigned int margins = 0; margins < 16; ++margins) {
                    Raster actual = PatternRaster(format.type, format.channels, size.width,
                                                  size.height, size.xMargin, size.yMargin);
                    Raster expected = PatternRaster(format.type, format.channels, size.width,
                                                    size.height, size.xMargin, size.yMargin);
                    FillRasterMargins(&actual, static_cast<eMarginBehaviour>(behaviour), margins);
                    kubo_test::ReferenceFillMargins(expected, behaviour, margins);
                    ASSERT_EQ(Bytes(actual), Bytes(expected))
                        << format.type.bits << " bits x " << format.channels << ", " << size.width
                        << "x" << size.height << " margins " << size.xMargin << "," << size.yMargin
                        << " behaviour " << behaviour << " bands " << margins;
                }
            }
        }
    }
}

// A 3 x 2 8U image with margins 1, filled, read back by signed coordinates.
struct Filled {
    Filled(eMarginBehaviour behaviour, unsigned int bands) {
        FillRasterMargins(&raster, behaviour, bands);
    }
    int At(int x, int y) const { return raster.data[(y + 1) * 5 + x + 1]; }
    int Before(int x, int y) const { return before[static_cast<std::size_t>((y + 1) * 5 + x + 1)]; }

    Raster raster = PatternRaster(DataType::Type8U, 1, 3, 2, 1, 1);
    std::vector<unsigned char> before = Bytes(raster);
};

TEST(FillRasterMargins, MirrorsAndWrapsTheDocumentedPixels) {
    const Filled mirror(MARGIN_MIRROR, MARGIN_ALL);
    EXPECT_EQ(mirror.At(-1, -1), mirror.At(0, 0));
    EXPECT_EQ(mirror.At(3, 0), mirror.At(2, 0));
    EXPECT_EQ(mirror.At(-1, 2), mirror.At(0, 1));
    const Filled wrap(MARGIN_WRAP, MARGIN_ALL);
    EXPECT_EQ(wrap.At(-1, 0), wrap.At(2, 0));
    EXPECT_EQ(wrap.At(0, -1), wrap.At(0, 1));
    EXPECT_EQ(wrap.At(3, 2), wrap.At(0, 0));
    // Single mirrored bands read the neighbouring margin as it stands: the left band keeps
    // line 0, the others send line or column 0 to the margin pixel at -1; the top band reads
    // the right margin.
    EXPECT_EQ(Filled(MARGIN_MIRROR, MARGIN_LEFT).At(-1, 0), mirror.Before(0, 0));
    EXPECT_EQ(Filled(MARGIN_MIRROR, MARGIN_TOP).At(0, -1), mirror.Before(-1, 0));
    EXPECT_EQ(Filled(MARGIN_MIRROR, MARGIN_TOP).At(3, -1), mirror.Before(3, 0));
    EXPECT_EQ(Filled(MARGIN_MIRROR, MARGIN_RIGHT).At(3, 0), mirror.Before(2, -1));
    EXPECT_EQ(Filled(MARGIN_MIRROR, MARGIN_BOTTOM).At(0, 2), mirror.Before(-1, 1));
}

TEST(FillRasterMargins, IgnoresUnknownBitsAndNullRasters) {
    Raster raster = PatternRaster(DataType::Type16U, 1, 5, 4, 2, 2);
    const std::vector<unsigned char> before = Bytes(raster);
    FillRasterMargins(&raster, MARGIN_ZERO, 0xFFFFFFF0u);
    EXPECT_EQ(Bytes(raster), before);
    FillRasterMargins(nullptr, MARGIN_MIRROR, MARGIN_ALL);
    Raster all = PatternRaster(DataType::Type16U, 1, 5, 4, 2, 2);
    FillRasterMargins(&raster, MARGIN_WRAP, 0xFFFFFFFFu);
    FillRasterMargins(&all, MARGIN_WRAP, MARGIN_ALL);
    EXPECT_EQ(Bytes(raster), Bytes(all));
}

TEST(FillRasterMargins, RejectsOtherBehavioursBeforeWritingAnything) {
    Raster raster = PatternRaster(DataType::Type8U, 1, 4, 4, 1, 1);
    const std::vector<unsigned char> before = Bytes(raster);
    for (const std::uint32_t value : {0u, 4u, 0xFFFFFFFFu}) {
        Raster* target = value == 4u ? nullptr : &raster;
        const auto failure = kubo_test::Catch<kora::Exception>(
            [&] { FillRasterMargins(target, static_cast<eMarginBehaviour>(value), MARGIN_ALL); });
        ASSERT_TRUE(failure.has_value()) << value;
        kubo_test::ExpectReport(*failure, "Invalid margin behavior requested.",
                                "vrkframework/basic/kubo/raster/marginfiller",
                                "void __cdecl kora::kubo::FillRasterMargins(class "
                                "kora::kubo::Raster *const ,enum eMarginBehaviour,unsigned int)",
                                40);
    }
    EXPECT_EQ(Bytes(raster), before);
}

}  // namespace
