// Margins around an image and its place in the whole source image.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_RASTERCONTEXT_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_RASTERCONTEXT_H

namespace kora::kubo {

/// Margins of a buffer (extra pixels on each side) and the position of the image's
/// first pixel in the coordinate frame of the whole source image.
class RasterContext {
public:
    /// No margins, at the origin.
    constexpr RasterContext() : xMargin(0), yMargin(0), xOffset(0), yOffset(0) {}
    /// Takes the four fields in declaration order.
    constexpr RasterContext(unsigned int xMargin_, unsigned int yMargin_, unsigned int xOffset_,
                            unsigned int yOffset_)
        : xMargin(xMargin_), yMargin(yMargin_), xOffset(xOffset_), yOffset(yOffset_) {}

    unsigned int xMargin;  ///< extra pixels left and right of every line
    unsigned int yMargin;  ///< extra lines above the first line and below the last
    unsigned int xOffset;  ///< column of the first image pixel in the source frame
    unsigned int yOffset;  ///< row of the first image pixel in the source frame
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_RASTERCONTEXT_H
