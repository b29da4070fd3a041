// Coordinate reference system, as far as the raster library uses one.
#ifndef VRKFRAMEWORK_PLATFORM_CRS_H
#define VRKFRAMEWORK_PLATFORM_CRS_H

#include "vrkframework/platform/platformapi.h"

namespace kora::ogc::cs {

/// A coordinate reference system: its dimension and a way to copy it.
class KORA_PLATFORM_API ICRS {
public:
    virtual ~ICRS();
    virtual unsigned int GetDimension() const = 0;
    /// Returns a new heap copy; the caller owns it.
    virtual ICRS* Clone() const = 0;
};

}  // namespace kora::ogc::cs

#endif  // VRKFRAMEWORK_PLATFORM_CRS_H
