#include "vrkframework/basic/kubo/raster/rasterwindow.h"

#include <gtest/gtest.h>

namespace {

using kora::kubo::RasterWindow;
using Points = std::vector<RasterWindow::Point>;

TEST(RasterWindow, AccessorsAndCornersClockwiseFromTheUpperLeft) {
    RasterWindow window({9, 9}, {1, 1});
    window.SetOffset(2, 3);
    window.SetSize({4, 5});
    EXPECT_EQ(window.GetXOffset() + window.GetYOffset(), 5u);
    EXPECT_EQ(window.GetSize(), RasterWindow::Point(4, 5));
    Points points{{99, 99}};  // appended to, not cleared
    window.GetCornerPoints(points);
    EXPECT_EQ(points, (Points{{99, 99}, {2, 3}, {5, 3}, {5, 7}, {2, 7}}));

    points.clear();
    RasterWindow(6, 9, 0, 0).GetCornerPoints(points);  // size 0: every corner on the offset
    EXPECT_EQ(points, (Points{{6, 9}, {6, 9}, {6, 9}, {6, 9}}));
}

TEST(RasterWindow, BoundaryPointsComeInPairsWithEachCornerOnce) {
    Points points{{42, 42}};
    RasterWindow(0, 0, 3, 3).GetBoundaryPoints(points, 0);
    EXPECT_EQ(points,
              (Points{{42, 42}, {0, 0}, {0, 2}, {1, 0}, {1, 2}, {2, 0}, {2, 2}, {2, 1}, {0, 1}}));

    // x step 10/3 stops short of column 19, which is added; y step 4/3 gives lines 21 and 22.
    points.clear();
    RasterWindow(10, 20, 10, 4).GetBoundaryPoints(points, 3);
    EXPECT_EQ(points, (Points{{10, 20},
                              {10, 23},
                              {13, 20},
                              {13, 23},
                              {16, 20},
                              {16, 23},
                              {19, 20},
                              {19, 23},
                              {19, 21},
                              {10, 21},
                              {19, 22},
                              {10, 22}}));

    // A count not below the size keeps unit steps.
    Points coarse;
    Points fine;
    RasterWindow(0, 0, 4, 4).GetBoundaryPoints(coarse, 4);
    RasterWindow(0, 0, 4, 4).GetBoundaryPoints(fine, 0);
    EXPECT_EQ(coarse, fine);
}

}  // namespace
