#include "vrkframework/basic/kubo/raster/marginfiller.h"

#include <gtest/gtest.h>

#include <cstring>
#include <ostream>
#include <string>
#include <vector>

#include "support/expectfailure.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace {

using kora::kubo::DataType;
using kora::kubo::FillRasterMargins;
using kora::kubo::Raster;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;

// The rules written out pixel by pixel, in band order left, top, right, bottom, left and
// top with x outer, right and bottom with y outer, byte by byte.
void ReferenceFill(Raster& r, int behaviour, unsigned int margins) {
    const long w = r.width, h = r.height, mx = r.xMargin, my = r.yMargin;
    const long bitsPerPixel = r.channels * r.dataType.bits * (r.dataType.isComplex ? 2 : 1);
    const long pixelBytes = r.channels * (r.dataType.bits / 8) * (r.dataType.isComplex ? 2 : 1);
    auto at = [&](long x, long y) {
        return r.data + ((my + y) * static_cast<long>(r.lineStride) + mx + x) * bitsPerPixel / 8;
    };
    auto copy = [&](long x, long y, long sx, long sy) {
        for (long b = 0; b < pixelBytes; ++b) {
            at(x, y)[b] = behaviour == 1 ? 0 : at(sx, sy)[b];
        }
    };
    const bool mirror = behaviour == 2;
    if (margins & 2) {
        for (long x = -mx; x < 0; ++x) {
            for (long y = -my; y < h + my; ++y) {
                if (mirror) {
                    copy(x, y, -x - 1, (y >= 0 || my == 0) ? y : -y - 1);
                } else {
                    copy(x, y, w + x, y < 0 ? y + h : y);
                }
            }
        }
    }
    if (margins & 4) {
        for (long x = -mx; x < w + mx; ++x) {
            for (long y = -my; y < 0; ++y) {
                if (mirror) {
                    copy(x, y, (x > 0 || mx == 0) ? x : -x - 1, -y - 1);
                } else {
                    copy(x, y, x < 0 ? x + w : x, h + y);
                }
            }
        }
    }
    if (margins & 1) {
        for (long y = -my; y < h + my; ++y) {
            for (long x = w; x < w + mx; ++x) {
                if (mirror) {
                    copy(x, y, 2 * w - x - 1, (y > 0 || my == 0) ? y : -y - 1);
                } else {
                    copy(x, y, x - w, y < 0 ? y + h : y);
                }
            }
        }
    }
    if (margins & 8) {
        for (long y = h; y < h + my; ++y) {
            for (long x = -mx; x < w + mx; ++x) {
                if (mirror) {
                    copy(x, y, (x > 0 || mx == 0) ? x : -x - 1, 2 * h - y - 1);
                } else {
                    copy(x, y, x < 0 ? x + w : x, y - h);
                }
            }
        }
    }
}

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

struct Format {
    DataType type;
    unsigned int channels;
    const char* name;
};
// Names the parameter in test reports (the default would print its padding bytes).
void PrintTo(const Format& format, std::ostream* out) { *out << format.name; }

class FillRasterMarginsFormats : public ::testing::TestWithParam<Format> {};

TEST_P(FillRasterMarginsFormats, MatchesThePixelRulesForEveryBehaviourAndBandSet) {
    struct Size {
        unsigned int width, height, xMargin, yMargin;
    };
    // Byte reversals hit their 8-pixel body and tails (margins 1, 2, 7, 8, 9, 17); margins
    // equal to and wider than the image, empty margins and an empty image are covered.
    const Size sizes[] = {{3, 2, 1, 1}, {7, 5, 2, 3},   {12, 2, 7, 1}, {16, 3, 8, 2},
                          {9, 4, 9, 1}, {20, 3, 17, 0}, {4, 6, 0, 2},  {1, 1, 1, 1},
                          {2, 3, 3, 4}, {5, 2, 8, 1},   {0, 2, 2, 1},  {3, 0, 1, 2}};
    const Format format = GetParam();
    for (const Size& size : sizes) {
        for (int behaviour = 1; behaviour <= 3; ++behaviour) {
            for (unsigned int margins = 0; margins < 16; ++margins) {
                Raster actual = PatternRaster(format.type, format.channels, size.width, size.height,
                                              size.xMargin, size.yMargin);
                Raster expected = PatternRaster(format.type, format.channels, size.width,
                                                size.height, size.xMargin, size.yMargin);
                FillRasterMargins(&actual, static_cast<eMarginBehaviour>(behaviour), margins);
                ReferenceFill(expected, behaviour, margins);
                ASSERT_EQ(Bytes(actual), Bytes(expected))
                    << size.width << "x" << size.height << " margins " << size.xMargin << ","
                    << size.yMargin << " behaviour " << behaviour << " bands " << margins;
            }
        }
    }
}

// Pixel sizes 1, 2, 3, 4, 6, 8, 12, 16, 24 bytes, 12-bit packed samples and 1U.
INSTANTIATE_TEST_SUITE_P(
    PixelSizes, FillRasterMarginsFormats,
    ::testing::Values(Format{DataType::Type8U, 1, "U8"}, Format{DataType::Type16S, 1, "S16"},
                      Format{DataType::Type8U, 3, "U8x3"}, Format{DataType::Type32R, 1, "R32"},
                      Format{DataType::Type16U, 3, "U16x3"}, Format{DataType::TypeC32R, 1, "C32R"},
                      Format{DataType::Type32S, 3, "S32x3"}, Format{DataType::TypeC64R, 1, "C64R"},
                      Format{DataType::TypeC32U, 3, "C32Ux3"},
                      Format{DataType(12, false, false, 12, 0, false), 1, "Packed12"},
                      Format{DataType(12, false, false, 12, 0, false), 3, "Packed12x3"},
                      Format{DataType::Type1U, 1, "U1"}),
    [](const ::testing::TestParamInfo<Format>& param) { return std::string(param.param.name); });

// A 3 x 2 8U image, margins 1, read back by signed coordinates.
class SmallRaster {
public:
    SmallRaster()
        : m_raster(PatternRaster(DataType::Type8U, 1, 3, 2, 1, 1)), m_before(Bytes(m_raster)) {}
    unsigned char At(int x, int y) const { return m_raster.data[(y + 1) * 5 + x + 1]; }
    unsigned char Before(int x, int y) const {
        return m_before[static_cast<std::size_t>((y + 1) * 5 + x + 1)];
    }
    Raster& raster() { return m_raster; }

private:
    Raster m_raster;
    std::vector<unsigned char> m_before;
};

TEST(FillRasterMargins, MirrorAndWrapOfAllBandsGiveThePlainReflectionAndRepetition) {
    SmallRaster mirror;
    FillRasterMargins(&mirror.raster(), MARGIN_MIRROR, MARGIN_ALL);
    EXPECT_EQ(mirror.At(-1, -1), mirror.At(0, 0));
    EXPECT_EQ(mirror.At(3, 0), mirror.At(2, 0));
    EXPECT_EQ(mirror.At(-1, 2), mirror.At(0, 1));
    EXPECT_EQ(mirror.At(3, -1), mirror.At(2, 0));
    SmallRaster wrap;
    FillRasterMargins(&wrap.raster(), MARGIN_WRAP, MARGIN_ALL);
    EXPECT_EQ(wrap.At(-1, 0), wrap.At(2, 0));
    EXPECT_EQ(wrap.At(0, -1), wrap.At(0, 1));
    EXPECT_EQ(wrap.At(3, 2), wrap.At(0, 0));
    EXPECT_EQ(wrap.At(-1, -1), wrap.At(2, 1));
}

TEST(FillRasterMargins, SingleMirrorBandsReadTheNeighbouringMarginAsItStands) {
    SmallRaster left, top, right, bottom;
    FillRasterMargins(&left.raster(), MARGIN_MIRROR, MARGIN_LEFT);
    EXPECT_EQ(left.At(-1, 0), left.Before(0, 0));  // the left band keeps line 0
    EXPECT_EQ(left.At(-1, -1), left.Before(0, 0));
    EXPECT_EQ(left.At(-1, 2), left.Before(0, 2));  // bottom margin as it was
    FillRasterMargins(&top.raster(), MARGIN_MIRROR, MARGIN_TOP);
    EXPECT_EQ(top.At(0, -1), top.Before(-1, 0));
    EXPECT_EQ(top.At(3, -1), top.Before(3, 0));
    FillRasterMargins(&right.raster(), MARGIN_MIRROR, MARGIN_RIGHT);
    EXPECT_EQ(right.At(3, 0), right.Before(2, -1));
    EXPECT_EQ(right.At(3, 1), right.Before(2, 1));
    FillRasterMargins(&bottom.raster(), MARGIN_MIRROR, MARGIN_BOTTOM);
    EXPECT_EQ(bottom.At(0, 2), bottom.Before(-1, 1));
    EXPECT_EQ(bottom.At(-1, 2), bottom.Before(0, 1));
}

TEST(FillRasterMargins, ZeroClearsEveryByteOfTheRequestedBandsOnly) {
    Raster raster = PatternRaster(DataType::TypeC16S, 2, 4, 3, 2, 1);
    const std::vector<unsigned char> before = Bytes(raster);
    FillRasterMargins(&raster, MARGIN_ZERO, MARGIN_TOP | MARGIN_RIGHT);
    const std::size_t pixel = 8, line = 8 * pixel;
    for (std::size_t i = 0; i < raster.byteSize; ++i) {
        const std::size_t row = i / line, column = i % line / pixel;
        const bool cleared = row == 0 || column >= 6;
        EXPECT_EQ(raster.data[i], cleared ? 0 : before[i]) << i;
    }
}

TEST(FillRasterMargins, IgnoresUnknownBitsEmptySetsAndNullRasters) {
    Raster raster = PatternRaster(DataType::Type16U, 1, 5, 4, 2, 2);
    const std::vector<unsigned char> before = Bytes(raster);
    FillRasterMargins(&raster, MARGIN_ZERO, 0u);
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
