// Out-of-line destructors anchor the vtables and RTTI of the mask interfaces in the
// shared library, so dynamic_cast works across its boundary.
#include "vrkframework/basic/kubo/masks/imaskbuilder.h"
#include "vrkframework/basic/kubo/masks/imaskdecision.h"
#include "vrkframework/basic/kubo/masks/imaskdecisionimpl.h"

namespace kora::kubo {

IMaskBuilder::~IMaskBuilder() = default;
IMaskDecision::~IMaskDecision() = default;
IMaskDecisionImpl::~IMaskDecisionImpl() = default;

}  // namespace kora::kubo
