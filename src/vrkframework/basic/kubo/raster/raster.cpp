// Raster buffers: size arithmetic and ownership.
#include "vrkframework/basic/kubo/raster/raster.h"

#include <cstdint>  // UINT32_MAX
#include <cstring>  // std::memcpy
#include <string>   // std::to_string
#include <utility>  // std::move

#include "vrkframework/basic/kubo/raster/bufferextent.h"
#include "vrkframework/platform/exception.h"

namespace kora::kubo {
namespace {

constexpr char kSourcePath[] = "vrkframework/basic/kubo/raster/raster";

// The byte count of the buffer, checked before anything is set: the line stride and the
// buffer height are 32-bit fields, so a larger full extent (most often a negative margin
// cast to unsigned) has no consistent description, nor has a byte count beyond 64 bits.
std::uint64_t CheckedByteSize(const RasterInfo& info, const RasterContext& context,
                              const char* function) {
    const std::uint64_t fullWidth = detail::FullExtent(info.width, context.xMargin);
    const std::uint64_t fullHeight = detail::FullExtent(info.height, context.yMargin);
    const std::uint64_t bytes = detail::SaturatingProduct(
        detail::SaturatingProduct(detail::BufferPixels(info, context), info.channels),
        detail::SampleBytes(info.dataType));
    const std::string extent = "A raster of " + std::to_string(fullWidth) + " x " +
                               std::to_string(fullHeight) + " pixels (margins included)";
    const char* limit = fullWidth > UINT32_MAX || fullHeight > UINT32_MAX
                            ? " exceeds 4294967295 pixels a side"
                        : bytes == detail::kUnbounded ? " exceeds 2^64 bytes"
                                                      : nullptr;
    if (limit != nullptr) {
        throw kora::OutOfBoundsException(
            {detail::SaturatedInt(fullWidth), detail::SaturatedInt(fullHeight)}, extent + limit,
            kSourcePath, function, 0);
    }
    return bytes;
}

}  // namespace

Raster::Raster() : lineStride(0), bufferHeight(0), data(nullptr), byteSize(0), ownsData(false) {}

Raster::Raster(const RasterInfo& info, const RasterContext& context)
    : RasterInfo(info),
      RasterContext(context),
      lineStride(0),
      bufferHeight(0),
      data(nullptr),
      // The per-sample byte count rounds up, so a 1U raster gets one byte per sample.
      byteSize(
          CheckedByteSize(info, context,
                          "__cdecl kora::kubo::Raster::Raster(const class "
                          "kora::kubo::RasterInfo &,const class kora::kubo::RasterContext &)")),
      ownsData(true) {
    lineStride = info.width + 2 * context.xMargin;
    bufferHeight = info.height + 2 * context.yMargin;
    data = new unsigned char[byteSize];
}

Raster WrapRaster(unsigned char* data, const RasterInfo& info, const RasterContext& context) {
    Raster raster;
    static_cast<RasterInfo&>(raster) = info;
    static_cast<RasterContext&>(raster) = context;
    raster.byteSize = CheckedByteSize(
        info, context,
        "class kora::kubo::Raster __cdecl kora::kubo::WrapRaster(unsigned char *,const class "
        "kora::kubo::RasterInfo &,const class kora::kubo::RasterContext &)");
    raster.lineStride = info.width + 2 * context.xMargin;
    raster.bufferHeight = info.height + 2 * context.yMargin;
    raster.data = data;
    return raster;
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

// The description records are plain values: copying them is moving them.
Raster::Raster(Raster&& other) noexcept
    // NOLINTNEXTLINE(performance-move-constructor-init)
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
