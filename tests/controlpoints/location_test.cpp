#include "vrkframework/basic/kubo/controlpoints/location.h"

#include <gtest/gtest.h>

#include <limits>

#include "vrkframework/basic/kubo/controlpoints/groundlocationpolicy.h"
#include "vrkframework/basic/kubo/controlpoints/imagelocationpolicy.h"

namespace {

using kora::kubo::GroundLocation;
using kora::kubo::ImageLocation;

// Coordinate i is base + i, matrix entry (i, j) base + 10 i + j.
template <unsigned int N, class Policy>
void Fill(kora::kubo::Location<N, Policy>& location, double base) {
    for (unsigned int i = 0; i < N; ++i) {
        location.GetCoordinates()[i] = base + i;
        for (unsigned int j = 0; j < N; ++j) {
            location.GetMatrix()[i][j] = base + 10 * i + j;
        }
    }
}

TEST(Location, DefaultHasZeroCoordinatesMatrixAndAxesCode) {
    const GroundLocation location;
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(location.GetCoordinates()[i], 0.0);
        for (int j = 0; j < 3; ++j) {
            EXPECT_EQ(location.GetMatrix()[i][j], 0.0);
        }
    }
    EXPECT_EQ(location.GetPopulatedAxesCode(), kora::kubo::ePopulatedAxesNone);
}

TEST(Location, PoliciesNameTheCoordinates) {
    ImageLocation image;
    image.SetCoords(3, 7);
    EXPECT_EQ(image.GetColumn(), 3);
    EXPECT_EQ(image.GetRow(), 7);
    image.SetColumn(-1);
    image.SetRow(4.5);
    EXPECT_EQ(image.GetCoordinates()[0], -1);
    EXPECT_EQ(image.GetCoordinates()[1], 4.5);

    GroundLocation ground;
    ground.SetCoords(1, 2, 3);
    EXPECT_EQ(ground.GetCoordinates()[2], 3);
    EXPECT_EQ(ground.GetX() + 10 * ground.GetY() + 100 * ground.GetZ(), 321);
    ground.SetPopulatedAxesCode(static_cast<kora::kubo::PopulatedAxesCode>(42));
    EXPECT_EQ(static_cast<int>(ground.GetPopulatedAxesCode()), 42);
}

TEST(Location, CopiesAreDeepAndTheirAccessorsWriteTheirOwnArrays) {
    GroundLocation source;
    Fill(source, 1);
    source.SetPopulatedAxesCode(kora::kubo::ePopulatedAxesXYZ);
    GroundLocation copy(source);
    GroundLocation assigned;
    assigned = source;
    for (GroundLocation* target : {&copy, &assigned}) {
        EXPECT_EQ(*target, source);
        EXPECT_EQ(target->GetPopulatedAxesCode(), kora::kubo::ePopulatedAxesXYZ);
        target->SetCoords(7, 8, 9);
        target->GetMatrix()[2][1] = -1;
    }
    EXPECT_EQ(source.GetX(), 1);
    EXPECT_EQ(source.GetMatrix()[2][1], 22);
    EXPECT_EQ(copy.GetX(), 7);
    const GroundLocation& self = assigned;
    assigned = self;
    EXPECT_EQ(assigned.GetZ(), 9);
}

TEST(Location, EqualityIsExactOverCoordinatesAndMatrixOnly) {
    ImageLocation a;
    Fill(a, 0.5);
    ImageLocation b(a);
    b.GetMatrix()[1][0] += 1e-12;
    EXPECT_NE(a, b);
    b = a;
    b.GetCoordinates()[1] = 0;
    EXPECT_FALSE(a == b);

    GroundLocation x;
    GroundLocation y;
    y.SetPopulatedAxesCode(kora::kubo::ePopulatedAxesXY);
    EXPECT_EQ(x, y);
    x.GetMatrix()[0][2] = std::numeric_limits<double>::quiet_NaN();
    EXPECT_NE(x, x);
}

}  // namespace
