// Native codes of sample types.
#include "vrkframework/basic/kubo/raster/nativedatatype.h"

#include "vrkframework/basic/kubo/raster/rasterinfo.h"

namespace kora::kubo {
namespace {

// Decided by width first. The floating flag is not looked at for 8 and 16 bits and the
// complex flag not for 8 bits, so C8S and C8U fold onto the real 8-bit codes.
NativeDataTypeCode CodeOf(const DataType& type) {
    const bool s = type.isSigned;
    switch (type.bits) {
        case 8:
            return s ? NDT_8S : NDT_8U;
        case 16:
            if (type.isComplex) {
                return s ? NDT_C16S : NDT_C16U;
            }
            return s ? NDT_16S : NDT_16U;
        case 32:
            if (type.isComplex) {
                return s ? (type.isFloat ? NDT_C32R : NDT_C32S) : NDT_UNKNOWN;
            }
            if (type.isFloat) {
                return s ? NDT_32R : NDT_UNKNOWN;
            }
            return s ? NDT_32S : NDT_32U;
        case 64:
            if (type.isComplex) {
                return s && type.isFloat ? NDT_C64R : NDT_UNKNOWN;
            }
            if (type.isFloat) {
                return s ? NDT_64R : NDT_UNKNOWN;
            }
            return s ? NDT_64S : NDT_64U;
        default:
            return NDT_UNKNOWN;
    }
}

}  // namespace

NativeDataType::NativeDataType(const DataType& type) : DataType(type), code(CodeOf(type)) {}

NativeDataType::~NativeDataType() = default;

NativeDataTypeCode GetDataTypeCode(const RasterInfo& info) {
    return NativeDataType(info.dataType).code;
}

}  // namespace kora::kubo
