// Windows and tile cuts of random areas, from 0 up to the top of the 32-bit range: a window's
// corners and boundary points must follow their steps; an iterator's cut by any sizing
// operation must be the row-major grid of its tile size over the area, and its walk, tile
// lookups and failures must follow their rules.
#include <climits>  // INT_MAX, UINT_MAX
#include <cmath>    // std::ceil, std::sqrt
#include <cstddef>
#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "fuzzfailure.h"
#include "fuzzinput.h"
#include "vrkframework/basic/kubo/raster/rasterwindow.h"
#include "vrkframework/basic/kubo/raster/tileiterator.h"

using kora::kubo::RasterWindow;
using kora::kubo::Tile;
using kora::kubo::TileIterator;
using kubo_fuzz::Check;
using kubo_fuzz::FuzzInput;
using Point = RasterWindow::Point;

namespace {

constexpr char kSource[] = "vrkframework/basic/kubo/raster/tileiterator";
constexpr char kAreaSignature[] =
    "__cdecl kora::kubo::TileIterator::TileIterator(unsigned int,unsigned int,unsigned "
    "int,unsigned int)";
// Cuts into more tiles are not made (only those past 4294967295, which must fail at once),
// and windows with more boundary points are not asked for theirs: memory stays bounded.
constexpr std::uint64_t kMostTiles = 10000;
constexpr double kMostPoints = 50000;

// Mostly 0 to 40 or within 40 of 4294967295, otherwise any 32-bit value.
unsigned int TakeCoordinate(FuzzInput& input) {
    switch (input.Take(4)) {
        case 0:
        case 1:
            return input.Take(41);
        case 2:
            return UINT_MAX - input.Take(41);
        default: {
            unsigned int value = 0;
            for (int i = 0; i < 4; ++i) {
                value = value << 8 | input.Take(256);
            }
            return value;
        }
    }
}

// A tile size: a fraction of the area's extent, or any coordinate.
unsigned int TakeTileSize(FuzzInput& input, std::uint64_t extent) {
    return input.Take(3) == 0 ? static_cast<unsigned int>(extent / (1 + input.Take(16)))
                              : TakeCoordinate(input);
}

int Saturated(std::uint64_t value) { return value > INT_MAX ? INT_MAX : static_cast<int>(value); }

bool Same(const Tile& a, const Tile& b) {
    return a.xOffset == b.xOffset && a.yOffset == b.yOffset && a.xSize == b.xSize &&
           a.ySize == b.ySize;
}

// The area and the cut an iterator should hold, with its walk position.
struct Grid {
    std::uint64_t xStart, yStart, xEnd, yEnd;
    std::uint64_t tileWidth = 0, tileHeight = 0;
    std::uint64_t current = 0;

    static std::uint64_t Along(std::uint64_t start, std::uint64_t end, std::uint64_t size) {
        return (end - start + size - 1) / size;
    }
    std::uint64_t Columns() const { return Along(xStart, xEnd, tileWidth); }
    std::uint64_t Count() const { return Columns() * Along(yStart, yEnd, tileHeight); }

    // Tile `index` of the grid from (xStart, yStart): full size but for the last column and
    // row, which end at the area's end.
    Tile At(std::uint64_t index) const {
        const std::uint64_t x = xStart + index % Columns() * tileWidth;
        const std::uint64_t y = yStart + index / Columns() * tileHeight;
        const std::uint64_t w = x + tileWidth >= xEnd ? xEnd - x : tileWidth;
        const std::uint64_t h = y + tileHeight >= yEnd ? yEnd - y : tileHeight;
        return {static_cast<unsigned int>(x), static_cast<unsigned int>(y),
                static_cast<unsigned int>(w), static_cast<unsigned int>(h)};
    }

    // The tile holding (x, y), or the tile count outside the area.
    std::uint64_t IndexOf(std::uint64_t x, std::uint64_t y) const {
        if (x < xStart || x >= xEnd || y < yStart || y >= yEnd) {
            return Count();
        }
        return (y - yStart) / tileHeight * Columns() + (x - xStart) / tileWidth;
    }
};

// The grid of a cut with tiles of `width` x `height`, a 0 spanning to the area's end.
Grid Cut(const Grid& grid, std::uint64_t width, std::uint64_t height) {
    Grid next = grid;
    next.tileWidth = width != 0 ? width : grid.xEnd;
    next.tileHeight = height != 0 ? height : grid.yEnd;
    next.current = 0;
    return next;
}

// Recuts by `cut` into tiles of `width` x `height` when that makes at most kMostTiles tiles:
// `cut` must return the count and make the grid. Past 4294967295 tiles it must fail and keep
// the previous cut.
template <class Recut>
void CheckCut(Grid& grid, std::uint64_t width, std::uint64_t height, Recut cut) {
    const Grid next = Cut(grid, width, height);
    const std::uint64_t count = next.Count();
    if (count > UINT_MAX) {
        const auto failure = kubo_fuzz::ExpectFailure<kora::OutOfBoundsException>(
            cut, "a cut past 4294967295 tiles fails");
        kubo_fuzz::CheckReport(
            failure, "A cut into " + std::to_string(count) + " tiles exceeds 4294967295 tiles",
            kSource,
            "unsigned int __cdecl kora::kubo::TileIterator::Cuthem(unsigned int,unsigned int)", 0);
        Check(failure.GetValues() ==
                  std::vector<int>{Saturated(next.tileWidth), Saturated(next.tileHeight)},
              "a refused cut reports its tile size");
    } else if (count <= kMostTiles) {
        Check(cut() == count, "a cut returns its tile count");
        grid = next;
    }
}

// A cut into about `count` tiles: the ends divided by the square root of the count, all in
// single precision.
template <class Recut>
void CheckCutIntoTiles(Grid& grid, unsigned int count, Recut cut) {
    const float side = std::sqrt(static_cast<float>(count));
    const auto size = [side](std::uint64_t end) {
        return static_cast<std::uint64_t>(std::ceil(static_cast<float>(end) / side));
    };
    CheckCut(grid, size(grid.xEnd), size(grid.yEnd), cut);
}

// The walk over the whole cut gives the grid's tiles in order, then all-zero tiles.
void CheckWholeWalk(TileIterator& iterator, Grid& grid) {
    const std::uint64_t count = grid.Count();
    Check(iterator.GetTileRange() == static_cast<unsigned int>(count - 1),
          "the tile range is the count - 1");
    Tile tile = iterator.GetFirstTile();
    for (std::uint64_t i = 0; i < count; ++i, tile = iterator.GetNextTile()) {
        Check(!iterator.IsDone() || i + 1 == count, "a walk is done after the last tile");
        Check(Same(tile, grid.At(i)), "the cut is the row-major grid of the tile size");
    }
    Check(iterator.IsDone() && Same(tile, Tile{0, 0, 0, 0}), "past the end comes an all-zero tile");
    grid.current = count;
}

// One random step of a walk, or a tile asked for by index or by point, against the grid.
void Step(TileIterator& iterator, Grid& grid, FuzzInput& input) {
    const std::uint64_t count = grid.Count();
    const auto index = [&] {
        return input.Take(8) == 0 ? UINT_MAX - input.Take(3)
                                  : input.Take(static_cast<unsigned int>(count) + 3);
    };
    switch (input.Take(6)) {
        case 0:
            grid.current = count != 0 ? 1 : 0;
            Check(Same(iterator.GetFirstTile(), grid.At(0)), "the first tile rewinds the walk");
            break;
        case 1: {
            const Tile next = iterator.GetNextTile();
            Check(grid.current < count ? Same(next, grid.At(grid.current++))
                                       : Same(next, Tile{0, 0, 0, 0}),
                  "the next tile, or an all-zero tile once done");
            break;
        }
        case 2: {
            const unsigned int to = index();
            iterator.SetCurrentTile(to);
            grid.current = grid.current < count ? to : grid.current;
            break;
        }
        case 3: {
            const unsigned int at = index();
            if (at < count) {
                Check(Same(iterator.GetTile(at), grid.At(at)), "a tile by index");
                break;
            }
            const auto failure = kubo_fuzz::ExpectFailure<kora::OutOfBoundsException>(
                [&] { iterator.GetTile(at); }, "a tile past the end fails");
            kubo_fuzz::CheckReport(
                failure, "Tile number out of bounds", kSource,
                "struct kora::kubo::Tile __cdecl kora::kubo::TileIterator::GetTile(unsigned int)",
                211);
            Check(failure.GetValues() == std::vector<int>{0, static_cast<int>(count)},
                  "a tile past the end reports 0 and the count");
            break;
        }
        case 4: {
            // Around the area's start or end, or anywhere.
            const auto near = [&](std::uint64_t start, std::uint64_t end) {
                const std::uint64_t from = input.Take(2) == 0 ? start : end;
                const std::uint64_t point = from + input.Take(9) - 4;
                return static_cast<unsigned int>(input.Take(4) == 0 ? TakeCoordinate(input)
                                                                    : point);
            };
            const unsigned int x = near(grid.xStart, grid.xEnd);
            const unsigned int y = near(grid.yStart, grid.yEnd);
            Check(iterator.GetTileIndex(x, y) == grid.IndexOf(x, y),
                  "a point's tile index, or the count outside the area");
            break;
        }
        default: {
            const unsigned int width = TakeCoordinate(input);
            const unsigned int height = TakeCoordinate(input);
            Check(iterator.Check(width, height) ==
                      (grid.xStart + grid.xEnd <= width && grid.yStart + grid.yEnd <= height),
                  "the check counts the offset twice");
            break;
        }
    }
    Check(iterator.IsDone() == (grid.current >= count), "a walk is done past the last tile");
}

// A window's corners, and its boundary points by the documented steps when there are few.
void CheckWindow(FuzzInput& input) {
    const unsigned int xOffset = TakeCoordinate(input);
    const unsigned int yOffset = TakeCoordinate(input);
    const unsigned int xSize = TakeCoordinate(input);
    const unsigned int ySize = TakeCoordinate(input);
    RasterWindow window;
    if (input.Take(2) == 0) {
        window = RasterWindow(xOffset, yOffset, xSize, ySize);
    } else {
        window.SetOffset(Point(xOffset, yOffset));
        window.SetSize(xSize, ySize);
    }
    Check(window.GetXOffset() == xOffset && window.GetYOffset() == yOffset &&
              window.GetSize() == Point(xSize, ySize),
          "a window keeps its fields");
    // 32-bit arithmetic: a window reaching past 4294967295 wraps its last column or line.
    const unsigned int xLast = xSize != 0 ? xOffset + xSize - 1 : xOffset;
    const unsigned int yLast = ySize != 0 ? yOffset + ySize - 1 : yOffset;
    std::vector<Point> points{{7, 7}};
    window.GetCornerPoints(points);
    Check(points ==
              std::vector<Point>{
                  {7, 7}, {xOffset, yOffset}, {xLast, yOffset}, {xLast, yLast}, {xOffset, yLast}},
          "corners are appended clockwise from the upper left");

    const unsigned int count = input.Take(3) == 0 ? TakeCoordinate(input) : input.Take(12);
    const double xStep = count != 0 && count < xSize ? static_cast<double>(xSize) / count : 1.0;
    const double yStep = count != 0 && count < ySize ? static_cast<double>(ySize) / count : 1.0;
    const double across = xLast >= xOffset ? (xLast - xOffset) / xStep : 0;
    const double down = yLast >= yOffset ? (yLast - yOffset) / yStep : 0;
    if (across + down > kMostPoints) {
        return;
    }
    std::vector<Point> expected{{7, 7}};
    // The x of the last point the top and bottom edges gave (the offset when they gave none).
    unsigned int lastX = xOffset;
    for (double x = xOffset; x <= xLast; x += xStep) {
        lastX = static_cast<unsigned int>(x);
        expected.insert(expected.end(), {{lastX, yOffset}, {lastX, yLast}});
    }
    if (lastX != xLast) {
        expected.insert(expected.end(), {{xLast, yOffset}, {xLast, yLast}});
    }
    for (double y = yOffset + yStep; y < yLast; y += yStep) {
        const auto line = static_cast<unsigned int>(y);
        expected.insert(expected.end(), {{xLast, line}, {xOffset, line}});
    }
    points.resize(1);
    window.GetBoundaryPoints(points, count);
    Check(points == expected, "boundary points follow their steps");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    FuzzInput input(data, size);
    CheckWindow(input);

    const bool fromOrigin = input.Take(2) == 0;
    const unsigned int xOffset = fromOrigin ? 0 : TakeCoordinate(input);
    const unsigned int yOffset = fromOrigin ? 0 : TakeCoordinate(input);
    const unsigned int xSize = TakeCoordinate(input);
    const unsigned int ySize = TakeCoordinate(input);
    const auto make = [&] {
        return fromOrigin ? TileIterator(xSize, ySize)
                          : TileIterator(xOffset, yOffset, xSize, ySize);
    };
    if (xSize == 0 || ySize == 0) {
        const auto failure =
            kubo_fuzz::ExpectFailure<kora::DataException>(make, "an empty area fails");
        if (fromOrigin) {
            kubo_fuzz::CheckReport(
                failure, "Invalid tile size", kSource,
                "__cdecl kora::kubo::TileIterator::TileIterator(unsigned int,unsigned int)", 31);
        } else {
            kubo_fuzz::CheckReport(failure, "Invalid windows size", kSource, kAreaSignature, 61);
        }
        return 0;
    }
    Grid grid{xOffset, yOffset, std::uint64_t{xOffset} + xSize, std::uint64_t{yOffset} + ySize};
    if (grid.xEnd > UINT_MAX || grid.yEnd > UINT_MAX) {
        const bool across = grid.xEnd > UINT_MAX;
        const unsigned int offset = across ? xOffset : yOffset;
        const unsigned int extent = across ? xSize : ySize;
        const auto failure = kubo_fuzz::ExpectFailure<kora::OutOfBoundsException>(
            make, "an area ending past 4294967295 fails");
        kubo_fuzz::CheckReport(failure,
                               "An area of " + std::to_string(extent) + " pixels from " +
                                   std::to_string(offset) + " ends past 4294967295",
                               kSource, kAreaSignature, 0);
        Check(failure.GetValues() == std::vector<int>{Saturated(offset), Saturated(extent)},
              "an area ending past 4294967295 reports its offset and size");
        return 0;
    }
    TileIterator iterator = make();
    grid = Cut(grid, xSize / 4, ySize / 4);
    CheckWholeWalk(iterator, grid);

    for (unsigned int operation = 0; operation < 6; ++operation) {
        switch (input.Take(4)) {
            case 0: {
                const unsigned int width = TakeTileSize(input, grid.xEnd - grid.xStart);
                const unsigned int height = TakeTileSize(input, grid.yEnd - grid.yStart);
                CheckCut(grid, width, height, [&] { return iterator.SetChunkSize(width, height); });
                break;
            }
            case 1: {
                const unsigned int count =
                    input.Take(4) == 0 ? TakeCoordinate(input) : input.Take(64);
                if (count == 0) {
                    Check(iterator.SetNumberOfTiles(0) == 0, "no tiles leave the cut");
                } else {
                    CheckCutIntoTiles(grid, count,
                                      [&] { return iterator.SetNumberOfTiles(count); });
                }
                break;
            }
            case 2: {
                const unsigned long pixels = input.Take(2) == 0
                                                 ? input.Take(64)
                                                 : (grid.xEnd * grid.yEnd) / (1 + input.Take(200));
                if (pixels == 0) {
                    Check(iterator.SetChunkSize(0ul) == 0, "0 pixels a tile leave the cut");
                    break;
                }
                // A count past the int range is 2^31, as single precision rounds any of them.
                const double tiles =
                    std::ceil(static_cast<double>(grid.yEnd) * static_cast<double>(grid.xEnd) /
                              static_cast<double>(pixels));
                CheckCutIntoTiles(grid, static_cast<unsigned int>(tiles > INT_MAX ? 0x1p31 : tiles),
                                  [&] { return iterator.SetChunkSize(pixels); });
                break;
            }
            default:
                for (unsigned int step = 0, steps = 1 + input.Take(8); step < steps; ++step) {
                    Step(iterator, grid, input);
                }
                continue;
        }
        CheckWholeWalk(iterator, grid);
    }
    // Copies keep cuts of their own.
    TileIterator copy(iterator);
    copy.SetChunkSize(0u, 0u);
    CheckWholeWalk(iterator, grid);
    copy = iterator;
    CheckWholeWalk(copy, grid);
    return 0;
}
