// The out-of-line destructor anchors the interface's type information in the library, so
// that dynamic_cast and catching work across the library boundary.
#include "vrkframework/basic/kubo/raster/icompresseddata.h"

namespace kora::kubo {

ICompressedData::~ICompressedData() = default;

}  // namespace kora::kubo
