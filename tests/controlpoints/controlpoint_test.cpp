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

// Point 12 (or `id`), named, of a non-default type, on the ground and in two images.
ControlPoint Sample(unsigned int id = 12) {
    ControlPoint point(id);
    point.SetName("GCP 12");
    point.SetType(kora::kubo::eControlPointCheck);
    GroundLocation ground;
    ground.SetCoords(100, 200, 30);
    ground.GetMatrix()[2][1] = 0.5;
    ground.SetPopulatedAxesCode(kora::kubo::ePopulatedAxesXYZ);
    point.SetGroundLocation(ground);
    std::vector<ImageLocation> images(2);
    images[0].SetCoords(1, 2);
    images[1].SetCoords(3, 4);
    point.SetImageLocations(images);
    return point;
}

TEST(ControlPoint, DefaultIsUnnamedIdZeroUnusedAtZeroWithoutImages) {
    const ControlPoint point;
    EXPECT_EQ(point.GetId(), 0u);
    EXPECT_EQ(point.GetName(), "");
    EXPECT_FALSE(point.IsUsed());
    EXPECT_EQ(point.GetType(), kora::kubo::eControlPointUndefined);
    EXPECT_TRUE(point.GetImageLocations().empty());
    const GroundLocation& ground = point.GetGroundLocation();
    for (int i = 0; i < 9; ++i) {
        EXPECT_EQ(ground.GetCoordinates()[i % 3], 0.0);
        EXPECT_EQ(ground.GetMatrix()[i / 3][i % 3], 0.0);
    }
    EXPECT_EQ(ground.GetPopulatedAxesCode(), kora::kubo::ePopulatedAxesNone);
    EXPECT_EQ(point, ControlPoint(0));
}

TEST(Location, PoliciesNameTheCoordinates) {
    GroundLocation ground;
    ground.SetCoords(1, 2, 3);
    EXPECT_EQ(ground.GetCoordinates()[2], 3);
    EXPECT_EQ(ground.GetX() + 10 * ground.GetY() + 100 * ground.GetZ(), 321);
    ground.SetPopulatedAxesCode(static_cast<kora::kubo::PopulatedAxesCode>(42));
    EXPECT_EQ(static_cast<int>(ground.GetPopulatedAxesCode()), 42);
    ImageLocation image;
    image.SetCoords(3, 7);
    EXPECT_EQ(image.GetColumn(), 3);
    EXPECT_EQ(image.GetRow(), 7);
    image.SetColumn(-1);
    image.SetRow(4.5);
    EXPECT_EQ(image.GetCoordinates()[0], -1);
    EXPECT_EQ(image.GetCoordinates()[1], 4.5);
}

// Locations compare every coordinate and matrix entry exactly, and nothing else.
TEST(ControlPoint, EqualityIgnoresOnlyTheUsedFlagAndTheAxesCode) {
    ControlPoint other = Sample();
    other.SetUsed(true);
    GroundLocation ground = other.GetGroundLocation();
    ground.SetPopulatedAxesCode(kora::kubo::ePopulatedAxesXY);
    other.SetGroundLocation(ground);
    EXPECT_EQ(other, Sample());
    const std::function<void(ControlPoint&)> changes[] = {
        [](ControlPoint& p) { p.SetName("gcp 12"); },
        [](ControlPoint& p) { p = Sample(13); },
        [](ControlPoint& p) { p.SetType(kora::kubo::eControlPointTie); },
        [](ControlPoint& p) { std::swap(p.GetImageLocations()[0], p.GetImageLocations()[1]); },
        [](ControlPoint& p) { p.GetImageLocations().pop_back(); },
        [](ControlPoint& p) { p.SetGroundLocation(GroundLocation()); },
        [](ControlPoint& p) { p.GetImageLocations()[1].GetMatrix()[1][0] = 1e-12; },
        [](ControlPoint& p) { p.GetImageLocations()[1].SetRow(4 + 1e-12); },
    };
    for (const auto& change : changes) {
        other = Sample();
        change(other);
        EXPECT_NE(other, Sample());
    }
    ground.GetMatrix()[0][2] = std::numeric_limits<double>::quiet_NaN();
    other.SetGroundLocation(ground);
    EXPECT_NE(other, other);
}

// Each copy owns its arrays: writing through the copy's matrix rows leaves the source.
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
        EXPECT_EQ(target->GetGroundLocation().GetPopulatedAxesCode(),
                  kora::kubo::ePopulatedAxesXYZ);
        target->GetImageLocations()[0].SetRow(99);
        target->GetImageLocations()[1].GetMatrix()[0][1] = 7;
    }
    EXPECT_EQ(source.GetImageLocations()[0].GetRow(), 2);
    EXPECT_EQ(source.GetImageLocations()[1].GetMatrix()[0][1], 0);
    const ControlPoint& self = assigned;
    assigned = self;
    EXPECT_EQ(assigned.GetImageLocations()[0].GetRow(), 99);
    std::vector<ControlPoint> points(40, source);  // growth copies points without harm
    points.push_back(Sample());
    EXPECT_EQ(points.front(), source);
}

}  // namespace
