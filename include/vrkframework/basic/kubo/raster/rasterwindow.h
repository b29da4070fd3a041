// A rectangle of a raster with its corner and boundary points.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_RASTERWINDOW_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_RASTERWINDOW_H

#include <utility>  // std::pair
#include <vector>

#include "vrkframework/basic/kubo/kuboapi.h"

namespace kora::kubo {

/// A rectangle in pixel coordinates; points are (x, y) = (column, line). A window of
/// size 0 in a direction has its last column (or line) on its offset.
class KUBO_API RasterWindow {
public:
    using Point = std::pair<unsigned int, unsigned int>;

    RasterWindow() : xOffset(0), yOffset(0), xSize(0), ySize(0) {}
    RasterWindow(unsigned int xOffset_, unsigned int yOffset_, unsigned int xSize_,
                 unsigned int ySize_)
        : xOffset(xOffset_), yOffset(yOffset_), xSize(xSize_), ySize(ySize_) {}
    RasterWindow(const Point& offset, const Point& size)
        : RasterWindow(offset.first, offset.second, size.first, size.second) {}

    unsigned int GetXOffset() const { return xOffset; }
    unsigned int GetYOffset() const { return yOffset; }
    unsigned int GetXSize() const { return xSize; }
    unsigned int GetYSize() const { return ySize; }
    Point GetSize() const { return {xSize, ySize}; }
    void SetOffset(const Point& offset) { SetOffset(offset.first, offset.second); }
    void SetOffset(unsigned int x, unsigned int y) {
        xOffset = x;
        yOffset = y;
    }
    void SetSize(const Point& size) { SetSize(size.first, size.second); }
    void SetSize(unsigned int x, unsigned int y) {
        xSize = x;
        ySize = y;
    }

    Point GetUL() const { return {xOffset, yOffset}; }
    Point GetUR() const { return {GetXLast(), yOffset}; }
    Point GetLL() const { return {xOffset, GetYLast()}; }
    Point GetLR() const { return {GetXLast(), GetYLast()}; }

    /// Appends UL, UR, LR, LL (clockwise from the upper left); `points` is not cleared.
    void GetCornerPoints(std::vector<Point>& points) const;

    /// Appends about `count` points per edge (every pixel when `count` is 0 or not below
    /// the edge length): top/bottom pairs first, then right/left pairs, each corner once.
    /// `points` is not cleared.
    void GetBoundaryPoints(std::vector<Point>& points, unsigned int count) const;

private:
    unsigned int GetXLast() const { return xSize != 0 ? xOffset + xSize - 1 : xOffset; }
    unsigned int GetYLast() const { return ySize != 0 ? yOffset + ySize - 1 : yOffset; }

    unsigned int xOffset;
    unsigned int yOffset;
    unsigned int xSize;
    unsigned int ySize;
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_RASTERWINDOW_H
