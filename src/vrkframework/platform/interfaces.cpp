// Out-of-line destructors anchor the vtables and RTTI of the platform interfaces in
// the shared library, so dynamic_cast and catch work across its boundary.
#include "vrkframework/platform/crs.h"
#include "vrkframework/platform/rasterreader.h"

namespace kora::datasources {
IRasterReader::~IRasterReader() = default;
}

namespace kora::ogc::cs {
ICRS::~ICRS() = default;
}
