#include "vrkframework/basic/kubo/controlpoints/location.h"

#include <gtest/gtest.h>

#include <limits>

#include "vrkframework/basic/kubo/controlpoints/groundlocation.h"
#include "vrkframework/basic/kubo/controlpoints/imagelocation.h"

namespace {

using kora::kubo::GroundLocation;
using kora::kubo::ImageLocation;

template <class L>
void Fill(L& location, double base, unsigned int n) {
    for (unsigned int i = 0; i < n; ++i) {
        location.GetCoordinates()[i] = base + i;
        for (unsigned int j = 0; j < n; ++j) {
            location.GetMatrix()[i][j] = base + 10 * i + j;
        }
    }
}

TEST(Location, DefaultHasZeroCoordinatesAndMatrix) {
    const GroundLocation location;
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(location.GetCoordinates()[i], 0.0);
        for (int j = 0; j < 3; ++j) {
            EXPECT_EQ(location.GetMatrix()[i][j], 0.0);
        }
    }
    EXPECT_EQ(location.GetPopulatedAxesCode(), kora::kubo::ePopulatedAxesNone);
}

TEST(Location, ImagePolicyNamesColumnThenRow) {
    ImageLocation location;
    location.SetCoords(3, 7);
    EXPECT_EQ(location.GetColumn(), 3);
    EXPECT_EQ(location.GetRow(), 7);
    EXPECT_EQ(location.GetCoordinates()[0], 3);
    EXPECT_EQ(location.GetCoordinates()[1], 7);
    location.SetColumn(-1);
    location.SetRow(4.5);
    EXPECT_EQ(location.GetCoordinates()[0], -1);
    EXPECT_EQ(location.GetCoordinates()[1], 4.5);
}

TEST(Location, GroundPolicyNamesXYZAndKeepsAnyAxesCode) {
    GroundLocation location;
    location.SetCoords(1, 2, 3);
    EXPECT_EQ(location.GetCoordinates()[0], 1);
    EXPECT_EQ(location.GetCoordinates()[1], 2);
    EXPECT_EQ(location.GetCoordinates()[2], 3);
    EXPECT_EQ(location.GetX(), 1);
    EXPECT_EQ(location.GetY(), 2);
    EXPECT_EQ(location.GetZ(), 3);
    location.SetPopulatedAxesCode(static_cast<kora::kubo::PopulatedAxesCode>(42));
    EXPECT_EQ(static_cast<int>(location.GetPopulatedAxesCode()), 42);
}

TEST(Location, CopiesAreDeepAndTheirAccessorsWriteTheirOwnArrays) {
    GroundLocation source;
    Fill(source, 1, 3);
    source.SetPopulatedAxesCode(kora::kubo::ePopulatedAxesXYZ);
    GroundLocation copy(source);
    EXPECT_EQ(copy, source);
    EXPECT_EQ(copy.GetPopulatedAxesCode(), kora::kubo::ePopulatedAxesXYZ);
    EXPECT_NE(copy.GetCoordinates(), source.GetCoordinates());
    copy.SetCoords(7, 8, 9);
    copy.GetMatrix()[2][1] = -1;
    EXPECT_EQ(source.GetX(), 1);
    EXPECT_EQ(source.GetMatrix()[2][1], 22);

    GroundLocation assigned;
    assigned = source;
    EXPECT_EQ(assigned, source);
    EXPECT_EQ(assigned.GetPopulatedAxesCode(), kora::kubo::ePopulatedAxesXYZ);
    assigned.SetCoords(0, 0, 0);
    EXPECT_EQ(source.GetZ(), 3);
    const GroundLocation& self = assigned;
    assigned = self;
    EXPECT_EQ(assigned.GetY(), 0);
}

TEST(Location, EqualityIsExactOverCoordinatesAndMatrixOnly) {
    ImageLocation a;
    Fill(a, 0.5, 2);
    ImageLocation b(a);
    b.GetMatrix()[1][0] += 1e-12;
    EXPECT_NE(a, b);
    b.GetMatrix()[1][0] = a.GetMatrix()[1][0];
    EXPECT_EQ(a, b);
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
