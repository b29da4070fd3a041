// Masks from an explicit, sorted set of valid coordinates.
#include "vrkframework/basic/kubo/masks/coordinatemaskbuilder.h"

#include <algorithm>  // std::lower_bound
#include <cstddef>    // std::size_t
#include <cstdint>    // std::int64_t

#include "vrkframework/basic/kubo/masks/mask.h"
#include "vrkframework/basic/kubo/masks/maskextent.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace kora::kubo {

CoordinateMaskBuilder::~CoordinateMaskBuilder() = default;

void CoordinateMaskBuilder::AddValidCoordinate(int row, int column) {
    const std::pair<int, int> coordinate(row, column);
    const auto at = std::lower_bound(m_coordinates.begin(), m_coordinates.end(), coordinate);
    if (at == m_coordinates.end() || *at != coordinate) {
        m_coordinates.insert(at, coordinate);
    }
}

Mask* CoordinateMaskBuilder::BuildMask(const Raster& raster) const {
    detail::CheckMaskExtent(raster, raster, "vrkframework/basic/kubo/masks/coordinatemaskbuilder",
                            "class kora::kubo::Mask *__cdecl kora::kubo::CoordinateMaskBuilder::"
                            "BuildMask(const class kora::kubo::Raster &) const");
    auto* mask = new Mask(raster, raster);
    // Offsets and sizes are compared as signed 32-bit values; the sums are formed in 64 bits
    // so that an image reaching the end of the int range cannot overflow them.
    const std::int64_t x0 = static_cast<int>(raster.xOffset);
    const std::int64_t y0 = static_cast<int>(raster.yOffset);
    const std::int64_t xEnd = x0 + static_cast<int>(raster.width);
    const std::int64_t yEnd = y0 + static_cast<int>(raster.height);
    const std::int64_t fullWidth = mask->GetFullWidth();
    unsigned char* bits = mask->GetBits();
    for (const auto& [row, column] : m_coordinates) {
        if (row < y0 || row >= yEnd || column < x0 || column >= xEnd) {
            continue;
        }
        const std::int64_t index =
            (row - y0 + raster.yMargin) * fullWidth + (column - x0 + raster.xMargin);
        if (index >= 0 && index < mask->GetBitCount()) {
            bits[static_cast<std::size_t>(index / 8)] |=
                static_cast<unsigned char>(0x80u >> (index % 8));
        }
    }
    return mask;
}

}  // namespace kora::kubo
