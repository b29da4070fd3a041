// An image in memory: its description, its margins and the buffer holding both.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_RASTER_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_RASTER_H

#include <cstdint>  // std::uint64_t

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/raster/rastercontext.h"
#include "vrkframework/basic/kubo/raster/rasterinfo.h"

namespace kora::kubo {

/// A pixel-interleaved buffer of `bufferHeight` lines of `lineStride` pixels, margins
/// included; the image proper starts at line yMargin, column xMargin. A complex sample
/// is its real component followed by its imaginary one.
///
/// Ownership: when `ownsData` is set the raster frees `data` (array delete) on
/// destruction. A copy of an owning raster owns a copy of the buffer; a copy of a
/// wrapping raster wraps the same buffer. Moving transfers ownership.
class KUBO_API Raster : public RasterInfo, public RasterContext {
public:
    /// Every field zero, `data` null, `ownsData` false: ready to wrap a foreign buffer.
    Raster();
    /// Allocates an uninitialised buffer of ((bits + 7) / 8) x (2 if complex) x
    /// bufferHeight x lineStride x channels bytes and owns it.
    /// @throws kora::OutOfBoundsException "A raster of W x H pixels (margins included)
    ///   exceeds 4294967295 pixels a side" (or "... exceeds 2^64 bytes"), values {W, H}
    ///   saturated to INT_MAX, before anything is allocated.
    Raster(const RasterInfo& info, const RasterContext& context);

    /// @name Copying
    ///@{

    /// Copying and moving; no buffer is ever freed twice. A copy of an owning raster owns a
    /// new copy of the buffer (assignment allocates it before releasing its own); a copy of
    /// a wrapping raster wraps the same buffer. Moving hands the buffer and its ownership
    /// over and leaves the source's `data` null and `ownsData` false.
    Raster(const Raster& other);
    Raster& operator=(const Raster& other);
    Raster(Raster&& other) noexcept;
    Raster& operator=(Raster&& other) noexcept;
    ///@}

    ~Raster() override;

    unsigned int lineStride;    ///< pixels per buffer line: width + 2 x xMargin
    unsigned int bufferHeight;  ///< buffer lines: height + 2 x yMargin
    unsigned char* data;        ///< the top-left margin pixel
    std::uint64_t byteSize;     ///< bytes of the buffer
    bool ownsData;              ///< whether the destructor frees `data`

private:
    void Release() noexcept;
};

/// A raster over a buffer its caller owns and keeps alive: `data` holds the full extent,
/// ((bits + 7) / 8) x (2 if complex) x channels bytes a pixel, (height + 2 x yMargin) lines
/// of width + 2 x xMargin pixels, starting with the top-left margin pixel. Every field is
/// set as Raster(info, context) sets it (line stride, buffer height, byte size, margins,
/// offsets), except that nothing is allocated and `ownsData` is false.
/// @throws kora::OutOfBoundsException as Raster(info, context) does.
KUBO_API Raster WrapRaster(unsigned char* data, const RasterInfo& info,
                           const RasterContext& context);

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_RASTER_H
