// Validity masks: one bit per pixel, 0 where the samples hold the no-data value.
#include <vrkframework/basic/kubo/kubo.h>

#include <memory>

using namespace kora::kubo;

int main() {
    Raster raster(RasterInfo(3, 1, 1, DataType::Type8U), RasterContext());
    raster.data[0] = 7;
    raster.data[1] = 0;  // no data
    raster.data[2] = 9;

    const MaskDecisionBuilder builder(0.0, BkgdAnyChan);
    const std::unique_ptr<Mask> mask(builder.BuildMask(raster));

    // Bits run most significant first: valid, background, valid.
    return mask->GetBits()[0] == 0xA0 && mask->GetBit(0) && !mask->GetBit(1) ? 0 : 1;
}
