#include "vrkframework/basic/kubo/raster/nativedatatype.h"

#include <gtest/gtest.h>

#include "vrkframework/basic/kubo/raster/rasterinfo.h"

namespace {

using namespace kora::kubo;

TEST(NativeDataType, CodesOfThePredefinedTypes) {
    const std::pair<DataType, NativeDataTypeCode> table[] = {
        {DataType::Type1U, NDT_UNKNOWN},   {DataType::Type8U, NDT_8U},
        {DataType::Type8S, NDT_8S},        {DataType::Type16U, NDT_16U},
        {DataType::Type16S, NDT_16S},      {DataType::Type32U, NDT_32U},
        {DataType::Type32S, NDT_32S},      {DataType::Type32R, NDT_32R},
        {DataType::Type64U, NDT_64U},      {DataType::Type64S, NDT_64S},
        {DataType::Type64R, NDT_64R},      {DataType::TypeC8U, NDT_8U},
        {DataType::TypeC8S, NDT_8S},       {DataType::TypeC16U, NDT_C16U},
        {DataType::TypeC16S, NDT_C16S},    {DataType::TypeC32U, NDT_UNKNOWN},
        {DataType::TypeC32S, NDT_C32S},    {DataType::TypeC32R, NDT_C32R},
        {DataType::TypeC64U, NDT_UNKNOWN}, {DataType::TypeC64S, NDT_UNKNOWN},
        {DataType::TypeC64R, NDT_C64R},
    };
    for (const auto& [type, code] : table) {
        const NativeDataType native(type);
        EXPECT_EQ(native.code, code) << type.bits << (type.isComplex ? " complex" : "");
        EXPECT_EQ(static_cast<const DataType&>(native), type);
    }
}

TEST(NativeDataType, EnumeratorValuesAreFixed) {
    EXPECT_EQ(NDT_8U, 0);
    EXPECT_EQ(NDT_64R, 9);
    EXPECT_EQ(NDT_C16U, 10);
    EXPECT_EQ(NDT_C64R, 14);
    EXPECT_EQ(NDT_UNKNOWN, 15);
}

TEST(NativeDataType, WidthDecidesAndSomeFlagsAreNotLookedAt) {
    // 8 and 16 bits ignore the floating flag, 8 bits the complex flag too.
    EXPECT_EQ(NativeDataType(DataType(8, true, true, 3, 4, true)).code, NDT_8S);
    EXPECT_EQ(NativeDataType(DataType(16, false, true, 10, 5, false)).code, NDT_16U);
    EXPECT_EQ(NativeDataType(DataType(16, true, true, 10, 5, true)).code, NDT_C16S);
    // Mantissa and exponent never matter.
    EXPECT_EQ(NativeDataType(DataType(32, true, true, 24, 7, false)).code, NDT_32R);
    EXPECT_EQ(NativeDataType(DataType(64, false, false, 1, 1, false)).code, NDT_64U);
    // Unsigned floating types have no code.
    EXPECT_EQ(NativeDataType(DataType(32, false, true, 23, 8, false)).code, NDT_UNKNOWN);
    EXPECT_EQ(NativeDataType(DataType(64, false, true, 52, 11, false)).code, NDT_UNKNOWN);
    EXPECT_EQ(NativeDataType(DataType(32, false, true, 23, 8, true)).code, NDT_UNKNOWN);
    EXPECT_EQ(NativeDataType(DataType(64, false, true, 52, 11, true)).code, NDT_UNKNOWN);
    // Other widths stay unknown.
    EXPECT_EQ(NativeDataType(DataType(12, false, false, 12, 0, false)).code, NDT_UNKNOWN);
    EXPECT_EQ(NativeDataType(DataType(24, true, false, 24, 0, false)).code, NDT_UNKNOWN);
    EXPECT_EQ(NativeDataType(DataType()).code, NDT_UNKNOWN);
}

TEST(GetDataTypeCode, ReadsTheRastersType) {
    EXPECT_EQ(GetDataTypeCode(RasterInfo(4, 4, 1, DataType::TypeC8U)), NDT_8U);
    EXPECT_EQ(GetDataTypeCode(RasterInfo(4, 4, 1, DataType::TypeC32U)), NDT_UNKNOWN);
    EXPECT_EQ(GetDataTypeCode(RasterInfo(4, 4, 1, DataType::Type1U)), NDT_UNKNOWN);
    EXPECT_EQ(GetDataTypeCode(RasterInfo(4, 4, 3, DataType::Type16S)), NDT_16S);
}

}  // namespace
