// Mask sizes and the packing of flag buffers into masks.
#include "vrkframework/basic/kubo/masks/mask.h"

#include <cstdint>  // std::uint64_t
#include <cstring>  // std::memcpy

#include "vrkframework/basic/kubo/masks/flagpacking.h"

namespace kora::kubo {
namespace {

// The 32-bit sizes of a mask are kept as they have always been formed, wrapping for extents
// beyond them; only the byte count is rounded in 64 bits, so that it cannot wrap to fewer
// bytes than the bit count needs.
int FullExtent(unsigned int size, unsigned int margin) {
    return static_cast<int>(size + 2 * margin);
}

unsigned int ByteCount(unsigned int bitCount) {
    return static_cast<unsigned int>((std::uint64_t{bitCount} + 7) / 8);
}

}  // namespace

Mask::Mask(const RasterInfo& info, const RasterContext& context)
    : RasterInfo(info.width, info.height, 1, DataType::Type1U),
      RasterContext(context),
      m_fullWidth(FullExtent(info.width, context.xMargin)),
      m_fullHeight(FullExtent(info.height, context.yMargin)),
      m_bitCount(static_cast<unsigned int>(m_fullWidth) * static_cast<unsigned int>(m_fullHeight)),
      m_byteCount(ByteCount(m_bitCount)) {
    m_bits.assign(m_byteCount, 0);
}

// The function try block releases a buffer handed over even when the bits cannot be
// allocated.
Mask::Mask(const RasterInfo& info, const RasterContext& context, unsigned char* buffer,
           bool freeBuffer, bool packed) try
    : Mask(info, context) {
    if (buffer != nullptr && m_byteCount != 0) {
        if (packed) {
            std::memcpy(m_bits.data(), buffer, m_byteCount);
        } else {
            detail::PackFlags(buffer, m_bits.data(), m_bitCount);
        }
    }
    if (freeBuffer) {
        delete[] buffer;
    }
} catch (...) {
    if (freeBuffer) {
        delete[] buffer;
    }
}

Mask::~Mask() = default;

bool Mask::GetBit(unsigned int index) const {
    return index < m_bitCount && ((m_bits[index / 8] >> (7 - index % 8)) & 1) != 0;
}

}  // namespace kora::kubo
