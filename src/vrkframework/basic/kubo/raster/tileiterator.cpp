// Tile cutting and walking.
#include "vrkframework/basic/kubo/raster/tileiterator.h"

#include <climits>  // INT_MAX, UINT_MAX
#include <cmath>    // std::ceil, std::sqrt
#include <cstdint>  // std::uint64_t
#include <string>   // std::to_string

#include "vrkframework/basic/kubo/raster/bufferextent.h"
#include "vrkframework/platform/exception.h"

namespace kora::kubo {
namespace {

constexpr char kSourcePath[] = "vrkframework/basic/kubo/raster/tileiterator";

// One past the last column or line of an area: its end is a 32-bit field, so an area that
// reaches past 4294967295 has no consistent description.
unsigned int AreaEnd(unsigned int offset, unsigned int size) {
    const std::uint64_t end = std::uint64_t{offset} + size;
    if (end > UINT_MAX) {
        throw kora::OutOfBoundsException(
            {detail::SaturatedInt(offset), detail::SaturatedInt(size)},
            "An area of " + std::to_string(size) + " pixels from " + std::to_string(offset) +
                " ends past 4294967295",
            kSourcePath,
            "__cdecl kora::kubo::TileIterator::TileIterator(unsigned int,unsigned int,unsigned "
            "int,unsigned int)",
            0);
    }
    return static_cast<unsigned int>(end);
}

// The tile size ceil(end / side) of a cut into side x side tiles, in single precision. An end
// within 128 of 4294967295 rounds to 2^32 there, past the unsigned range; as any size from the
// area's extent up cuts the same single column or row, the size saturates at 4294967295.
unsigned int TileSizeFor(unsigned int end, float side) {
    const float size = std::ceil(static_cast<float>(end) / side);
    return size < 0x1p32f ? static_cast<unsigned int>(size) : UINT_MAX;
}

// Tiles of a cut along one direction: ceil(extent / size), in 64 bits.
std::uint64_t TilesAlong(unsigned int start, unsigned int end, unsigned int size) {
    return start < end ? (std::uint64_t{end} - start + size - 1) / size : 0;
}

}  // namespace

TileIterator::TileIterator(unsigned int xSize, unsigned int ySize)
    : xEnd(xSize), yEnd(ySize), xStart(0), yStart(0), current(0) {
    if (xSize == 0 || ySize == 0) {
        throw kora::DataException(
            "Invalid tile size", kSourcePath,
            "__cdecl kora::kubo::TileIterator::TileIterator(unsigned int,unsigned int)", 31);
    }
    Cuthem(xSize / 4, ySize / 4);
}

TileIterator::TileIterator(unsigned int xOffset, unsigned int yOffset, unsigned int xSize,
                           unsigned int ySize)
    : xEnd(0), yEnd(0), xStart(xOffset), yStart(yOffset), current(0) {
    if (xSize == 0 || ySize == 0) {
        throw kora::DataException("Invalid windows size", kSourcePath,
                                  "__cdecl kora::kubo::TileIterator::TileIterator(unsigned "
                                  "int,unsigned int,unsigned int,unsigned int)",
                                  61);
    }
    xEnd = AreaEnd(xOffset, xSize);
    yEnd = AreaEnd(yOffset, ySize);
    Cuthem(xSize / 4, ySize / 4);
}

unsigned int TileIterator::SetChunkSize(unsigned int tileXSize, unsigned int tileYSize) {
    return Cuthem(tileXSize, tileYSize);
}

unsigned int TileIterator::SetChunkSize(unsigned long pixelsPerTile) {
    if (pixelsPerTile == 0) {
        return 0;
    }
    const double count =
        std::ceil(static_cast<double>(yEnd) * xEnd / static_cast<double>(pixelsPerTile));
    // The count is an int: anything larger than INT_MAX tiles is no meaningful cut anyway.
    const int tileCount = count > INT_MAX ? INT_MAX : static_cast<int>(count);
    if (tileCount <= 0) {
        return 0;
    }
    return SetNumberOfTiles(static_cast<unsigned int>(tileCount));
}

unsigned int TileIterator::SetNumberOfTiles(unsigned int count) {
    if (count == 0) {
        return 0;
    }
    // Single precision throughout, as the sizes of this cut have always been computed.
    const float side = std::sqrt(static_cast<float>(count));
    return Cuthem(TileSizeFor(xEnd, side), TileSizeFor(yEnd, side));
}

unsigned int TileIterator::Cuthem(unsigned int tileXSize, unsigned int tileYSize) {
    if (tileXSize == 0) {
        tileXSize = xEnd;
    }
    if (tileYSize == 0) {
        tileYSize = yEnd;
    }
    // The count is known before the cut: one that its 32-bit indices cannot address is
    // refused, and the room for the rest is taken at once, so that a cut too large for
    // memory fails before it starts and keeps the previous one.
    const std::uint64_t count =
        TilesAlong(xStart, xEnd, tileXSize) * TilesAlong(yStart, yEnd, tileYSize);
    if (count > UINT_MAX) {
        throw kora::OutOfBoundsException(
            {detail::SaturatedInt(tileXSize), detail::SaturatedInt(tileYSize)},
            "A cut into " + std::to_string(count) + " tiles exceeds 4294967295 tiles", kSourcePath,
            "unsigned int __cdecl kora::kubo::TileIterator::Cuthem(unsigned int,unsigned int)", 0);
    }
    std::vector<Tile> cut;
    cut.reserve(static_cast<std::size_t>(count));
    // 64-bit positions: a step past xEnd near the top of the unsigned range must not wrap.
    for (unsigned long long y = yStart; y < yEnd; y += tileYSize) {
        const auto top = static_cast<unsigned int>(y);
        const unsigned int h = y + tileYSize >= yEnd ? yEnd - top : tileYSize;
        for (unsigned long long x = xStart; x < xEnd; x += tileXSize) {
            const auto left = static_cast<unsigned int>(x);
            const unsigned int w = x + tileXSize >= xEnd ? xEnd - left : tileXSize;
            cut.push_back(Tile{left, top, w, h});
        }
    }
    tiles.swap(cut);
    current = 0;
    return static_cast<unsigned int>(tiles.size());
}

Tile TileIterator::GetFirstTile() {
    current = 0;
    if (tiles.empty()) {
        return Tile{0, 0, 0, 0};
    }
    current = 1;
    return tiles.front();
}

Tile TileIterator::GetNextTile() {
    if (current < tiles.size()) {
        return tiles[current++];
    }
    return Tile{0, 0, 0, 0};
}

Tile TileIterator::GetTile(unsigned int index) {
    if (index >= tiles.size()) {
        throw kora::OutOfBoundsException(
            {0, static_cast<int>(tiles.size())}, "Tile number out of bounds", kSourcePath,
            "struct kora::kubo::Tile __cdecl kora::kubo::TileIterator::GetTile(unsigned int)", 211);
    }
    return tiles[index];
}

void TileIterator::SetCurrentTile(unsigned int index) {
    if (!IsDone()) {
        current = index;
    }
}

bool TileIterator::IsDone() const { return tiles.size() <= current; }

unsigned int TileIterator::GetTileIndex(unsigned int x, unsigned int y) const {
    unsigned int index = 0;
    for (const Tile& tile : tiles) {
        // Subtraction keeps the test exact for tiles that end at the top of the range.
        if (x >= tile.xOffset && x - tile.xOffset < tile.xSize && y >= tile.yOffset &&
            y - tile.yOffset < tile.ySize) {
            return index;
        }
        ++index;
    }
    return index;
}

unsigned int TileIterator::GetTileRange() const {
    return static_cast<unsigned int>(tiles.size()) - 1u;
}

bool TileIterator::Check(unsigned int width, unsigned int height) const {
    // The offset counts twice (once more inside the end); summed in 64 bits so it cannot wrap.
    return static_cast<unsigned long long>(xStart) + xEnd <= width &&
           static_cast<unsigned long long>(yStart) + yEnd <= height;
}

}  // namespace kora::kubo
