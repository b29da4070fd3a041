// Coordinate reference system, as far as the raster library uses one.
#ifndef VRKFRAMEWORK_PLATFORM_CRS_H
#define VRKFRAMEWORK_PLATFORM_CRS_H

#include "vrkframework/platform/platformapi.h"

/// The framework's coordinate systems, as far as control points carry one.
namespace kora::ogc::cs {

/// A coordinate reference system: its dimension and a way to copy it.
class KORA_PLATFORM_API ICRS {
public:
    virtual ~ICRS();
    /// Number of coordinates of a position in this system.
    virtual unsigned int GetDimension() const = 0;
    /// Returns a new heap copy; the caller owns it.
    virtual ICRS* Clone() const = 0;

protected:
    ICRS() = default;
    /// @name Copying
    ///@{

    /// For implementations, which copy and move as they see fit.
    ICRS(const ICRS&) = default;
    ICRS& operator=(const ICRS&) = default;
    ICRS(ICRS&&) = default;
    ICRS& operator=(ICRS&&) = default;
    ///@}
};

}  // namespace kora::ogc::cs

#endif  // VRKFRAMEWORK_PLATFORM_CRS_H
