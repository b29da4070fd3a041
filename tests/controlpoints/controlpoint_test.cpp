#include "vrkframework/basic/kubo/controlpoints/controlpoint.h"

#include <gtest/gtest.h>

#include <limits>
#include <vector>

namespace {

using kora::kubo::ControlPoint;
using kora::kubo::GroundLocation;
using kora::kubo::ImageLocation;

ImageLocation At(double column, double row) {
    ImageLocation location;
    location.SetCoords(column, row);
    return location;
}

ControlPoint Sample() {
    ControlPoint point(12);
    point.SetName("GCP 12");
    point.SetType(kora::kubo::eControlPointCheck);
    GroundLocation ground;
    ground.SetCoords(100, 200, 30);
    point.SetGroundLocation(ground);
    point.SetImageLocations({At(1, 2), At(3, 4)});
    return point;
}

TEST(ControlPoint, DefaultIsUnnamedIdZeroUnusedWithoutImages) {
    const ControlPoint point;
    EXPECT_EQ(point.GetId(), 0u);
    EXPECT_EQ(point.GetName(), "");
    EXPECT_FALSE(point.IsUsed());
    EXPECT_EQ(point.GetType(), kora::kubo::eControlPointUndefined);
    EXPECT_TRUE(point.GetImageLocations().empty());
    EXPECT_EQ(point.GetGroundLocation(), GroundLocation());
    EXPECT_EQ(point, ControlPoint(0));
    EXPECT_EQ(ControlPoint(7).GetId(), 7u);
}

TEST(ControlPoint, UsedFlagTakesNoPartInEquality) {
    ControlPoint used = Sample();
    used.SetUsed(true);
    EXPECT_TRUE(used.IsUsed());
    EXPECT_EQ(used, Sample());
}

TEST(ControlPoint, DiffersInAnyOtherMember) {
    const ControlPoint base = Sample();
    ControlPoint other = Sample();
    other.SetName("gcp 12");
    EXPECT_NE(other, base);

    other = ControlPoint(13);
    other.SetName("GCP 12");
    other.SetType(kora::kubo::eControlPointCheck);
    other.SetGroundLocation(base.GetGroundLocation());
    other.SetImageLocations(base.GetImageLocations());
    EXPECT_NE(other, base);  // id only

    other = base;
    other.SetType(kora::kubo::eControlPointTie);
    EXPECT_NE(other, base);

    other = base;
    std::swap(other.GetImageLocations()[0], other.GetImageLocations()[1]);
    EXPECT_NE(other, base);

    other = base;
    other.GetImageLocations().pop_back();
    EXPECT_NE(other, base);

    other = base;
    GroundLocation ground = base.GetGroundLocation();
    ground.GetMatrix()[2][2] = 1;
    other.SetGroundLocation(ground);
    EXPECT_NE(other, base);
}

TEST(ControlPoint, NaNInTheGroundLocationMakesAPointUnequalToItself) {
    ControlPoint point;
    GroundLocation ground;
    ground.SetCoords(0, std::numeric_limits<double>::quiet_NaN(), 0);
    point.SetGroundLocation(ground);
    EXPECT_NE(point, point);
}

TEST(ControlPoint, CopiesAreDeepAndCarryEveryMember) {
    ControlPoint source = Sample();
    source.SetUsed(true);
    ControlPoint copy(source);
    EXPECT_EQ(copy, source);
    EXPECT_EQ(copy.GetId(), 12u);
    EXPECT_TRUE(copy.IsUsed());
    copy.GetImageLocations()[0].SetRow(99);
    EXPECT_EQ(source.GetImageLocations()[0].GetRow(), 2);

    ControlPoint assigned;
    assigned = source;
    EXPECT_EQ(assigned, source);
    EXPECT_TRUE(assigned.IsUsed());
    assigned.GetImageLocations()[1].SetColumn(-5);
    EXPECT_EQ(source.GetImageLocations()[1].GetColumn(), 3);

    const ControlPoint& self = assigned;
    assigned = self;
    EXPECT_EQ(assigned.GetImageLocations()[1].GetColumn(), -5);

    std::vector<ControlPoint> points(40, source);  // growth moves points without harm
    points.emplace_back(Sample());
    EXPECT_EQ(points.front().GetImageLocations()[1].GetColumn(), 3);
}

}  // namespace
