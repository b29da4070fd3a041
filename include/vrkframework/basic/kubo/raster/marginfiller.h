// Filling the margins of a raster in place from its own pixels.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_MARGINFILLER_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_MARGINFILLER_H

#include <cstdint>  // std::uint32_t

#include "vrkframework/basic/kubo/kuboapi.h"

/// How margin pixels are made. The fixed 32-bit underlying type makes every value a caller
/// passes a valid enumeration value, so values outside the list can be rejected.
enum eMarginBehaviour : std::uint32_t {
    MARGIN_ZERO = 1,    ///< every byte set to 0
    MARGIN_MIRROR = 2,  ///< reflection about the image edge, the edge pixel repeated first
    MARGIN_WRAP = 3     ///< periodic continuation: the image repeats on the other side
};

/// The bands of FillRasterMargins' band set; any other bit is ignored.
enum eMarginBand : std::uint32_t {
    MARGIN_RIGHT = 1,   ///< columns [width, width + xMargin), all buffer lines
    MARGIN_LEFT = 2,    ///< columns [-xMargin, 0), all buffer lines
    MARGIN_TOP = 4,     ///< lines [-yMargin, 0), all buffer columns
    MARGIN_BOTTOM = 8,  ///< lines [height, height + yMargin), all buffer columns
    MARGIN_ALL = 15
};

namespace kora::kubo {

class Raster;

/// Fills the bands of `margins` (eMarginBand bits) of `raster` by `behaviour`, in place.
///
/// Bands are filled in the order left, top, right, bottom, each finished before the next;
/// corners belong to two bands. Mirror and wrap read some source pixels that lie in margins,
/// and those hold what earlier bands of the same call wrote, or what the buffer held:
/// - mirror: left takes column -x - 1 (line y, or -y - 1 above the image); top takes line
///   -y - 1 and bottom line 2 height - y - 1, both at column x, or -x - 1 for x <= 0; right
///   takes column 2 width - x - 1 at line y, or -y - 1 for y <= 0 (0-wide margins keep the
///   coordinate). With all bands this is the plain reflection; with some, line or column 0
///   of the right, top and bottom bands reads the neighbouring margin.
/// - wrap: left takes column width + x and right column x - width, at line y, or y + height
///   above the image; top takes line height + y and bottom y - height, at column x, or
///   x + width left of the image.
/// A pixel is channels x (bits / 8) x (2 if complex) bytes, so a 1U raster is left as it
/// is. Margins wider than the image are not checked (mirror and wrap then read beyond the
/// image proper, within the buffer); the raster's fields must describe its buffer. A null
/// raster or buffer is left alone.
/// @throws kora::Exception "Invalid margin behavior requested." for a behaviour other than
///   1, 2 or 3, before anything is written.
KUBO_API void FillRasterMargins(Raster* const raster, eMarginBehaviour behaviour,
                                unsigned int margins);

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_MARGINFILLER_H
