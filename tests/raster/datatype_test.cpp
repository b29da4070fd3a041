#include "vrkframework/basic/kubo/raster/datatype.h"

#include <gtest/gtest.h>

#include <vector>

namespace {

using kora::kubo::DataType;

struct Predefined {
    const char* label;
    DataType type;
    DataType fields;  // the documented six fields, spelled out
    int bufferType;
};

const Predefined kPredefined[] = {
    {"1U", DataType::Type1U, {1, false, false, 1, 0, false}, 0},
    {"8U", DataType::Type8U, {8, false, false, 8, 0, false}, 2},
    {"8S", DataType::Type8S, {8, true, false, 8, 0, false}, 1},
    {"16U", DataType::Type16U, {16, false, false, 16, 0, false}, 4},
    {"16S", DataType::Type16S, {16, true, false, 16, 0, false}, 3},
    {"32U", DataType::Type32U, {32, false, false, 32, 0, false}, 6},
    {"32S", DataType::Type32S, {32, true, false, 32, 0, false}, 5},
    {"32R", DataType::Type32R, {32, true, true, 23, 8, false}, 7},
    {"64U", DataType::Type64U, {64, false, false, 64, 0, false}, 9},
    {"64S", DataType::Type64S, {64, true, false, 64, 0, false}, 8},
    {"64R", DataType::Type64R, {64, true, true, 52, 11, false}, 10},
    {"C8U", DataType::TypeC8U, {8, false, false, 8, 0, true}, 2},
    {"C8S", DataType::TypeC8S, {8, true, false, 8, 0, true}, 2},
    {"C16U", DataType::TypeC16U, {16, false, false, 16, 0, true}, 6},
    {"C16S", DataType::TypeC16S, {16, true, false, 16, 0, true}, 5},
    {"C32U", DataType::TypeC32U, {32, false, false, 32, 0, true}, 9},
    {"C32S", DataType::TypeC32S, {32, true, false, 32, 0, true}, 8},
    {"C32R", DataType::TypeC32R, {32, true, true, 23, 8, true}, 10},
    {"C64U", DataType::TypeC64U, {64, false, false, 64, 0, true}, 2},
    {"C64S", DataType::TypeC64S, {64, true, false, 64, 0, true}, 2},
    {"C64R", DataType::TypeC64R, {64, true, true, 52, 11, true}, 2},
};

// Usable in constant expressions, hence from other static initialisers.
static_assert(DataType::Type16S.bits == 16 && DataType::TypeC32R.isComplex);

TEST(DataType, PredefinedConstantsAndTheirBufferFormats) {
    for (const Predefined& row : kPredefined) {
        SCOPED_TRACE(row.label);
        const DataType& t = row.type;
        const DataType& f = row.fields;
        EXPECT_TRUE(t.bits == f.bits && t.isSigned == f.isSigned && t.isFloat == f.isFloat &&
                    t.mantissaBits == f.mantissaBits && t.exponentBits == f.exponentBits &&
                    t.isComplex == f.isComplex);
        EXPECT_EQ(static_cast<int>(kora::kubo::VRKDataType2RasterBufferType(t)), row.bufferType);
        for (const Predefined& other : kPredefined) {
            EXPECT_EQ(t == other.type, &row == &other) << other.label;
            EXPECT_EQ(t != other.type, &row != &other) << other.label;
        }
        EXPECT_NE(t, DataType());  // the default is all zero and matches nothing
    }
}

TEST(DataType, EqualityComparesEveryField) {
    const DataType base = DataType::Type32R;
    for (const DataType& changed :
         {DataType(33, true, true, 23, 8, false), DataType(32, false, true, 23, 8, false),
          DataType(32, true, false, 23, 8, false), DataType(32, true, true, 24, 8, false),
          DataType(32, true, true, 23, 9, false), DataType(32, true, true, 23, 8, true)}) {
        EXPECT_NE(base, changed);
        EXPECT_FALSE(base == changed);
    }
    EXPECT_EQ(kora::kubo::VRKDataType2RasterBufferType(DataType(32, true, true, 24, 8, false)),
              raster::BUFFER_8U);
}

TEST(PromoteType, FollowsTheWidestGroupRules) {
    const DataType s128(128, true, false, 128, 0, false);
    const DataType r128(128, true, true, 128, 0, false);
    const DataType half(16, true, true, 10, 5, false);
    struct Case {
        std::vector<DataType> types;
        DataType expected;
    };
    const Case cases[] = {
        {{}, DataType::Type8U},
        {{DataType::TypeC16S}, DataType::TypeC16S},
        // Only the widest types take part.
        {{DataType::Type8S, DataType::Type16U}, DataType::Type16U},
        {{DataType::Type64U, DataType::Type32R}, DataType::Type64U},
        {{DataType::Type16S, DataType::Type32U}, DataType::Type32U},
        // The last of a group wins, with its complex flag.
        {{DataType::TypeC32R, DataType::Type32R}, DataType::Type32R},
        {{DataType::Type32R, DataType::TypeC32R}, DataType::TypeC32R},
        {{DataType::Type16U, DataType::TypeC16U}, DataType::TypeC16U},
        // Floating with integer doubles the width; the flag comes from the floating type.
        {{DataType::Type32R, DataType::Type32S}, DataType::Type64R},
        {{DataType::Type32S, DataType::Type32U, DataType::Type32R}, DataType::Type64R},
        {{DataType::TypeC32R, DataType::Type32S}, DataType::TypeC64R},
        {{DataType::Type32R, DataType::TypeC32U}, DataType::Type64R},
        {{half, DataType::Type16U}, DataType::Type32R},
        {{DataType::Type64R, DataType::Type64U}, r128},
        // Signed with unsigned doubles the width; the flag comes from the signed type.
        {{DataType::Type8S, DataType::Type8U}, DataType::Type16S},
        {{DataType::Type32S, DataType::Type32U}, DataType::Type64S},
        {{DataType::TypeC16S, DataType::Type16U}, DataType::TypeC32S},
        {{DataType::Type16S, DataType::TypeC16U}, DataType::Type32S},
        {{DataType::Type64S, DataType::Type64U}, s128},
    };
    for (const Case& c : cases) {
        EXPECT_EQ(kora::kubo::PromoteType(c.types), c.expected) << c.types.size() << " types";
    }
}

}  // namespace
