// The position of a control point on the ground.
#ifndef VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_GROUNDLOCATION_H
#define VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_GROUNDLOCATION_H

#include "vrkframework/basic/kubo/controlpoints/groundlocationpolicy.h"
#include "vrkframework/basic/kubo/controlpoints/location.h"

namespace kora::kubo {

/// x, y and z with their 3 x 3 matrix and populated-axes code.
using GroundLocation = Location<3, GroundLocationPolicy>;

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_GROUNDLOCATION_H
