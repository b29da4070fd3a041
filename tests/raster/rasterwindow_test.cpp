#include "vrkframework/basic/kubo/raster/rasterwindow.h"

#include <gtest/gtest.h>

namespace {

using kora::kubo::RasterWindow;
using Points = std::vector<RasterWindow::Point>;

TEST(RasterWindow, ConstructorsAndSetters) {
    const RasterWindow none;
    EXPECT_EQ(none.GetXOffset() + none.GetYOffset() + none.GetXSize() + none.GetYSize(), 0u);

    RasterWindow window({2, 3}, {4, 5});
    EXPECT_EQ(window.GetXOffset(), 2u);
    EXPECT_EQ(window.GetYOffset(), 3u);
    EXPECT_EQ(window.GetSize(), RasterWindow::Point(4, 5));
    window.SetOffset(7, 8);
    window.SetSize({9, 10});
    EXPECT_EQ(window.GetUL(), RasterWindow::Point(7, 8));
    EXPECT_EQ(window.GetXSize(), 9u);
    EXPECT_EQ(window.GetYSize(), 10u);
    window.SetOffset({1, 1});
    window.SetSize(2, 2);
    EXPECT_EQ(window.GetLR(), RasterWindow::Point(2, 2));
}

TEST(RasterWindow, CornersRunClockwiseFromTheUpperLeft) {
    const RasterWindow window(2, 3, 4, 5);
    EXPECT_EQ(window.GetUL(), RasterWindow::Point(2, 3));
    EXPECT_EQ(window.GetUR(), RasterWindow::Point(5, 3));
    EXPECT_EQ(window.GetLR(), RasterWindow::Point(5, 7));
    EXPECT_EQ(window.GetLL(), RasterWindow::Point(2, 7));
    Points points{{99, 99}};
    window.GetCornerPoints(points);
    EXPECT_EQ(points, (Points{{99, 99}, {2, 3}, {5, 3}, {5, 7}, {2, 7}}));
}

TEST(RasterWindow, ZeroSizePutsEveryCornerOnTheOffset) {
    const RasterWindow window(6, 9, 0, 0);
    Points points;
    window.GetCornerPoints(points);
    EXPECT_EQ(points, (Points{{6, 9}, {6, 9}, {6, 9}, {6, 9}}));
}

TEST(RasterWindow, BoundaryPointsOfEveryPixelComeInPairs) {
    Points points{{42, 42}};
    RasterWindow(0, 0, 3, 3).GetBoundaryPoints(points, 0);
    EXPECT_EQ(points,
              (Points{{42, 42}, {0, 0}, {0, 2}, {1, 0}, {1, 2}, {2, 0}, {2, 2}, {2, 1}, {0, 1}}));
}

TEST(RasterWindow, BoundaryPointsWithACountStepAndAddTheLastColumn) {
    Points points;
    RasterWindow(10, 20, 10, 4).GetBoundaryPoints(points, 3);
    // x step 10/3: 10, 13.33, 16.67, then 20 > 19 stops; column 19 is added.
    // y step 4/3: 21.33, 22.67 (< 23).
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
}

TEST(RasterWindow, BoundaryCountNotBelowTheSizeKeepsUnitSteps) {
    Points coarse;
    Points fine;
    RasterWindow(0, 0, 4, 4).GetBoundaryPoints(coarse, 4);
    RasterWindow(0, 0, 4, 4).GetBoundaryPoints(fine, 0);
    EXPECT_EQ(coarse, fine);
    EXPECT_EQ(fine.size(), 12u);
}

TEST(RasterWindow, BoundaryOfASinglePixel) {
    Points points;
    RasterWindow(5, 5, 1, 1).GetBoundaryPoints(points, 0);
    EXPECT_EQ(points, (Points{{5, 5}, {5, 5}}));
}

}  // namespace
