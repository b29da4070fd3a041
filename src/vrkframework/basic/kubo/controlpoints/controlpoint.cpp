// Copying and comparing control points.
#include "vrkframework/basic/kubo/controlpoints/controlpoint.h"

namespace kora::kubo {

ControlPoint::ControlPoint() : ControlPoint(0) {}

ControlPoint::ControlPoint(unsigned int id)
    : m_id(id), m_used(false), m_type(eControlPointUndefined) {}

ControlPoint::ControlPoint(const ControlPoint& other) : ControlPoint() { Copy(other); }

ControlPoint& ControlPoint::operator=(const ControlPoint& other) {
    Copy(other);
    return *this;
}

void ControlPoint::Copy(const ControlPoint& other) {
    m_id = other.m_id;
    m_name = other.m_name;
    m_groundLocation = other.m_groundLocation;
    m_imageLocations = other.m_imageLocations;
    m_type = other.m_type;
    m_used = other.m_used;
}

bool ControlPoint::operator==(const ControlPoint& other) const {
    // Cheap tests first; the image locations are compared one by one only when their
    // counts and everything else agree.
    return m_name == other.m_name && m_id == other.m_id &&
           m_groundLocation == other.m_groundLocation &&
           m_imageLocations.size() == other.m_imageLocations.size() && m_type == other.m_type &&
           m_imageLocations == other.m_imageLocations;
}

}  // namespace kora::kubo
