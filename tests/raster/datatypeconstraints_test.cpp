#include "vrkframework/basic/kubo/raster/datatypeconstraints.h"

#include <gtest/gtest.h>

#include "vrkframework/basic/kubo/raster/datatype.h"

namespace {

using kora::kubo::DataType;
using kora::kubo::DataTypeConstraints;
using kora::kubo::IDataTypeConstraints;

void ExpectRange(const DataTypeConstraints& range, double min, double max, double epsilon) {
    EXPECT_EQ(range.GetMin(), min);
    EXPECT_EQ(range.GetMax(), max);
    EXPECT_EQ(range.GetEpsilon(), epsilon);
}

TEST(DataTypeConstraints, DefaultAndGivenValues) {
    ExpectRange(DataTypeConstraints(), 0.0, 0.0, 0.0);
    ExpectRange(DataTypeConstraints(-1.5, 2.5, 0.25), -1.5, 2.5, 0.25);
}

TEST(DataTypeConstraints, NaturalRangesOfIntegerTypes) {
    ExpectRange(DataTypeConstraints(DataType::Type1U), 0.0, 1.0, 1.0);
    ExpectRange(DataTypeConstraints(DataType::Type8U), 0.0, 255.0, 1.0);
    ExpectRange(DataTypeConstraints(DataType::Type8S), -128.0, 127.0, 1.0);
    ExpectRange(DataTypeConstraints(DataType::Type16S), -32768.0, 32767.0, 1.0);
    ExpectRange(DataTypeConstraints(DataType::Type32U), 0.0, 4294967295.0, 1.0);
    ExpectRange(DataTypeConstraints(DataType::Type32S), -2147483648.0, 2147483647.0, 1.0);
    // 2^64 - 1 and 2^63 - 1 round in double.
    ExpectRange(DataTypeConstraints(DataType::Type64U), 0.0, 1.8446744073709552e19, 1.0);
    ExpectRange(DataTypeConstraints(DataType::Type64S), -9223372036854775808.0,
                9223372036854775807.0, 1.0);
    ExpectRange(DataTypeConstraints(DataType(12, false, false, 12, 0, false)), 0.0, 4095.0, 1.0);
}

TEST(DataTypeConstraints, NaturalRangesOfFloatingTypes) {
    ExpectRange(DataTypeConstraints(DataType::Type32R), -3.4028234663852886e38,
                3.4028234663852886e38, 1.1920928955078125e-07);
    ExpectRange(DataTypeConstraints(DataType::Type64R), -1.7976931348623157e308,
                1.7976931348623157e308, 2.220446049250313e-16);
    // Up to 32 bits every signed floating type gets the float range.
    ExpectRange(DataTypeConstraints(DataType(16, true, true, 10, 5, false)), -3.4028234663852886e38,
                3.4028234663852886e38, 1.1920928955078125e-07);
}

TEST(DataTypeConstraints, ComplexFlagIsIgnored) {
    ExpectRange(DataTypeConstraints(DataType::TypeC16U), 0.0, 65535.0, 1.0);
    ExpectRange(DataTypeConstraints(DataType::TypeC32R), -3.4028234663852886e38,
                3.4028234663852886e38, 1.1920928955078125e-07);
}

TEST(DataTypeConstraints, IsBoundedWhenTheNaturalRangeSticksOut) {
    const DataTypeConstraints byteRange(0.0, 255.0, 1.0);
    EXPECT_FALSE(byteRange.IsBounded(DataType::Type8U));  // equal bounds do not count
    EXPECT_TRUE(byteRange.IsBounded(DataType::Type8S));
    EXPECT_TRUE(byteRange.IsBounded(DataType::Type16U));
    EXPECT_FALSE(byteRange.IsBounded(DataType::Type1U));
    EXPECT_FALSE(DataTypeConstraints(DataType::Type64R).IsBounded(DataType::Type32R));
    EXPECT_TRUE(DataTypeConstraints(DataType::Type32R).IsBounded(DataType::Type64R));
}

// Any implementation of the interface can be assigned into the stored form.
class FixedRange : public IDataTypeConstraints {
public:
    bool IsBounded(const DataType&) const override { return false; }
    double GetMin() const override { return -2.0; }
    double GetMax() const override { return 9.0; }
    double GetEpsilon() const override { return 0.5; }
};

TEST(DataTypeConstraints, CopiesAndAssignsFromAnyImplementation) {
    DataTypeConstraints range;
    range = static_cast<const IDataTypeConstraints&>(FixedRange());
    ExpectRange(range, -2.0, 9.0, 0.5);

    const DataTypeConstraints copy(range);
    ExpectRange(copy, -2.0, 9.0, 0.5);
    DataTypeConstraints assigned;
    assigned = copy;
    ExpectRange(assigned, -2.0, 9.0, 0.5);
}

}  // namespace
