// The extent of a raster's buffer in 64-bit pixels, bits and bytes, saturating instead of
// wrapping, and what its consumers may read of it (private to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_BUFFEREXTENT_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_BUFFEREXTENT_H

#include <cstdint>  // std::uint64_t
#include <limits>

#include "vrkframework/basic/kubo/raster/raster.h"

namespace kora::kubo::detail {

constexpr std::uint64_t kUnbounded = std::numeric_limits<std::uint64_t>::max();

/// a x b, or kUnbounded when the product does not fit in 64 bits.
constexpr std::uint64_t SaturatingProduct(std::uint64_t a, std::uint64_t b) {
    return a != 0 && b > kUnbounded / a ? kUnbounded : a * b;
}

/// size + 2 x margin: a full line or column count, exact for any 32-bit inputs.
constexpr std::uint64_t FullExtent(unsigned int size, unsigned int margin) {
    return std::uint64_t{size} + 2 * std::uint64_t{margin};
}

/// `value` as an int for an exception's values, INT_MAX when larger.
constexpr int SaturatedInt(std::uint64_t value) {
    return value > static_cast<std::uint64_t>(std::numeric_limits<int>::max())
               ? std::numeric_limits<int>::max()
               : static_cast<int>(value);
}

/// Pixels of the full extent, margins included, from the raster's own fields.
inline std::uint64_t BufferPixels(const RasterInfo& info, const RasterContext& context) {
    return SaturatingProduct(FullExtent(info.width, context.xMargin),
                             FullExtent(info.height, context.yMargin));
}

/// Bits of one pixel: channels x bits x (2 if complex).
inline std::uint64_t PixelBits(const RasterInfo& info) {
    return std::uint64_t{info.channels} * info.dataType.bits * (info.dataType.isComplex ? 2 : 1);
}

/// Bytes of one sample as the raster constructor lays them out: (bits + 7) / 8 per
/// component.
inline std::uint64_t SampleBytes(const DataType& type) {
    return (std::uint64_t{type.bits} + 7) / 8 * (type.isComplex ? 2 : 1);
}

/// a + b, or kUnbounded when the sum does not fit in 64 bits.
constexpr std::uint64_t SaturatingSum(std::uint64_t a, std::uint64_t b) {
    return b > kUnbounded - a ? kUnbounded : a + b;
}

/// The first byte of buffer pixel (x, y), counted from the top-left margin pixel along
/// `lineStride`: the bit offset divided by 8, saturating.
inline std::uint64_t PixelByte(const Raster& raster, std::uint64_t x, std::uint64_t y) {
    const std::uint64_t pixel = SaturatingSum(SaturatingProduct(y, raster.lineStride), x);
    const std::uint64_t bit = SaturatingProduct(pixel, PixelBits(raster));
    return bit == kUnbounded ? kUnbounded : bit / 8;
}

/// The bytes a raster's buffer holds: none without a buffer; `byteSize` when the raster
/// owns its buffer or states its size; otherwise, for a raster wrapping a buffer by hand,
/// the extent its description lays out, which its owner vouches for.
inline std::uint64_t BufferBytes(const Raster& raster) {
    if (raster.data == nullptr) {
        return 0;
    }
    if (raster.ownsData || raster.byteSize != 0) {
        return raster.byteSize;
    }
    return SaturatingProduct(SaturatingProduct(BufferPixels(raster, raster), raster.channels),
                             SampleBytes(raster.dataType));
}

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_BUFFEREXTENT_H
