// The converter interface's out-of-line destructor, which anchors its type information.
#include "vrkframework/basic/core/typeconv/ipromote.h"

namespace typeconv {

IPromote::~IPromote() = default;

}  // namespace typeconv
