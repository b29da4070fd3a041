// Corner and boundary points of a raster window.
#include "vrkframework/basic/kubo/raster/rasterwindow.h"

namespace kora::kubo {

void RasterWindow::GetCornerPoints(std::vector<Point>& points) const {
    points.push_back(GetUL());
    points.push_back(GetUR());
    points.push_back(GetLR());
    points.push_back(GetLL());
}

void RasterWindow::GetBoundaryPoints(std::vector<Point>& points, unsigned int count) const {
    const unsigned int xLast = GetXLast();
    const unsigned int yLast = GetYLast();
    double xStep = 1.0;
    double yStep = 1.0;
    if (count != 0) {
        if (count < xSize) {
            xStep = static_cast<double>(xSize) / count;
        }
        if (count < ySize) {
            yStep = static_cast<double>(ySize) / count;
        }
    }

    // Top and bottom edges in pairs; a fractional step can stop short of the last column,
    // which is then added so that every corner appears.
    unsigned int lastX = xOffset;
    for (double x = xOffset; x <= xLast; x += xStep) {
        lastX = static_cast<unsigned int>(x);
        points.emplace_back(lastX, yOffset);
        points.emplace_back(lastX, yLast);
    }
    if (lastX != xLast) {
        points.emplace_back(xLast, yOffset);
        points.emplace_back(xLast, yLast);
    }

    // Right and left edges in pairs, without the first and last lines already covered.
    for (double y = yOffset + yStep; y < yLast; y += yStep) {
        const auto line = static_cast<unsigned int>(y);
        points.emplace_back(xLast, line);
        points.emplace_back(xOffset, line);
    }
}

}  // namespace kora::kubo
