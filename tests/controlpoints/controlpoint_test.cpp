#include "vrkframework/basic/kubo/controlpoints/controlpoint.h"

#include <gtest/gtest.h>

#include <functional>
#include <limits>
#include <utility>
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

ControlPoint Sample(unsigned int id = 12) {
    ControlPoint point(id);
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

TEST(ControlPoint, EqualityIgnoresOnlyTheUsedFlag) {
    ControlPoint used = Sample();
    used.SetUsed(true);
    EXPECT_TRUE(used.IsUsed());
    EXPECT_EQ(used, Sample());

    const std::function<void(ControlPoint&)> changes[] = {
        [](ControlPoint& p) { p.SetName("gcp 12"); },
        [](ControlPoint& p) { p = Sample(13); },
        [](ControlPoint& p) { p.SetType(kora::kubo::eControlPointTie); },
        [](ControlPoint& p) { std::swap(p.GetImageLocations()[0], p.GetImageLocations()[1]); },
        [](ControlPoint& p) { p.GetImageLocations().pop_back(); },
        [](ControlPoint& p) { p.SetGroundLocation(GroundLocation()); },
    };
    for (const auto& change : changes) {
        ControlPoint other = Sample();
        change(other);
        EXPECT_NE(other, Sample());
    }
    ControlPoint nan;
    GroundLocation ground;
    ground.SetCoords(0, std::numeric_limits<double>::quiet_NaN(), 0);
    nan.SetGroundLocation(ground);
    EXPECT_NE(nan, nan);
}

TEST(ControlPoint, CopiesAreDeepAndCarryEveryMember) {
    ControlPoint source = Sample();
    source.SetUsed(true);
    ControlPoint copy(source);
    ControlPoint assigned;
    assigned = source;
    for (ControlPoint* target : {&copy, &assigned}) {
        EXPECT_EQ(*target, source);
        EXPECT_EQ(target->GetId(), 12u);
        EXPECT_TRUE(target->IsUsed());
        target->GetImageLocations()[0].SetRow(99);
    }
    EXPECT_EQ(source.GetImageLocations()[0].GetRow(), 2);
    const ControlPoint& self = assigned;
    assigned = self;
    EXPECT_EQ(assigned.GetImageLocations()[0].GetRow(), 99);

    std::vector<ControlPoint> points(40, source);  // growth moves points without harm
    points.push_back(Sample());
    EXPECT_EQ(points.front(), source);
}

}  // namespace
