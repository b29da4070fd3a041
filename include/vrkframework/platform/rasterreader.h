// The data-source view of a raster: its size, channel count and sample type.
#ifndef VRKFRAMEWORK_PLATFORM_RASTERREADER_H
#define VRKFRAMEWORK_PLATFORM_RASTERREADER_H

#include "vrkframework/platform/platformapi.h"

namespace kora::kubo {
struct DataType;
}

/// The framework's raster sources, as far as the library reads them.
namespace kora::datasources {

/// A readable raster source, queried for its description.
class KORA_PLATFORM_API IRasterReader {
public:
    virtual ~IRasterReader();
    /// Pixels per line.
    virtual unsigned int GetWidth() const = 0;
    /// Number of lines.
    virtual unsigned int GetHeight() const = 0;
    /// Samples per pixel.
    virtual unsigned int GetChannelCount() const = 0;
    /// Type of one sample.
    virtual const kora::kubo::DataType& GetDataType() const = 0;

protected:
    IRasterReader() = default;
    /// @name Copying
    ///@{

    /// For implementations, which copy and move as they see fit.
    IRasterReader(const IRasterReader&) = default;
    IRasterReader& operator=(const IRasterReader&) = default;
    IRasterReader(IRasterReader&&) = default;
    IRasterReader& operator=(IRasterReader&&) = default;
    ///@}
};

}  // namespace kora::datasources

#endif  // VRKFRAMEWORK_PLATFORM_RASTERREADER_H
