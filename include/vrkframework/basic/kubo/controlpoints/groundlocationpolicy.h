// A ground position: the policy naming its x, y, z and populated axes, and the
// `GroundLocation` type.
#ifndef VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_GROUNDLOCATIONPOLICY_H
#define VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_GROUNDLOCATIONPOLICY_H

#include "vrkframework/basic/kubo/controlpoints/location.h"
#include "vrkframework/basic/kubo/kuboapi.h"

namespace kora::kubo {

/// Which axes of a ground position hold measured values. Stored and compared as a plain
/// value; any other value passed in is kept as it is.
enum PopulatedAxesCode : int {
    ePopulatedAxesNone = 0,  ///< nothing known yet
    ePopulatedAxesXY = 1,    ///< planimetric position only
    ePopulatedAxesZ = 2,     ///< height only
    ePopulatedAxesXYZ = 3    ///< full position
};

/// Base of a three-dimensional `Location`: coordinates 0, 1 and 2 are x, y and z.
/// Only a location creates, copies and destroys it; the arrays belong to that location.
class KUBO_API GroundLocationPolicy {
public:
    /// Coordinate 0.
    double GetX() const { return m_coordinates[0]; }
    /// Coordinate 1.
    double GetY() const { return m_coordinates[1]; }
    /// Coordinate 2.
    double GetZ() const { return m_coordinates[2]; }
    /// Sets the three coordinates; the populated-axes code is left alone.
    void SetCoords(double x, double y, double z) {
        m_coordinates[0] = x;
        m_coordinates[1] = y;
        m_coordinates[2] = z;
    }
    /// Which axes hold measured values; ePopulatedAxesNone by default.
    PopulatedAxesCode GetPopulatedAxesCode() const { return m_populatedAxesCode; }
    /// Stores `code` as given.
    void SetPopulatedAxesCode(PopulatedAxesCode code) { m_populatedAxesCode = code; }

protected:
    GroundLocationPolicy() = default;

    /// @name Copying
    ///@{

    /// Copies the populated-axes code only: the arrays are the owner's, and a copy's own
    /// owner hands it new ones.
    GroundLocationPolicy(const GroundLocationPolicy& other) noexcept
        : m_populatedAxesCode(other.m_populatedAxesCode) {}
    // Safe for self-assignment: only the code is copied, never a pointer.
    GroundLocationPolicy& operator=(  // NOLINT(bugprone-unhandled-self-assignment)
        const GroundLocationPolicy& other) noexcept {
        m_populatedAxesCode = other.m_populatedAxesCode;
        return *this;
    }
    ///@}

    ~GroundLocationPolicy() = default;

    /// Points the accessors at the owning location's 3 coordinates and 3 matrix row
    /// pointers; the location keeps ownership. Called by Location only.
    void SetSharedArrays(double* coordinates, double** matrix) {
        m_coordinates = coordinates;
        m_matrix = matrix;
    }

private:
    PopulatedAxesCode m_populatedAxesCode = ePopulatedAxesNone;
    double* m_coordinates = nullptr;
    double** m_matrix = nullptr;
};

/// x, y and z with their 3 x 3 matrix and populated-axes code.
using GroundLocation = Location<3, GroundLocationPolicy>;

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_GROUNDLOCATIONPOLICY_H
