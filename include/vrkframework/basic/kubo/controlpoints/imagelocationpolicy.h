// An image position: the policy naming its column and row, and the `ImageLocation` type.
#ifndef VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_IMAGELOCATIONPOLICY_H
#define VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_IMAGELOCATIONPOLICY_H

#include "vrkframework/basic/kubo/controlpoints/location.h"
#include "vrkframework/basic/kubo/kuboapi.h"

namespace kora::kubo {

/// Base of a two-dimensional `Location`: coordinate 0 is the column, coordinate 1 the row.
/// Only a location creates, copies and destroys it; the arrays belong to that location.
class KUBO_API ImageLocationPolicy {
public:
    double GetColumn() const { return m_coordinates[0]; }
    double GetRow() const { return m_coordinates[1]; }
    void SetColumn(double column) { m_coordinates[0] = column; }
    void SetRow(double row) { m_coordinates[1] = row; }
    void SetCoords(double column, double row) {
        m_coordinates[0] = column;
        m_coordinates[1] = row;
    }

protected:
    ImageLocationPolicy() = default;
    // The arrays are the owner's: a copy waits for its own owner to hand it new ones.
    ImageLocationPolicy(const ImageLocationPolicy&) noexcept {}
    ImageLocationPolicy& operator=(const ImageLocationPolicy&) noexcept { return *this; }
    ~ImageLocationPolicy() = default;

    void SetSharedArrays(double* coordinates, double** matrix) {
        m_coordinates = coordinates;
        m_matrix = matrix;
    }

private:
    double* m_coordinates = nullptr;
    double** m_matrix = nullptr;
};

/// Column and row with their 2 x 2 matrix.
using ImageLocation = Location<2, ImageLocationPolicy>;

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_IMAGELOCATIONPOLICY_H
