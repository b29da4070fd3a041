// Tile cutting and walking.
#include "vrkframework/basic/kubo/raster/tileiterator.h"

#include <climits>  // INT_MAX
#include <cmath>    // std::ceil, std::sqrt

#include "vrkframework/platform/exception.h"

namespace kora::kubo {
namespace {

constexpr char kSourcePath[] = "vrkframework/basic/kubo/raster/tileiterator";

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
    : xEnd(xOffset + xSize), yEnd(yOffset + ySize), xStart(xOffset), yStart(yOffset), current(0) {
    if (xSize == 0 || ySize == 0) {
        throw kora::DataException("Invalid windows size", kSourcePath,
                                  "__cdecl kora::kubo::TileIterator::TileIterator(unsigned "
                                  "int,unsigned int,unsigned int,unsigned int)",
                                  61);
    }
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
    const auto tileXSize = static_cast<unsigned int>(std::ceil(static_cast<float>(xEnd) / side));
    const auto tileYSize = static_cast<unsigned int>(std::ceil(static_cast<float>(yEnd) / side));
    return Cuthem(tileXSize, tileYSize);
}

unsigned int TileIterator::Cuthem(unsigned int tileXSize, unsigned int tileYSize) {
    if (tileXSize == 0) {
        tileXSize = xEnd;
    }
    if (tileYSize == 0) {
        tileYSize = yEnd;
    }
    current = 0;
    tiles.clear();
    // 64-bit positions: a step past xEnd near the top of the unsigned range must not wrap.
    for (unsigned long long y = yStart; y < yEnd; y += tileYSize) {
        const auto top = static_cast<unsigned int>(y);
        const unsigned int h = y + tileYSize >= yEnd ? yEnd - top : tileYSize;
        for (unsigned long long x = xStart; x < xEnd; x += tileXSize) {
            const auto left = static_cast<unsigned int>(x);
            const unsigned int w = x + tileXSize >= xEnd ? xEnd - left : tileXSize;
            tiles.push_back(Tile{left, top, w, h});
        }
    }
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
