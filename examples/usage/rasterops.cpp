// Whole-raster operations: margin filling and complex interpretation.
#include <vrkframework/basic/kubo/kubo.h>

#include <cstdint>
#include <cstring>
#include <memory>

using namespace kora::kubo;

int main() {
    // A 3 x 2 image with 1-pixel margins, mirrored into its margins.
    Raster image(RasterInfo(3, 2, 1, DataType::Type8U), RasterContext(1, 1, 0, 0));
    for (unsigned int y = 0; y < 2; ++y) {
        for (unsigned int x = 0; x < 3; ++x) {
            image.data[(y + 1) * image.lineStride + x + 1] = static_cast<unsigned char>(10 * y + x);
        }
    }
    FillRasterMargins(&image, MARGIN_MIRROR, MARGIN_ALL);
    const bool cornerMirrored = image.data[0] == image.data[image.lineStride + 1];

    // The amplitude of a complex 16-bit pixel (3, 4) is 5.
    Raster radar(RasterInfo(1, 1, 1, DataType::TypeC16S), RasterContext());
    const std::int16_t pair[] = {3, 4};
    std::memcpy(radar.data, pair, sizeof pair);
    const ComplexInterpretation interpretation;
    const std::unique_ptr<Raster> amplitude(
        interpretation.InterpretRaster(&radar, kora::core::INTERPRETATION_AMPLITUDE));
    float value;
    std::memcpy(&value, amplitude->data, sizeof value);

    return cornerMirrored && value == 5.0f ? 0 : 1;
}
