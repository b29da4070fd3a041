// A position with its N x N matrix, its coordinates named by a policy base.
#ifndef VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_LOCATION_H
#define VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_LOCATION_H

#include <array>

namespace kora::kubo {

/// N coordinates and an N x N matrix (for instance their covariance), all 0.0 by default.
/// The location owns both arrays and hands `Policy` pointers to them through
/// `Policy::SetSharedArrays`, so the policy's named accessors read and write them.
///
/// Copies are deep: a copy owns arrays of its own holding the same values, and carries
/// the policy's own state. Equality compares the N coordinates and N x N matrix entries
/// exactly as doubles (a NaN anywhere makes two locations unequal); the policy's state
/// takes no part.
template <unsigned int N, class Policy>
class Location : public Policy {
    static_assert(N > 0, "a location has at least one coordinate");

public:
    Location() noexcept : m_coordinates{}, m_values{} { Share(); }

    /// @name Copying
    ///@{

    /// Copies the values, never the arrays. The coordinates, the matrix entries and the
    /// policy's state go into this location's own arrays, at which its policy keeps pointing.
    Location(const Location& other) noexcept
        : Policy(other), m_coordinates(other.m_coordinates), m_values(other.m_values) {
        Share();
    }
    Location& operator=(const Location& other) noexcept {
        Policy::operator=(other);
        m_coordinates = other.m_coordinates;
        m_values = other.m_values;
        return *this;
    }
    ///@}

    ~Location() = default;

    /// @name Comparison
    ///@{

    /// Compares the N coordinates and the N x N matrix entries exactly as doubles (a NaN
    /// anywhere makes the locations unequal); the policy's state takes no part.
    bool operator==(const Location& other) const {
        return m_coordinates == other.m_coordinates && m_values == other.m_values;
    }
    bool operator!=(const Location& other) const { return !(*this == other); }
    ///@}

    /// The N coordinates; the location keeps ownership.
    double* GetCoordinates() { return m_coordinates.data(); }
    /// The N coordinates, read-only; the location keeps ownership.
    const double* GetCoordinates() const { return m_coordinates.data(); }
    /// N row pointers of N entries each; the location keeps ownership.
    double** GetMatrix() { return m_rows.data(); }
    /// N row pointers of N entries each, read-only; the location keeps ownership.
    const double* const* GetMatrix() const { return m_rows.data(); }

private:
    // The arrays live inside the object, so every location, copied or not, points its
    // rows and its policy at its own storage.
    void Share() noexcept {
        for (unsigned int row = 0; row < N; ++row) {
            m_rows[row] = m_values[row].data();
        }
        Policy::SetSharedArrays(m_coordinates.data(), m_rows.data());
    }

    std::array<double, N> m_coordinates;
    std::array<std::array<double, N>, N> m_values;
    std::array<double*, N> m_rows;
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_LOCATION_H
