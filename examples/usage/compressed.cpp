// Run-length compressed masks, decoded whole or by window.
#include <vrkframework/basic/kubo/kubo.h>

#include <cstring>

using namespace kora::kubo;

int main() {
    Raster flags(RasterInfo(300, 2, 1, DataType::Type8U), RasterContext());
    std::memset(flags.data, 1, flags.byteSize);  // every pixel set
    flags.data[310] = 0;

    // Each row is its own run stream: row 0 is the runs 0, 255, 0, 45.
    const LineRLECompressedBitMask mask(flags);

    unsigned char window[4];
    mask.Decode(8, 1, 4, 1, window);  // pixels 8 to 11 of row 1
    const bool ok = mask.GetCompressedRowSize(0) == 4 && window[1] == 1 && window[2] == 0;
    return ok ? 0 : 1;
}
