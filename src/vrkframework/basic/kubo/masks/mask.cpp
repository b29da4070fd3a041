// Mask sizes and the packing of flag buffers into masks.
#include "vrkframework/basic/kubo/masks/mask.h"

#include <climits>  // INT_MAX, UINT_MAX
#include <cstdint>  // std::uint64_t
#include <cstring>  // std::memcpy
#include <string>   // std::to_string

#include "vrkframework/basic/kubo/masks/maskextent.h"
#include "vrkframework/basic/kubo/masks/maskloops.h"
#include "vrkframework/basic/kubo/raster/bufferextent.h"
#include "vrkframework/platform/exception.h"

namespace kora::kubo {
namespace detail {

void CheckMaskExtent(const RasterInfo& info, const RasterContext& context, const char* sourcePath,
                     const char* function) {
    const std::uint64_t fullWidth = FullExtent(info.width, context.xMargin);
    const std::uint64_t fullHeight = FullExtent(info.height, context.yMargin);
    if (fullWidth > INT_MAX || fullHeight > INT_MAX || fullWidth * fullHeight > UINT_MAX) {
        throw kora::OutOfBoundsException(
            {SaturatedInt(fullWidth), SaturatedInt(fullHeight)},
            "A mask of " + std::to_string(fullWidth) + " x " + std::to_string(fullHeight) +
                " pixels (margins included) exceeds the 4294967295 bits a mask holds",
            sourcePath, function, 0);
    }
}

}  // namespace detail

Mask::Mask(const RasterInfo& info, const RasterContext& context)
    : RasterInfo(info.width, info.height, 1, DataType::Type1U),
      RasterContext(context),
      m_fullWidth(0),
      m_fullHeight(0),
      m_bitCount(0),
      m_byteCount(0) {
    detail::CheckMaskExtent(info, context, "vrkframework/basic/kubo/masks/mask",
                            "__cdecl kora::kubo::Mask::Mask(const class kora::kubo::RasterInfo "
                            "&,const class kora::kubo::RasterContext &)");
    m_fullWidth = static_cast<int>(info.width + 2 * context.xMargin);
    m_fullHeight = static_cast<int>(info.height + 2 * context.yMargin);
    m_bitCount = static_cast<unsigned int>(m_fullWidth) * static_cast<unsigned int>(m_fullHeight);
    m_byteCount = static_cast<unsigned int>((std::uint64_t{m_bitCount} + 7) / 8);
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
