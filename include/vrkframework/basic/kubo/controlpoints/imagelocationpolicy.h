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
    /// Coordinate 0.
    double GetColumn() const { return m_coordinates[0]; }
    /// Coordinate 1.
    double GetRow() const { return m_coordinates[1]; }
    /// Sets coordinate 0.
    void SetColumn(double column) { m_coordinates[0] = column; }
    /// Sets coordinate 1.
    void SetRow(double row) { m_coordinates[1] = row; }
    /// Sets both coordinates.
    void SetCoords(double column, double row) {
        m_coordinates[0] = column;
        m_coordinates[1] = row;
    }

protected:
    ImageLocationPolicy() = default;

    /// @name Copying
    ///@{

    /// Copies nothing: the arrays are the owner's, and a copy's own owner hands it new
    /// ones.
    ImageLocationPolicy(const ImageLocationPolicy&) noexcept {}
    ImageLocationPolicy& operator=(  // NOLINT(bugprone-unhandled-self-assignment): copies nothing
        const ImageLocationPolicy&) noexcept {
        return *this;
    }
    ///@}

    ~ImageLocationPolicy() = default;

    /// Points the accessors at the owning location's 2 coordinates and 2 matrix row
    /// pointers; the location keeps ownership. Called by Location only.
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
