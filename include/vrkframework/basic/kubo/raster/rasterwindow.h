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
    /// A position (x, y) or a size (columns, lines).
    using Point = std::pair<unsigned int, unsigned int>;

    /// Size 0 x 0 at (0, 0).
    RasterWindow() : xOffset(0), yOffset(0), xSize(0), ySize(0) {}
    /// The window of xSize_ x ySize_ pixels whose upper-left pixel is (xOffset_, yOffset_).
    RasterWindow(unsigned int xOffset_, unsigned int yOffset_, unsigned int xSize_,
                 unsigned int ySize_)
        : xOffset(xOffset_), yOffset(yOffset_), xSize(xSize_), ySize(ySize_) {}
    /// The window of `size` pixels whose upper-left pixel is `offset`.
    RasterWindow(const Point& offset, const Point& size)
        : RasterWindow(offset.first, offset.second, size.first, size.second) {}

    /// Column of the upper-left pixel.
    unsigned int GetXOffset() const { return xOffset; }
    /// Line of the upper-left pixel.
    unsigned int GetYOffset() const { return yOffset; }
    /// Width in pixels.
    unsigned int GetXSize() const { return xSize; }
    /// Height in lines.
    unsigned int GetYSize() const { return ySize; }
    /// (width, height).
    Point GetSize() const { return {xSize, ySize}; }
    /// Moves the upper-left pixel to `offset`; the size is kept.
    void SetOffset(const Point& offset) { SetOffset(offset.first, offset.second); }
    /// Moves the upper-left pixel to (x, y); the size is kept.
    void SetOffset(unsigned int x, unsigned int y) {
        xOffset = x;
        yOffset = y;
    }
    /// Resizes to `size` (width, height); the offset is kept.
    void SetSize(const Point& size) { SetSize(size.first, size.second); }
    /// Resizes to x columns by y lines; the offset is kept.
    void SetSize(unsigned int x, unsigned int y) {
        xSize = x;
        ySize = y;
    }

    /// @name Corners
    ///@{

    /// A corner pixel: upper left, upper right, lower left, lower right. The last column
    /// is xOffset + xSize - 1 and the last line yOffset + ySize - 1 (the offset itself for
    /// a size of 0); nothing guards against wrapping past 4294967295.
    Point GetUL() const { return {xOffset, yOffset}; }
    Point GetUR() const { return {GetXLast(), yOffset}; }
    Point GetLL() const { return {xOffset, GetYLast()}; }
    Point GetLR() const { return {GetXLast(), GetYLast()}; }
    ///@}

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
