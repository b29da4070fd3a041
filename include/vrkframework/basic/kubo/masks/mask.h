// A validity mask: one bit per pixel of a raster's full extent, margins included.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_MASK_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_MASK_H

#include <vector>

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/raster/rastercontext.h"
#include "vrkframework/basic/kubo/raster/rasterinfo.h"

namespace kora::kubo {

/// Valid (1) or background (0) for every pixel of a raster, margins included.
///
/// Its `RasterInfo` part has the source's width and height, one channel and the 1U type;
/// its `RasterContext` part is the source's context. Pixel (row r, column c) of the full
/// extent is bit r x fullWidth + c, held in byte bit / 8 at position 7 - bit % 8 (the
/// first pixel of a byte is its most significant bit). Rows are not padded: the bit
/// stream runs on across row ends, and the bits after the last pixel are 0.
class KUBO_API Mask : public RasterInfo, public RasterContext {
public:
    /// Every pixel background.
    /// @throws kora::OutOfBoundsException "A mask of W x H pixels (margins included)
    ///   exceeds the 4294967295 bits a mask holds", values {W, H} saturated to INT_MAX, when
    ///   the full width or height passes INT_MAX or their product 4294967295.
    Mask(const RasterInfo& info, const RasterContext& context);
    /// Takes the bits from `buffer`: when `packed` is false it holds one flag byte per
    /// pixel (bit = flag != 0), else the packed bytes, of which the first byte count are
    /// copied as they are. When `freeBuffer` is set the buffer, allocated with
    /// `new unsigned char[]`, is released with `delete[]` before the constructor returns,
    /// also when it throws. A null buffer leaves every pixel background.
    /// @throws kora::OutOfBoundsException as Mask(info, context) does.
    Mask(const RasterInfo& info, const RasterContext& context, unsigned char* buffer,
         bool freeBuffer, bool packed);

    /// @name Copying
    ///@{

    /// Copies the description and the bits; moving takes the bits over.
    Mask(const Mask&) = default;
    Mask& operator=(const Mask&) = default;
    Mask(Mask&&) = default;
    Mask& operator=(Mask&&) = default;
    ///@}

    ~Mask() override;

    /// width + 2 x xMargin.
    int GetFullWidth() const { return m_fullWidth; }
    /// height + 2 x yMargin.
    int GetFullHeight() const { return m_fullHeight; }
    /// fullWidth x fullHeight, in 32 bits.
    unsigned int GetBitCount() const { return m_bitCount; }
    /// (bitCount + 7) / 8.
    unsigned int GetByteCount() const { return m_byteCount; }
    /// The packed bytes, byte count of them.
    const unsigned char* GetBits() const { return m_bits.data(); }
    /// The packed bytes, writable; keep the bits after the last pixel 0.
    unsigned char* GetBits() { return m_bits.data(); }
    /// Bit `index` of the full extent; false for an index at or past the bit count.
    bool GetBit(unsigned int index) const;

private:
    int m_fullWidth;
    int m_fullHeight;
    std::vector<unsigned char> m_bits;
    unsigned int m_bitCount;
    unsigned int m_byteCount;
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_MASK_H
