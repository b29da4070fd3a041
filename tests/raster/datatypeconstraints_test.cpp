#include "vrkframework/basic/kubo/raster/datatypeconstraints.h"

#include <gtest/gtest.h>

#include "vrkframework/basic/kubo/raster/datatype.h"

namespace {

using kora::kubo::DataType;
using kora::kubo::DataTypeConstraints;

void ExpectRange(const kora::kubo::IDataTypeConstraints& range, double min, double max,
                 double epsilon) {
    EXPECT_EQ(range.GetMin(), min);
    EXPECT_EQ(range.GetMax(), max);
    EXPECT_EQ(range.GetEpsilon(), epsilon);
}

TEST(DataTypeConstraints, NaturalRangeOfOneComponent) {
    constexpr double kFloat = 3.4028234663852886e38;
    constexpr double kDouble = 1.7976931348623157e308;
    struct Case {
        DataType type;
        double min, max, epsilon;
    };
    const Case cases[] = {
        {DataType::Type1U, 0.0, 1.0, 1.0},
        {DataType::Type8S, -128.0, 127.0, 1.0},
        {DataType::TypeC16U, 0.0, 65535.0, 1.0},
        {DataType::Type32S, -2147483648.0, 2147483647.0, 1.0},
        {DataType::Type64U, 0.0, 1.8446744073709552e19, 1.0},  // 2^64 - 1 rounds in double
        {DataType(12, false, false, 12, 0, false), 0.0, 4095.0, 1.0},
        {DataType::TypeC32R, -kFloat, kFloat, 1.1920928955078125e-07},
        {DataType(16, true, true, 10, 5, false), -kFloat, kFloat, 1.1920928955078125e-07},
        {DataType::Type64R, -kDouble, kDouble, 2.220446049250313e-16},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.type.bits);
        ExpectRange(DataTypeConstraints(c.type), c.min, c.max, c.epsilon);
    }
    ExpectRange(DataTypeConstraints(), 0.0, 0.0, 0.0);
}

TEST(DataTypeConstraints, IsBoundedOnlyWhenTheRangeSticksOut) {
    const DataTypeConstraints byteRange(0.0, 255.0, 1.0);
    EXPECT_FALSE(byteRange.IsBounded(DataType::Type8U));  // equal bounds do not count
    EXPECT_TRUE(byteRange.IsBounded(DataType::Type8S));
    EXPECT_TRUE(byteRange.IsBounded(DataType::Type16U));
    EXPECT_TRUE(DataTypeConstraints(DataType::Type32R).IsBounded(DataType::Type64R));
}

// Any implementation of the interface assigns through its getters.
class FixedRange : public kora::kubo::IDataTypeConstraints {
public:
    bool IsBounded(const DataType&) const override { return false; }
    double GetMin() const override { return -2.0; }
    double GetMax() const override { return 9.0; }
    double GetEpsilon() const override { return 0.5; }
};

TEST(DataTypeConstraints, CopiesAndAssignsFromAnyImplementation) {
    DataTypeConstraints range;
    range = static_cast<const kora::kubo::IDataTypeConstraints&>(FixedRange());
    DataTypeConstraints assigned;
    assigned = DataTypeConstraints(range);
    ExpectRange(assigned, -2.0, 9.0, 0.5);
}

}  // namespace
