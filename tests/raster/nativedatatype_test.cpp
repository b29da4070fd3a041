#include "vrkframework/basic/kubo/raster/nativedatatype.h"

#include <gtest/gtest.h>

#include "vrkframework/basic/kubo/raster/rasterinfo.h"

namespace {

using namespace kora::kubo;

TEST(NativeDataType, CodesFollowWidthThenFlags) {
    const std::pair<DataType, int> table[] = {
        {DataType::Type1U, 15},
        {DataType::Type8U, 0},
        {DataType::Type8S, 1},
        {DataType::Type16U, 2},
        {DataType::Type16S, 3},
        {DataType::Type32U, 4},
        {DataType::Type32S, 5},
        {DataType::Type32R, 6},
        {DataType::Type64U, 7},
        {DataType::Type64S, 8},
        {DataType::Type64R, 9},
        {DataType::TypeC8U, 0},
        {DataType::TypeC8S, 1},
        {DataType::TypeC16U, 10},
        {DataType::TypeC16S, 11},
        {DataType::TypeC32U, 15},
        {DataType::TypeC32S, 12},
        {DataType::TypeC32R, 13},
        {DataType::TypeC64U, 15},
        {DataType::TypeC64S, 15},
        {DataType::TypeC64R, 14},
        // 8 and 16 bits ignore the floating flag, 8 bits the complex flag too.
        {DataType(8, true, true, 3, 4, true), 1},
        {DataType(16, false, true, 10, 5, false), 2},
        {DataType(16, true, true, 10, 5, true), 11},
        // Mantissa and exponent never matter; unsigned floating types have no code.
        {DataType(32, true, true, 24, 7, false), 6},
        {DataType(32, false, true, 23, 8, false), 15},
        {DataType(64, false, true, 52, 11, false), 15},
        {DataType(32, false, true, 23, 8, true), 15},
        {DataType(12, false, false, 12, 0, false), 15},
        {DataType(), 15},
    };
    for (const auto& [type, code] : table) {
        const NativeDataType native(type);
        EXPECT_EQ(native.code, code) << type.bits << (type.isComplex ? " complex" : "");
        EXPECT_EQ(static_cast<const DataType&>(native), type);
        EXPECT_EQ(GetDataTypeCode(RasterInfo(4, 4, 3, type)), code);
    }
}

}  // namespace
