// The interface of the in-memory compressed rasters: decoding whole or by window.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_ICOMPRESSEDDATA_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_ICOMPRESSEDDATA_H

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/raster/rasterinfo.h"

namespace kora::kubo {

/// A raster held compressed in memory. What a window's arguments count (pixels or bytes)
/// and how its rows are laid out is up to each implementation. Buffers returned by the
/// allocating overloads belong to the caller, who frees them with `delete[]`.
class KUBO_API ICompressedData : public RasterInfo {
public:
    ~ICompressedData() override;

    /// Decodes the whole raster into a new buffer.
    virtual unsigned char* Decode() const = 0;
    /// Decodes a window into a new buffer sized for the whole raster.
    virtual unsigned char* Decode(int x, int y, int w, int h) const = 0;
    /// Decodes a window into `out`, its rows packed one after the other.
    virtual void Decode(int x, int y, int w, int h, unsigned char* out) const = 0;
    /// Decodes the whole raster into `out`.
    virtual void Decode(unsigned char* out) const = 0;

protected:
    ICompressedData() = default;

    /// @name Copying
    ///@{

    /// Copies the inherited RasterInfo part; only implementations copy.
    ICompressedData(const ICompressedData&) = default;
    ICompressedData& operator=(const ICompressedData&) = default;
    ICompressedData(ICompressedData&&) = default;
    ICompressedData& operator=(ICompressedData&&) = default;
    ///@}
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_ICOMPRESSEDDATA_H
