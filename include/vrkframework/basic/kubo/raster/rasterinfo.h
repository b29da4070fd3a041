// What an image is: its size, channel count and sample type.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_RASTERINFO_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_RASTERINFO_H

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/raster/datatype.h"

namespace kora::datasources {
class IRasterReader;
}

namespace kora::kubo {

/// Size, channel count and sample type of an image proper (margins excluded).
class KUBO_API RasterInfo {
public:
    /// Every field zero, the data type included.
    RasterInfo() : width(0), height(0), channels(0) {}
    /// Takes the four fields in declaration order.
    RasterInfo(unsigned int width_, unsigned int height_, unsigned int channels_,
               const DataType& dataType_)
        : width(width_), height(height_), channels(channels_), dataType(dataType_) {}
    /// Asks the reader for its width, height, channel count and data type, in that order.
    RasterInfo(const kora::datasources::IRasterReader& reader);  // NOLINT: a description of it

    /// @name Copying
    ///@{

    /// Copies the four fields.
    RasterInfo(const RasterInfo&) = default;
    RasterInfo& operator=(const RasterInfo&) = default;
    RasterInfo(RasterInfo&&) = default;
    RasterInfo& operator=(RasterInfo&&) = default;
    ///@}

    virtual ~RasterInfo();

    unsigned int width;     ///< pixels per line of the image proper
    unsigned int height;    ///< lines of the image proper
    unsigned int channels;  ///< samples per pixel
    DataType dataType;      ///< type of one sample
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_RASTERINFO_H
