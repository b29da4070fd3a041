// Masks that mark an explicit set of pixel coordinates valid.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_COORDINATEMASKBUILDER_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_COORDINATEMASKBUILDER_H

#include <utility>  // std::pair
#include <vector>

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/masks/imaskbuilder.h"

namespace kora::kubo {

/// Holds a sorted set of (row, column) coordinates, in the frame of the whole source
/// image, and marks those inside a raster's image proper valid.
class KUBO_API CoordinateMaskBuilder : public IMaskBuilder {
public:
    CoordinateMaskBuilder() = default;

    /// @name Copying
    ///@{

    /// Copies the coordinates; moving takes them over.
    CoordinateMaskBuilder(const CoordinateMaskBuilder&) = default;
    CoordinateMaskBuilder& operator=(const CoordinateMaskBuilder&) = default;
    CoordinateMaskBuilder(CoordinateMaskBuilder&&) = default;
    CoordinateMaskBuilder& operator=(CoordinateMaskBuilder&&) = default;
    ///@}

    ~CoordinateMaskBuilder() override;

    /// Inserts the pair in row-then-column order; a pair already held is not added again.
    void AddValidCoordinate(int row, int column);
    /// The held pairs, ascending by row, then column.
    const std::vector<std::pair<int, int>>& GetCoordinates() const { return m_coordinates; }

    /// A new mask (the caller deletes it) with the held coordinates that fall inside the
    /// raster's image proper set; the margins are never set.
    /// @throws kora::OutOfBoundsException as the Mask constructor does, before any work.
    Mask* BuildMask(const Raster& raster) const override;

private:
    std::vector<std::pair<int, int>> m_coordinates;
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_COORDINATEMASKBUILDER_H
