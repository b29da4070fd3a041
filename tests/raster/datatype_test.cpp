#include "vrkframework/basic/kubo/raster/datatype.h"

#include <gtest/gtest.h>

#include <vector>

namespace {

using kora::kubo::DataType;
using kora::kubo::PromoteType;
using kora::kubo::VRKDataType2RasterBufferType;

struct Expected {
    const char* label;
    DataType type;
    unsigned int bits;
    bool isSigned;
    bool isFloat;
    unsigned int mantissa;
    unsigned int exponent;
    bool isComplex;
    int bufferType;
};

const Expected kTable[] = {
    {"1U", DataType::Type1U, 1, false, false, 1, 0, false, 0},
    {"8U", DataType::Type8U, 8, false, false, 8, 0, false, 2},
    {"8S", DataType::Type8S, 8, true, false, 8, 0, false, 1},
    {"16U", DataType::Type16U, 16, false, false, 16, 0, false, 4},
    {"16S", DataType::Type16S, 16, true, false, 16, 0, false, 3},
    {"32U", DataType::Type32U, 32, false, false, 32, 0, false, 6},
    {"32S", DataType::Type32S, 32, true, false, 32, 0, false, 5},
    {"32R", DataType::Type32R, 32, true, true, 23, 8, false, 7},
    {"64U", DataType::Type64U, 64, false, false, 64, 0, false, 9},
    {"64S", DataType::Type64S, 64, true, false, 64, 0, false, 8},
    {"64R", DataType::Type64R, 64, true, true, 52, 11, false, 10},
    {"C8U", DataType::TypeC8U, 8, false, false, 8, 0, true, 2},
    {"C8S", DataType::TypeC8S, 8, true, false, 8, 0, true, 2},
    {"C16U", DataType::TypeC16U, 16, false, false, 16, 0, true, 6},
    {"C16S", DataType::TypeC16S, 16, true, false, 16, 0, true, 5},
    {"C32U", DataType::TypeC32U, 32, false, false, 32, 0, true, 9},
    {"C32S", DataType::TypeC32S, 32, true, false, 32, 0, true, 8},
    {"C32R", DataType::TypeC32R, 32, true, true, 23, 8, true, 10},
    {"C64U", DataType::TypeC64U, 64, false, false, 64, 0, true, 2},
    {"C64S", DataType::TypeC64S, 64, true, false, 64, 0, true, 2},
    {"C64R", DataType::TypeC64R, 64, true, true, 52, 11, true, 2},
};

// The constants are usable in constant expressions, hence in other static initialisers.
static_assert(DataType::Type16S.bits == 16 && DataType::TypeC32R.isComplex);
static_assert(DataType::Type8U != DataType::TypeC8U);

TEST(DataType, PredefinedConstantsHaveTheirSixFields) {
    for (const Expected& row : kTable) {
        SCOPED_TRACE(row.label);
        EXPECT_EQ(row.type.bits, row.bits);
        EXPECT_EQ(row.type.isSigned, row.isSigned);
        EXPECT_EQ(row.type.isFloat, row.isFloat);
        EXPECT_EQ(row.type.mantissaBits, row.mantissa);
        EXPECT_EQ(row.type.exponentBits, row.exponent);
        EXPECT_EQ(row.type.isComplex, row.isComplex);
    }
}

TEST(DataType, PredefinedConstantsArePairwiseDistinct) {
    for (const Expected& a : kTable) {
        for (const Expected& b : kTable) {
            EXPECT_EQ(a.type == b.type, &a == &b) << a.label << " vs " << b.label;
            EXPECT_EQ(a.type != b.type, &a != &b) << a.label << " vs " << b.label;
        }
    }
}

TEST(DataType, EqualityComparesEveryField) {
    const DataType base = DataType::Type32R;
    EXPECT_EQ(base, DataType(32, true, true, 23, 8, false));
    EXPECT_NE(base, DataType(33, true, true, 23, 8, false));
    EXPECT_NE(base, DataType(32, false, true, 23, 8, false));
    EXPECT_NE(base, DataType(32, true, false, 23, 8, false));
    EXPECT_NE(base, DataType(32, true, true, 24, 8, false));
    EXPECT_NE(base, DataType(32, true, true, 23, 9, false));
    EXPECT_NE(base, DataType(32, true, true, 23, 8, true));
}

TEST(DataType, DefaultIsAllZeroAndEqualsNoPredefinedType) {
    const DataType none;
    EXPECT_EQ(none, DataType(0, false, false, 0, 0, false));
    for (const Expected& row : kTable) {
        EXPECT_NE(none, row.type) << row.label;
    }
}

TEST(VRKDataType2RasterBufferType, MapsEveryPredefinedType) {
    for (const Expected& row : kTable) {
        EXPECT_EQ(static_cast<int>(VRKDataType2RasterBufferType(row.type)), row.bufferType)
            << row.label;
    }
}

TEST(VRKDataType2RasterBufferType, UnknownTypesGiveUnsigned8Bit) {
    EXPECT_EQ(VRKDataType2RasterBufferType(DataType()), raster::BUFFER_8U);
    EXPECT_EQ(VRKDataType2RasterBufferType(DataType(32, true, true, 24, 8, false)),
              raster::BUFFER_8U);
    EXPECT_EQ(VRKDataType2RasterBufferType(DataType(12, false, false, 12, 0, false)),
              raster::BUFFER_8U);
}

DataType Promote(std::vector<DataType> types) { return PromoteType(types); }

TEST(PromoteType, EmptyListIs8UAndSingleTypeIsItself) {
    EXPECT_EQ(Promote({}), DataType::Type8U);
    for (const Expected& row : kTable) {
        EXPECT_EQ(Promote({row.type}), row.type) << row.label;
    }
}

TEST(PromoteType, OnlyTheWidestTypesTakePart) {
    EXPECT_EQ(Promote({DataType::Type8S, DataType::Type16U}), DataType::Type16U);
    EXPECT_EQ(Promote({DataType::Type64U, DataType::Type32R}), DataType::Type64U);
    EXPECT_EQ(Promote({DataType::Type16S, DataType::Type32U}), DataType::Type32U);
    EXPECT_EQ(Promote({DataType::Type32R, DataType::Type8U, DataType::Type16S}), DataType::Type32R);
}

TEST(PromoteType, LastTypeOfAGroupWinsWithItsComplexFlag) {
    EXPECT_EQ(Promote({DataType::TypeC32R, DataType::Type32R}), DataType::Type32R);
    EXPECT_EQ(Promote({DataType::Type32R, DataType::TypeC32R}), DataType::TypeC32R);
    EXPECT_EQ(Promote({DataType::TypeC16S, DataType::Type16S}), DataType::Type16S);
    EXPECT_EQ(Promote({DataType::Type8U, DataType::TypeC8U}), DataType::TypeC8U);
}

TEST(PromoteType, FloatMixedWithIntegerDoublesTheWidth) {
    EXPECT_EQ(Promote({DataType::Type32R, DataType::Type32S}), DataType::Type64R);
    EXPECT_EQ(Promote({DataType::Type32U, DataType::Type32R}), DataType::Type64R);
    EXPECT_EQ(Promote({DataType::Type32S, DataType::Type32U, DataType::Type32R}),
              DataType::Type64R);
    // The complex flag comes from the remembered floating type only.
    EXPECT_EQ(Promote({DataType::TypeC32R, DataType::Type32S}), DataType::TypeC64R);
    EXPECT_EQ(Promote({DataType::Type32R, DataType::TypeC32S}), DataType::Type64R);
    // A 16-bit float mixed with a 16-bit integer takes the 32-bit float layout.
    EXPECT_EQ(Promote({DataType(16, true, true, 10, 5, false), DataType::Type16U}),
              DataType::Type32R);
}

TEST(PromoteType, SixtyFourBitMixesGiveUnmatched128BitTypes) {
    EXPECT_EQ(Promote({DataType::Type64R, DataType::Type64S}),
              DataType(128, true, true, 128, 0, false));
    EXPECT_EQ(Promote({DataType::Type64R, DataType::Type64U}),
              DataType(128, true, true, 128, 0, false));
    EXPECT_EQ(Promote({DataType::Type64S, DataType::Type64U}),
              DataType(128, true, false, 128, 0, false));
}

TEST(PromoteType, SignedMixedWithUnsignedDoublesTheWidth) {
    EXPECT_EQ(Promote({DataType::Type8S, DataType::Type8U}), DataType::Type16S);
    EXPECT_EQ(Promote({DataType::Type16U, DataType::Type16S}), DataType::Type32S);
    EXPECT_EQ(Promote({DataType::Type32S, DataType::Type32U}), DataType::Type64S);
    EXPECT_EQ(Promote({DataType::TypeC16S, DataType::Type16U}), DataType::TypeC32S);
    EXPECT_EQ(Promote({DataType::Type16S, DataType::TypeC16U}), DataType::Type32S);
}

TEST(PromoteType, UnsignedOnlyKeepsTheLastUnsigned) {
    EXPECT_EQ(Promote({DataType::Type16U, DataType::TypeC16U}), DataType::TypeC16U);
    EXPECT_EQ(Promote({DataType::Type8S, DataType::Type8S}), DataType::Type8S);
}

}  // namespace
