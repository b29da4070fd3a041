// A ground control point: one ground position tied to its positions in images.
#ifndef VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_CONTROLPOINT_H
#define VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_CONTROLPOINT_H

#include <string>
#include <vector>

#include "vrkframework/basic/kubo/controlpoints/groundlocationpolicy.h"
#include "vrkframework/basic/kubo/controlpoints/imagelocationpolicy.h"
#include "vrkframework/basic/kubo/kuboapi.h"

namespace kora::kubo {

/// Role of a control point. Stored and compared as a plain value; any other value passed
/// in is kept as it is.
enum ControlPointType : int {
    eControlPointUndefined = 0,  ///< no role assigned
    eControlPointGround = 1,     ///< ground control: takes part in an adjustment
    eControlPointCheck = 2,      ///< check point: measures the result of an adjustment
    eControlPointTie = 3         ///< tie point: joins images, no known ground position
};

/// A named, numbered point: one ground location and any number of image locations, a
/// type and a used flag. Copies are deep.
class KUBO_API ControlPoint {
public:
    /// An unnamed point with id 0 (or `id`), ground location at 0, no image locations, not
    /// used, undefined type.
    ControlPoint();
    /// An unnamed point with id `id`; otherwise as ControlPoint().
    explicit ControlPoint(unsigned int id);

    /// @name Copying
    ///@{

    /// Copies are deep: no location is shared. A copy holds the id, name, ground location,
    /// image locations, type and used flag of its source. Moving takes the members over.
    ControlPoint(const ControlPoint& other);
    ControlPoint& operator=(const ControlPoint& other);
    ControlPoint(ControlPoint&& other) noexcept = default;
    ControlPoint& operator=(ControlPoint&& other) noexcept = default;
    ///@}

    ~ControlPoint() = default;

    /// Equal names, ids, ground locations, numbers of image locations, types and image
    /// locations index by index. The used flag is no part of a point's identity.
    bool operator==(const ControlPoint& other) const;
    /// Negation of operator==.
    bool operator!=(const ControlPoint& other) const { return !(*this == other); }

    /// Fixed at construction (or by copying): there is no setter.
    unsigned int GetId() const { return m_id; }
    /// The name; empty by default.
    std::string GetName() const { return m_name; }
    /// Replaces the name.
    void SetName(const std::string& name) { m_name = name; }
    /// The role; eControlPointUndefined by default.
    ControlPointType GetType() const { return m_type; }
    /// Stores `type` as given.
    void SetType(ControlPointType type) { m_type = type; }
    /// The used flag; false by default.
    bool IsUsed() const { return m_used; }
    /// Sets the used flag.
    void SetUsed(bool used) { m_used = used; }

    /// The ground location.
    const GroundLocation& GetGroundLocation() const { return m_groundLocation; }
    /// Replaces the ground location by a copy of `location`.
    void SetGroundLocation(const GroundLocation& location) { m_groundLocation = location; }
    /// The image locations themselves, to change in place.
    std::vector<ImageLocation>& GetImageLocations() { return m_imageLocations; }
    /// The image locations.
    const std::vector<ImageLocation>& GetImageLocations() const { return m_imageLocations; }
    /// Replaces the image locations by copies of `locations`.
    void SetImageLocations(const std::vector<ImageLocation>& locations) {
        m_imageLocations = locations;
    }

private:
    void Copy(const ControlPoint& other);

    std::string m_name;
    unsigned int m_id;
    GroundLocation m_groundLocation;
    std::vector<ImageLocation> m_imageLocations;
    bool m_used;
    ControlPointType m_type;
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_CONTROLPOINT_H
