// Masks, their bit layout, and masks of explicit coordinates. A Mask packs flags with the
// packing loop of the kernel variant in use.
#include "vrkframework/basic/kubo/masks/mask.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <functional>
#include <memory>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

#include "support/expectfailure.h"
#include "support/kernelvariants.h"
#include "vrkframework/basic/kubo/masks/coordinatemaskbuilder.h"
#include "vrkframework/basic/kubo/masks/maskdecisionbuilder.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace {

using namespace kora::kubo;
using Bytes = std::vector<unsigned char>;
using Pairs = std::vector<std::pair<int, int>>;

Bytes BytesOf(const Mask& mask) {
    return Bytes(mask.GetBits(), mask.GetBits() + mask.GetByteCount());
}

// A heap copy for a mask to take over.
unsigned char* Handed(const Bytes& bytes) {
    auto* copy = new unsigned char[bytes.size()];
    std::copy(bytes.begin(), bytes.end(), copy);
    return copy;
}

TEST(Mask, DescribesOneBitPerPixelOfTheFullExtentAllBackground) {
    const Mask mask(RasterInfo(3, 1, 4, DataType::TypeC32R), RasterContext(2, 1, 7, 9));
    EXPECT_EQ(std::make_tuple(mask.width, mask.height, mask.channels, mask.xMargin, mask.yMargin,
                              mask.xOffset, mask.yOffset),
              std::make_tuple(3u, 1u, 1u, 2u, 1u, 7u, 9u));
    EXPECT_EQ(mask.dataType, DataType::Type1U);
    EXPECT_EQ(std::make_tuple(mask.GetFullWidth(), mask.GetFullHeight(), mask.GetBitCount()),
              std::make_tuple(7, 3, 21u));
    EXPECT_EQ(BytesOf(mask), Bytes(3, 0));
}

// The sizes of a mask are 32-bit fields: a full extent past INT_MAX a side or past
// 2^32 - 1 bits cannot be a mask. The mask and both builders refuse it before any work,
// with the full extent in the message; the raster here only describes, it holds nothing.
TEST(Mask, RefusesExtentsPast32BitSizes) {
    Raster gigapixel;
    gigapixel.width = gigapixel.height = 66000;
    gigapixel.xMargin = gigapixel.yMargin = 1;
    gigapixel.channels = 1;
    gigapixel.dataType = DataType::Type8U;
    const std::string message =
        "A mask of 66002 x 66002 pixels (margins included) exceeds the 4294967295 bits a mask "
        "holds";
    const struct {
        std::function<void()> build;
        const char* source;
        const char* function;
    } builders[] = {
        {[&] { Mask(gigapixel, gigapixel); }, "vrkframework/basic/kubo/masks/mask",
         "__cdecl kora::kubo::Mask::Mask(const class kora::kubo::RasterInfo &,const class "
         "kora::kubo::RasterContext &)"},
        {[&] { delete CoordinateMaskBuilder().BuildMask(gigapixel); },
         "vrkframework/basic/kubo/masks/coordinatemaskbuilder",
         "class kora::kubo::Mask *__cdecl kora::kubo::CoordinateMaskBuilder::BuildMask(const "
         "class kora::kubo::Raster &) const"},
        {[&] { delete MaskDecisionBuilder(0.0, BkgdAnyChan).BuildMask(gigapixel); },
         "vrkframework/basic/kubo/masks/maskdecisionbuilder",
         "class kora::kubo::Mask *__cdecl kora::kubo::MaskDecisionBuilder::BuildMask(const class "
         "kora::kubo::Raster &) const"},
    };
    for (const auto& b : builders) {
        const auto failure = kubo_test::Catch<kora::OutOfBoundsException>(b.build);
        ASSERT_TRUE(failure.has_value()) << b.source;
        kubo_test::ExpectReport(*failure, message.c_str(), b.source, b.function, 0);
        EXPECT_EQ(failure->GetValues(), (std::vector<int>{66002, 66002}));
    }
    // One side past INT_MAX, though the bit count would fit.
    const auto wide = kubo_test::Catch<kora::OutOfBoundsException>(
        [] { Mask(RasterInfo(2147483647u, 1, 1, DataType::Type8U), RasterContext(1, 0, 0, 0)); });
    ASSERT_TRUE(wide.has_value());
    EXPECT_EQ(wide->GetMessage(),
              "A mask of 2147483649 x 1 pixels (margins included) exceeds the 4294967295 bits a "
              "mask holds");
    EXPECT_EQ(wide->GetValues(), (std::vector<int>{INT_MAX, 1}));
}

// Bit r x fullWidth + c is pixel (r, c), most significant bit first, rows not padded, any
// non-zero flag valid, the bits past the last pixel 0. A buffer handed over is released
// (the sanitizer build sees a double or missing release).
TEST(Mask, PacksFlagsOrCopiesPackedBytes) {
    struct Case {
        RasterInfo info;
        RasterContext context;
        Bytes flags;
        Bytes bytes;
    };
    const Case cases[] = {
        {RasterInfo(3, 1, 1, DataType::Type8U), RasterContext(), {1, 0, 1}, {0xa0}},
        // A 5 x 3 extent: the second row starts at bit 5 of byte 0.
        {RasterInfo(3, 1, 1, DataType::Type16U),
         RasterContext(1, 1, 0, 0),
         {61, 0, 0, 1, 0, 0, 121, 0, 0, 1, 0, 0, 181, 0, 0xff},
         {0x92, 0x4a}},
        {RasterInfo(0, 5, 1, DataType::Type8U), RasterContext(), {1}, {}},
    };
    for (const Case& c : cases) {
        Bytes flags = c.flags;
        const Mask mask(c.info, c.context, flags.data(), false, false);
        EXPECT_EQ(BytesOf(mask), c.bytes);
        for (unsigned int i = 0; i < mask.GetBitCount() + 9; ++i) {
            EXPECT_EQ(mask.GetBit(i), i < mask.GetBitCount() && c.flags[i] != 0) << i;
        }
        EXPECT_EQ(BytesOf(Mask(c.info, c.context, Handed(c.flags), true, false)), c.bytes);
        Bytes packed = c.bytes;
        packed.push_back(0x77);  // only the byte count is copied
        EXPECT_EQ(BytesOf(Mask(c.info, c.context, Handed(packed), true, true)), c.bytes);
        EXPECT_EQ(BytesOf(Mask(c.info, c.context, nullptr, true, false)), Bytes(c.bytes.size()));
    }
}

// Mask.PacksFlagsOfEveryLength/<variant>: vector bodies and tails of the packing loop,
// never past the last byte.
void CheckPackingOfEveryLength() {
    for (const unsigned int count : {1u, 7u, 8u, 9u, 17u, 1003u}) {
        Bytes flags(count + 1, 1);
        Bytes expected((count + 7) / 8);
        for (unsigned int i = 0; i < count; ++i) {
            const unsigned char values[] = {0, 1, 0x80, 0xff, 0, 2, 0, 0, 7};
            flags[i] = values[(i * 5) % 9];
            expected[i / 8] |= static_cast<unsigned char>(flags[i] != 0 ? 128u >> (i % 8) : 0u);
        }
        const Mask mask(RasterInfo(count, 1, 1, DataType::Type8U), RasterContext(), flags.data(),
                        false, false);
        EXPECT_EQ(BytesOf(mask), expected) << count;
    }
}
const bool kPackingRegistered =
    (kubo_test::RegisterPerVariant("Mask", "PacksFlagsOfEveryLength", &CheckPackingOfEveryLength,
                                   __FILE__, __LINE__),
     true);

CoordinateMaskBuilder BuilderOf(const Pairs& coordinates) {
    CoordinateMaskBuilder builder;
    for (const auto& [row, column] : coordinates) {
        builder.AddValidCoordinate(row, column);
    }
    return builder;
}

TEST(CoordinateMaskBuilder, KeepsCoordinatesSortedByRowThenColumnWithoutDuplicates) {
    EXPECT_EQ(BuilderOf({{5, 1}, {2, 9}, {5, 0}, {2, 9}, {-1, 3}, {5, 1}}).GetCoordinates(),
              (Pairs{{-1, 3}, {2, 9}, {5, 0}, {5, 1}}));
}

// Coordinates are in the frame of the whole image, offsets compared as signed 32-bit values;
// margins shift the bits and are never set themselves.
TEST(CoordinateMaskBuilder, SetsTheCoordinatesInsideTheImageProper) {
    struct Case {
        RasterInfo info;
        RasterContext context;
        Pairs coordinates;
        Bytes bytes;
    };
    const Case cases[] = {
        {RasterInfo(5, 4, 3, DataType::Type16S), RasterContext(1, 1, 0, 0), {}, Bytes(6, 0)},
        {RasterInfo(3, 1, 1, DataType::Type8U), RasterContext(), {{0, 2}, {0, 0}}, {0xa0}},
        // 4 x 3 at column 100, row 50, margins 2 and 1: bits 10, 20 and 29 of 8 x 5.
        {RasterInfo(4, 3, 1, DataType::Type8U),
         RasterContext(2, 1, 100, 50),
         {{50, 100}, {52, 103}, {49, 100}, {50, 99}, {53, 100}, {50, 104}, {51, 102}},
         {0, 0x20, 0x08, 0x04, 0}},
        // Column offset -1; the last rows end at the end of the int range.
        {RasterInfo(2, 5, 1, DataType::Type8U),
         RasterContext(0, 0, 4294967295u, static_cast<unsigned int>(INT_MAX - 1)),
         {{INT_MAX - 1, -1}, {INT_MAX, 0}, {INT_MAX, 1}},
         {0x90, 0}},
    };
    for (const Case& c : cases) {
        const Raster raster(c.info, c.context);
        EXPECT_EQ(BytesOf(*std::unique_ptr<Mask>(BuilderOf(c.coordinates).BuildMask(raster))),
                  c.bytes);
    }
}

}  // namespace
