// The position of a control point in one image.
#ifndef VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_IMAGELOCATION_H
#define VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_IMAGELOCATION_H

#include "vrkframework/basic/kubo/controlpoints/imagelocationpolicy.h"
#include "vrkframework/basic/kubo/controlpoints/location.h"

namespace kora::kubo {

/// Column and row with their 2 x 2 matrix.
using ImageLocation = Location<2, ImageLocationPolicy>;

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_IMAGELOCATION_H
