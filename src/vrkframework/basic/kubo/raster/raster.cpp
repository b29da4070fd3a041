// Raster buffers: size arithmetic and ownership.
#include "vrkframework/basic/kubo/raster/raster.h"

#include <cstring>  // std::memcpy
#include <utility>  // std::move

namespace kora::kubo {

Raster::Raster() : lineStride(0), bufferHeight(0), data(nullptr), byteSize(0), ownsData(false) {}

Raster::Raster(const RasterInfo& info, const RasterContext& context)
    : RasterInfo(info),
      RasterContext(context),
      lineStride(info.width + 2 * context.xMargin),
      bufferHeight(info.height + 2 * context.yMargin),
      data(nullptr),
      byteSize(0),
      ownsData(true) {
    // The per-sample byte count rounds up, so a 1U raster gets one byte per sample.
    const std::uint64_t sampleBytes = (info.dataType.bits + 7u) / 8u;
    byteSize = sampleBytes * (info.dataType.isComplex ? 2u : 1u) * bufferHeight * lineStride *
               info.channels;
    data = new unsigned char[byteSize];
}

Raster::Raster(const Raster& other)
    : RasterInfo(other),
      RasterContext(other),
      lineStride(other.lineStride),
      bufferHeight(other.bufferHeight),
      data(other.data),
      byteSize(other.byteSize),
      ownsData(false) {
    // A wrapped buffer stays someone else's and the copy wraps it too; an owned one is
    // duplicated, so each raster frees only its own.
    if (other.ownsData && other.data != nullptr) {
        data = new unsigned char[byteSize];
        std::memcpy(data, other.data, byteSize);
        ownsData = true;
    }
}

Raster& Raster::operator=(const Raster& other) {
    if (this != &other) {
        // Allocate before releasing, so a failed allocation leaves this raster intact.
        Raster copy(other);
        *this = std::move(copy);
    }
    return *this;
}

Raster::Raster(Raster&& other) noexcept
    : RasterInfo(other),
      RasterContext(other),
      lineStride(other.lineStride),
      bufferHeight(other.bufferHeight),
      data(other.data),
      byteSize(other.byteSize),
      ownsData(other.ownsData) {
    other.data = nullptr;
    other.ownsData = false;
}

Raster& Raster::operator=(Raster&& other) noexcept {
    if (this != &other) {
        Release();
        RasterInfo::operator=(other);
        RasterContext::operator=(other);
        lineStride = other.lineStride;
        bufferHeight = other.bufferHeight;
        data = other.data;
        byteSize = other.byteSize;
        ownsData = other.ownsData;
        other.data = nullptr;
        other.ownsData = false;
    }
    return *this;
}

Raster::~Raster() { Release(); }

void Raster::Release() noexcept {
    if (data != nullptr && ownsData) {
        delete[] data;
    }
    data = nullptr;
    ownsData = false;
}

}  // namespace kora::kubo
