// Raster descriptions taken from a data source.
#include "vrkframework/basic/kubo/raster/rasterinfo.h"

#include "vrkframework/platform/rasterreader.h"

namespace kora::kubo {

RasterInfo::RasterInfo(const kora::datasources::IRasterReader& reader)
    : width(reader.GetWidth()),
      height(reader.GetHeight()),
      channels(reader.GetChannelCount()),
      dataType(reader.GetDataType()) {}

RasterInfo::~RasterInfo() = default;

}  // namespace kora::kubo
