// Margin filling: the band order, the per-band source rules, and block copies wherever a
// band's rule makes its pixels contiguous.
#include "vrkframework/basic/kubo/raster/marginfiller.h"

#include <cstddef>  // std::ptrdiff_t, std::size_t
#include <cstdint>  // std::uint64_t
#include <cstring>  // std::memcpy, std::memset

#include "vrkframework/basic/kubo/raster/raster.h"
#include "vrkframework/platform/exception.h"

namespace kora::kubo {
namespace {

constexpr char kSourcePath[] = "vrkframework/basic/kubo/raster/marginfiller";
constexpr char kSignature[] =
    "void __cdecl kora::kubo::FillRasterMargins(class kora::kubo::Raster *const ,enum "
    "eMarginBehaviour,unsigned int)";

using Index = std::ptrdiff_t;

enum class Band { kLeft, kTop, kRight, kBottom };

struct BandBit {
    Band band;
    unsigned int bit;
};

// The fill order. Mirror and wrap read margin pixels, so a band sees what the bands before
// it wrote in the same call.
constexpr BandBit kBandOrder[] = {{Band::kLeft, MARGIN_LEFT},
                                  {Band::kTop, MARGIN_TOP},
                                  {Band::kRight, MARGIN_RIGHT},
                                  {Band::kBottom, MARGIN_BOTTOM}};

struct Point {
    Index x;
    Index y;
};

// A raster seen in signed pixel coordinates: the image proper is [0, width) x [0, height),
// the buffer [-xMargin, width + xMargin) x [-yMargin, height + yMargin).
class Layout {
public:
    explicit Layout(const Raster& raster)
        : width(raster.width),
          height(raster.height),
          xMargin(raster.xMargin),
          yMargin(raster.yMargin),
          pixelBytes(static_cast<Index>(raster.channels) * (raster.dataType.bits / 8) *
                     (raster.dataType.isComplex ? 2 : 1)),
          m_data(raster.data),
          m_lineStride(raster.lineStride),
          m_pixelBits(std::uint64_t{raster.channels} * raster.dataType.bits *
                      (raster.dataType.isComplex ? 2u : 1u)),
          m_lineBytes(m_lineStride * pixelBytes),
          m_origin(m_data + (yMargin * m_lineStride + xMargin) * pixelBytes) {}

    // Pixel starts are multiples of the pixel size unless samples are packed bits.
    bool IsWholeBytes() const { return m_pixelBits == static_cast<std::uint64_t>(pixelBytes) * 8; }

    // Pixel (x, y) of a whole-byte layout.
    unsigned char* At(Index x, Index y) const {
        return m_origin + y * m_lineBytes + x * pixelBytes;
    }
    // Pixel (x, y) of any layout: the bit offset is formed first and divided by 8 last.
    unsigned char* PackedAt(Point point) const {
        const auto pixel =
            static_cast<std::uint64_t>((yMargin + point.y) * m_lineStride + xMargin + point.x);
        return m_data + pixel * m_pixelBits / 8;
    }
    std::size_t Bytes(Index pixels) const { return static_cast<std::size_t>(pixels * pixelBytes); }

    const Index width;
    const Index height;
    const Index xMargin;
    const Index yMargin;
    const Index pixelBytes;

private:
    unsigned char* const m_data;
    const Index m_lineStride;
    const std::uint64_t m_pixelBits;
    const Index m_lineBytes;
    unsigned char* const m_origin;
};

// Source rules, pixel by pixel. The comparisons differ between bands on purpose: the left
// band keeps line 0, while the other bands send line or column 0 to the neighbouring margin
// pixel at -1 (which holds the reflection of 0 once the earlier bands are filled).
Point MirrorSource(Band band, const Layout& layout, Index x, Index y) {
    const Index column = x > 0 || layout.xMargin == 0 ? x : -x - 1;
    switch (band) {
        case Band::kLeft:
            return {-x - 1, y >= 0 || layout.yMargin == 0 ? y : -y - 1};
        case Band::kTop:
            return {column, -y - 1};
        case Band::kRight:
            return {2 * layout.width - x - 1, y > 0 || layout.yMargin == 0 ? y : -y - 1};
        case Band::kBottom:
            break;
    }
    return {column, 2 * layout.height - y - 1};
}

Point WrapSource(Band band, const Layout& layout, Index x, Index y) {
    const Index line = y < 0 ? y + layout.height : y;
    const Index column = x < 0 ? x + layout.width : x;
    switch (band) {
        case Band::kLeft:
            return {layout.width + x, line};
        case Band::kTop:
            return {column, layout.height + y};
        case Band::kRight:
            return {x - layout.width, line};
        case Band::kBottom:
            break;
    }
    return {column, y - layout.height};
}

// Pixel by pixel in the loop order that settles the order-dependent reads (left and top:
// x outer, right and bottom: y outer), for what the line rules cannot express: packed samples,
// whose pixel starts are no multiples of the pixel size, and margins wider than the image, where a
// band may read pixels it has just written and the side bands read each other.
void FillBandPerPixel(const Layout& layout, Band band, eMarginBehaviour behaviour) {
    const auto pixelBytes = static_cast<std::size_t>(layout.pixelBytes);
    auto fill = [&](Index x, Index y) {
        unsigned char* target = layout.PackedAt({x, y});
        if (behaviour == MARGIN_ZERO) {
            std::memset(target, 0, pixelBytes);
            return;
        }
        const Point from = behaviour == MARGIN_MIRROR ? MirrorSource(band, layout, x, y)
                                                      : WrapSource(band, layout, x, y);
        // Byte by byte: with an empty image, wrap copies a pixel onto itself.
        const unsigned char* source = layout.PackedAt(from);
        for (std::size_t byte = 0; byte < pixelBytes; ++byte) {
            target[byte] = source[byte];
        }
    };
    const Index top = -layout.yMargin;
    const Index bottom = layout.height + layout.yMargin;
    const Index left = -layout.xMargin;
    const Index right = layout.width + layout.xMargin;
    switch (band) {
        case Band::kLeft:
            for (Index x = left; x < 0; ++x) {
                for (Index y = top; y < bottom; ++y) {
                    fill(x, y);
                }
            }
            break;
        case Band::kTop:
            for (Index x = left; x < right; ++x) {
                for (Index y = top; y < 0; ++y) {
                    fill(x, y);
                }
            }
            break;
        case Band::kRight:
            for (Index y = top; y < bottom; ++y) {
                for (Index x = layout.width; x < right; ++x) {
                    fill(x, y);
                }
            }
            break;
        case Band::kBottom:
            for (Index y = layout.height; y < bottom; ++y) {
                for (Index x = left; x < right; ++x) {
                    fill(x, y);
                }
            }
            break;
    }
}

// Reverses the bytes of a word; compilers turn it into one byte-swap instruction.
constexpr std::uint64_t ReverseBytes(std::uint64_t word) {
    word = ((word & 0x00FF00FF00FF00FFull) << 8) | ((word >> 8) & 0x00FF00FF00FF00FFull);
    word = ((word & 0x0000FFFF0000FFFFull) << 16) | ((word >> 16) & 0x0000FFFF0000FFFFull);
    return (word << 32) | (word >> 32);
}

// Copies `count` pixels reversed: target pixel count - 1 - i takes source pixel i. A fixed
// pixel size makes each pixel one move and lets the compiler vectorise the reversal; a
// kPixelBytes of 0 reads the size at run time.
template <std::size_t kPixelBytes>
void ReverseCopy(unsigned char* target, const unsigned char* source, std::size_t count,
                 std::size_t pixelBytes) {
    const std::size_t size = kPixelBytes != 0 ? kPixelBytes : pixelBytes;
    std::size_t i = 0;
    if constexpr (kPixelBytes == 1) {
        // One-byte pixels go eight at a time through a byte swap.
        for (; i + 8 <= count; i += 8) {
            std::uint64_t word;
            std::memcpy(&word, source + i, 8);
            word = ReverseBytes(word);
            std::memcpy(target + (count - 8 - i), &word, 8);
        }
    }
    for (; i < count; ++i) {
        std::memcpy(target + (count - 1 - i) * size, source + i * size, size);
    }
}

// The line rules below each fill one line of one band with block copies. They hold for
// margins no wider than the image, where no band reads a pixel it writes itself. Each keeps
// its own copy of the layout, which byte stores then cannot alias.

// Zero: every byte of the band's part of the line.
class ZeroRules {
public:
    explicit ZeroRules(const Layout& layout) : m_layout(layout) {}
    void Left(Index y) const { Clear(-m_layout.xMargin, y, m_layout.xMargin); }
    void Right(Index y) const { Clear(m_layout.width, y, m_layout.xMargin); }
    void Top(Index y) const { Clear(-m_layout.xMargin, y, m_layout.width + 2 * m_layout.xMargin); }
    void Bottom(Index y) const { Top(y); }

private:
    void Clear(Index x, Index y, Index pixels) const {
        std::memset(m_layout.At(x, y), 0, m_layout.Bytes(pixels));
    }
    const Layout m_layout;
};

// Mirror: a side line reverses xMargin pixels; a top or bottom line takes the columns from 1
// on as they are and reverses the xMargin + 1 pixels from column -1 on into columns 0 down
// to -xMargin (column 0 thus reads the left margin).
template <std::size_t kPixelBytes>
class MirrorRules {
public:
    explicit MirrorRules(const Layout& layout) : m_layout(layout) {}
    void Left(Index y) const {
        Reverse(m_layout.At(-m_layout.xMargin, y), m_layout.At(0, y >= 0 ? y : -y - 1),
                m_layout.xMargin);
    }
    void Right(Index y) const {
        const Index line = y > 0 || m_layout.yMargin == 0 ? y : -y - 1;
        Reverse(m_layout.At(m_layout.width, y),
                m_layout.At(m_layout.width - m_layout.xMargin, line), m_layout.xMargin);
    }
    void Top(Index y) const { Across(y, -y - 1); }
    void Bottom(Index y) const { Across(y, 2 * m_layout.height - y - 1); }

private:
    void Across(Index y, Index from) const {
        const Index xMargin = m_layout.xMargin;
        if (xMargin == 0) {
            std::memcpy(m_layout.At(0, y), m_layout.At(0, from), m_layout.Bytes(m_layout.width));
            return;
        }
        std::memcpy(m_layout.At(1, y), m_layout.At(1, from),
                    m_layout.Bytes(m_layout.width + xMargin - 1));
        Reverse(m_layout.At(-xMargin, y), m_layout.At(-1, from), xMargin + 1);
    }
    void Reverse(unsigned char* target, const unsigned char* source, Index count) const {
        ReverseCopy<kPixelBytes>(target, source, static_cast<std::size_t>(count),
                                 static_cast<std::size_t>(m_layout.pixelBytes));
    }
    const Layout m_layout;
};

// Copies a short run of bytes between disjoint places in 16-byte moves (the last one may
// overlap the one before). Side runs start at the same offset in every line, so these moves
// stay within cache lines where a library copy's wider moves would straddle two.
void CopyShortRun(unsigned char* target, const unsigned char* source, std::size_t bytes) {
    constexpr std::size_t kMove = 16;
    if (bytes < kMove) {
        std::memcpy(target, source, bytes);
        return;
    }
    for (std::size_t i = 0;; i += kMove) {
        const std::size_t at = i + kMove <= bytes ? i : bytes - kMove;
        unsigned char move[kMove];
        std::memcpy(move, source + at, kMove);
        std::memcpy(target + at, move, kMove);
        if (at + kMove == bytes) {
            return;
        }
    }
}

// Wrap: a side line copies xMargin pixels from the other side of the image (lines above the
// image from its last lines); a top or bottom line copies its left margin from the image's
// last columns and the rest of the line, right margin included, as it stands.
class WrapRules {
public:
    explicit WrapRules(const Layout& layout) : m_layout(layout) {}
    void Left(Index y) const {
        Run(-m_layout.xMargin, y, m_layout.width - m_layout.xMargin, Line(y));
    }
    void Right(Index y) const { Run(m_layout.width, y, 0, Line(y)); }
    void Top(Index y) const { Across(y, y + m_layout.height); }
    void Bottom(Index y) const { Across(y, y - m_layout.height); }

private:
    Index Line(Index y) const { return y < 0 ? y + m_layout.height : y; }
    // xMargin pixels from (fromX, fromY) on to (x, y) on.
    void Run(Index x, Index y, Index fromX, Index fromY) const {
        CopyShortRun(m_layout.At(x, y), m_layout.At(fromX, fromY),
                     m_layout.Bytes(m_layout.xMargin));
    }
    void Across(Index y, Index from) const {
        const Index xMargin = m_layout.xMargin;
        Run(-xMargin, y, m_layout.width - xMargin, from);
        std::memcpy(m_layout.At(0, y), m_layout.At(0, from),
                    m_layout.Bytes(m_layout.width + xMargin));
    }
    const Layout m_layout;
};

// Runs the line rules of the requested bands in an order that gives the result of filling
// left, top, right and bottom one after the other, but passes down the buffer once for both
// side bands:
// 1. left on lines [-yMargin, yMargin), whose column -1 the mirrored top band reads and whose
//    corners it overwrites;
// 2. top;
// 3. every line from the top: right, and left from line yMargin on. The side bands never
//    read each other's pixels, and the top band neither reads nor writes the lower left
//    lines; the right band must follow the top band, which reads the right margin as it
//    stood and whose line -1 (and corners) the right band reads (and overwrites);
// 4. bottom, which reads both side bands and overwrites their corners.
template <class Rules>
void FillLineByLine(const Rules& rules, const Layout& layout, unsigned int margins) {
    const bool left = (margins & MARGIN_LEFT) != 0;
    const bool right = (margins & MARGIN_RIGHT) != 0;
    const Index yMargin = layout.yMargin;
    const Index bottom = layout.height + yMargin;
    for (Index y = -yMargin; left && y < yMargin; ++y) {
        rules.Left(y);
    }
    for (Index y = -yMargin; (margins & MARGIN_TOP) != 0 && y < 0; ++y) {
        rules.Top(y);
    }
    for (Index y = -yMargin; (left || right) && y < bottom; ++y) {
        if (right) {
            rules.Right(y);
        }
        if (left && y >= yMargin) {
            rules.Left(y);
        }
    }
    for (Index y = layout.height; (margins & MARGIN_BOTTOM) != 0 && y < bottom; ++y) {
        rules.Bottom(y);
    }
}

template <std::size_t kPixelBytes>
void FillMirror(const Layout& layout, unsigned int margins) {
    FillLineByLine(MirrorRules<kPixelBytes>(layout), layout, margins);
}

// The reversals specialised on the common pixel sizes; any other size is read at run time.
void FillMirror(const Layout& layout, unsigned int margins) {
    switch (layout.pixelBytes) {
        case 1:
            return FillMirror<1>(layout, margins);
        case 2:
            return FillMirror<2>(layout, margins);
        case 3:
            return FillMirror<3>(layout, margins);
        case 4:
            return FillMirror<4>(layout, margins);
        case 6:
            return FillMirror<6>(layout, margins);
        case 8:
            return FillMirror<8>(layout, margins);
        case 12:
            return FillMirror<12>(layout, margins);
        case 16:
            return FillMirror<16>(layout, margins);
        default:
            return FillMirror<0>(layout, margins);
    }
}

}  // namespace

void FillRasterMargins(Raster* const raster, eMarginBehaviour behaviour, unsigned int margins) {
    if (behaviour != MARGIN_ZERO && behaviour != MARGIN_MIRROR && behaviour != MARGIN_WRAP) {
        throw kora::Exception("Invalid margin behavior requested.", kSourcePath, kSignature, 40);
    }
    if (raster == nullptr || raster->data == nullptr) {
        return;
    }
    const Layout layout(*raster);
    if (layout.pixelBytes == 0) {
        return;  // fewer than 8 bits per pixel: a pixel has no whole byte to copy
    }
    if (!layout.IsWholeBytes() || layout.xMargin > layout.width || layout.yMargin > layout.height) {
        for (const BandBit& entry : kBandOrder) {
            if ((margins & entry.bit) != 0) {
                FillBandPerPixel(layout, entry.band, behaviour);
            }
        }
        return;
    }
    switch (behaviour) {
        case MARGIN_ZERO:
            FillLineByLine(ZeroRules(layout), layout, margins);
            break;
        case MARGIN_WRAP:
            FillLineByLine(WrapRules(layout), layout, margins);
            break;
        case MARGIN_MIRROR:
            FillMirror(layout, margins);
            break;
    }
}

}  // namespace kora::kubo
