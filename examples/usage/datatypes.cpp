// Describing samples and rasters: descriptors, promotion, buffers with margins, tiles.
#include <vrkframework/basic/kubo/kubo.h>

using namespace kora::kubo;

int main() {
    // The common type of a 16-bit signed and a 16-bit unsigned band is 32-bit signed.
    const DataType common = PromoteType({DataType::Type16S, DataType::Type16U});

    // A 3-band 16U image of 1000 x 800 pixels with 2-pixel margins all around.
    const Raster raster(RasterInfo(1000, 800, 3, DataType::Type16U), RasterContext(2, 2, 0, 0));

    // Walk it in tiles of 256 x 256; the last column and row of tiles are narrower.
    TileIterator tiles(raster.width, raster.height);
    tiles.SetChunkSize(256u, 256u);
    unsigned int count = 0;
    for (Tile tile = tiles.GetFirstTile(); tile.xSize != 0; tile = tiles.GetNextTile()) {
        ++count;
    }
    return common == DataType::Type32S && raster.lineStride == 1004 && count == 16 ? 0 : 1;
}
