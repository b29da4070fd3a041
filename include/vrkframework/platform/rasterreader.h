// The data-source view of a raster: its size, channel count and sample type.
#ifndef VRKFRAMEWORK_PLATFORM_RASTERREADER_H
#define VRKFRAMEWORK_PLATFORM_RASTERREADER_H

#include "vrkframework/platform/platformapi.h"

namespace kora::kubo {
struct DataType;
}

namespace kora::datasources {

/// A readable raster source, queried for its description.
class KORA_PLATFORM_API IRasterReader {
public:
    virtual ~IRasterReader();
    virtual unsigned int GetWidth() const = 0;
    virtual unsigned int GetHeight() const = 0;
    virtual unsigned int GetChannelCount() const = 0;
    virtual const kora::kubo::DataType& GetDataType() const = 0;
};

}  // namespace kora::datasources

#endif  // VRKFRAMEWORK_PLATFORM_RASTERREADER_H
