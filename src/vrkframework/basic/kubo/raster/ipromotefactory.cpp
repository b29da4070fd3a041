// The factory interface's out-of-line destructor, which anchors its type information.
#include "vrkframework/basic/kubo/raster/ipromotefactory.h"

namespace kora::kubo {

IPromoteFactory::~IPromoteFactory() = default;

}  // namespace kora::kubo
