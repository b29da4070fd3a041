// Cutting an area into a row-major list of tiles and walking it.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_TILEITERATOR_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_TILEITERATOR_H

#include <vector>

#include "vrkframework/basic/kubo/kuboapi.h"

namespace kora::kubo {

/// One rectangle of a cut; all zero stands for "no tile".
struct Tile {
    unsigned int xOffset;  ///< column of the tile's upper-left pixel
    unsigned int yOffset;  ///< line of the tile's upper-left pixel
    unsigned int xSize;    ///< width in pixels
    unsigned int ySize;    ///< height in lines
};

/// Cuts the area [xStart, xEnd) x [yStart, yEnd) into tiles, left to right within a row
/// of tiles and rows top to bottom; only the last column and row of tiles can be
/// narrower. The sizing operations work from xEnd and yEnd, not from the area's size.
class KUBO_API TileIterator {
public:
    /// Area from (0, 0); tiles of xSize / 4 by ySize / 4.
    /// @throws kora::DataException "Invalid tile size" when a size is 0.
    TileIterator(unsigned int xSize, unsigned int ySize);
    /// Area from (xOffset, yOffset); tiles of xSize / 4 by ySize / 4.
    /// @throws kora::DataException "Invalid windows size" when a size is 0.
    /// @throws kora::OutOfBoundsException "An area of S pixels from O ends past 4294967295",
    ///   values {O, S}, when the area ends past 4294967295 in either direction.
    TileIterator(unsigned int xOffset, unsigned int yOffset, unsigned int xSize,
                 unsigned int ySize);

    /// Recuts with the given tile size (0 spans the area in that direction); returns the
    /// number of tiles.
    unsigned int SetChunkSize(unsigned int tileXSize, unsigned int tileYSize);
    /// Recuts into tiles of about `pixelsPerTile` pixels; returns 0 and keeps the cut when
    /// that makes no tile (or `pixelsPerTile` is 0).
    unsigned int SetChunkSize(unsigned long pixelsPerTile);
    /// Recuts into about `count` tiles; returns 0 and keeps the cut when `count` is 0.
    unsigned int SetNumberOfTiles(unsigned int count);

    /// Rewinds; returns the first tile (all zero when there is none).
    Tile GetFirstTile();
    /// Returns the next tile and advances, or an all-zero tile once the walk is done.
    Tile GetNextTile();
    /// @throws kora::OutOfBoundsException {0, tile count} when `index` is past the end.
    Tile GetTile(unsigned int index);
    /// Moves the walk to `index` unless the walk is already done (index is not checked).
    void SetCurrentTile(unsigned int index);
    /// True once the walk has passed the last tile (at once for an empty cut).
    bool IsDone() const;
    /// Index of the first tile containing (x, y), or the tile count when none does.
    unsigned int GetTileIndex(unsigned int x, unsigned int y) const;
    /// Tile count - 1 (wraps to 4294967295 for an empty cut).
    unsigned int GetTileRange() const;
    /// True when xStart + xEnd <= width and yStart + yEnd <= height.
    bool Check(unsigned int width, unsigned int height) const;

protected:
    /// The cut behind every sizing operation; returns the number of tiles and rewinds.
    /// @throws kora::OutOfBoundsException "A cut into N tiles exceeds 4294967295 tiles"
    ///   before cutting; the previous cut stays.
    unsigned int Cuthem(unsigned int tileXSize, unsigned int tileYSize);

    unsigned int xEnd;        ///< one past the area's last column
    unsigned int yEnd;        ///< one past the area's last line
    unsigned int xStart;      ///< the area's first column
    unsigned int yStart;      ///< the area's first line
    std::vector<Tile> tiles;  ///< the cut, row-major
    unsigned int current;     ///< index of the tile GetNextTile returns next
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_TILEITERATOR_H
