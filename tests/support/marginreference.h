// The margin filling rules written out pixel by pixel, for the margin filling tests and fuzz
// target.
#ifndef KUBO_TESTS_SUPPORT_MARGINREFERENCE_H
#define KUBO_TESTS_SUPPORT_MARGINREFERENCE_H

#include "vrkframework/basic/kubo/raster/marginfiller.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace kubo_test {

/// Fills the bands of `margins` of `r` by `behaviour` (1 zero, 2 mirror, 3 wrap) in band
/// order left, top, right, bottom, left and top with x outer, right and bottom with y outer,
/// byte by byte, pixels addressed by their bit offset divided by 8.
inline void ReferenceFillMargins(kora::kubo::Raster& r, int behaviour, unsigned int margins) {
    const long w = r.width, h = r.height, mx = r.xMargin, my = r.yMargin;
    const long bitsPerPixel = r.channels * r.dataType.bits * (r.dataType.isComplex ? 2 : 1);
    const long pixelBytes = r.channels * (r.dataType.bits / 8) * (r.dataType.isComplex ? 2 : 1);
    auto at = [&](long x, long y) {
        return r.data + ((my + y) * static_cast<long>(r.lineStride) + mx + x) * bitsPerPixel / 8;
    };
    // Each band below names, per target pixel, its mirror source and its wrap source.
    auto fill = [&](long x, long y, long mirrorX, long mirrorY, long wrapX, long wrapY) {
        for (long b = 0; b < pixelBytes; ++b) {
            at(x, y)[b] = behaviour == 1   ? 0
                          : behaviour == 2 ? at(mirrorX, mirrorY)[b]
                                           : at(wrapX, wrapY)[b];
        }
    };
    for (long x = -mx; (margins & MARGIN_LEFT) && x < 0; ++x) {
        for (long y = -my; y < h + my; ++y) {
            fill(x, y, -x - 1, (y >= 0 || my == 0) ? y : -y - 1, w + x, y < 0 ? y + h : y);
        }
    }
    for (long x = -mx; (margins & MARGIN_TOP) && x < w + mx; ++x) {
        for (long y = -my; y < 0; ++y) {
            fill(x, y, (x > 0 || mx == 0) ? x : -x - 1, -y - 1, x < 0 ? x + w : x, h + y);
        }
    }
    for (long y = -my; (margins & MARGIN_RIGHT) && y < h + my; ++y) {
        for (long x = w; x < w + mx; ++x) {
            fill(x, y, 2 * w - x - 1, (y > 0 || my == 0) ? y : -y - 1, x - w, y < 0 ? y + h : y);
        }
    }
    for (long y = h; (margins & MARGIN_BOTTOM) && y < h + my; ++y) {
        for (long x = -mx; x < w + mx; ++x) {
            fill(x, y, (x > 0 || mx == 0) ? x : -x - 1, 2 * h - y - 1, x < 0 ? x + w : x, y - h);
        }
    }
}

}  // namespace kubo_test

#endif  // KUBO_TESTS_SUPPORT_MARGINREFERENCE_H
