// The library's numbering of sample types, used where kernels are chosen by a switch.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_NATIVEDATATYPE_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_NATIVEDATATYPE_H

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/raster/datatype.h"

namespace kora::kubo {

class RasterInfo;

/// The library's code of a sample type; NDT_UNKNOWN for types without one.
enum NativeDataTypeCode {
    NDT_8U = 0,
    NDT_8S = 1,
    NDT_16U = 2,
    NDT_16S = 3,
    NDT_32U = 4,
    NDT_32S = 5,
    NDT_32R = 6,
    NDT_64U = 7,
    NDT_64S = 8,
    NDT_64R = 9,
    NDT_C16U = 10,
    NDT_C16S = 11,
    NDT_C32S = 12,
    NDT_C32R = 13,
    NDT_C64R = 14,
    NDT_UNKNOWN = 15
};

/// A `DataType` together with its native code, computed once on construction.
/// 8-bit complex types fold onto the real 8-bit codes; C32U and the 64-bit complex
/// integers have no code.
struct KUBO_API NativeDataType : public DataType {
    /// Copies `type` and computes its code.
    NativeDataType(const DataType& type);  // NOLINT(google-explicit-constructor): a widening

    /// @name Copying
    ///@{

    /// Copies the descriptor and its code.
    NativeDataType(const NativeDataType&) = default;
    NativeDataType& operator=(const NativeDataType&) = default;
    NativeDataType(NativeDataType&&) = default;
    NativeDataType& operator=(NativeDataType&&) = default;
    ///@}

    virtual ~NativeDataType();

    NativeDataTypeCode code;  ///< the code of the descriptor, as computed on construction
};

/// The native code of a raster's sample type.
KUBO_API NativeDataTypeCode GetDataTypeCode(const RasterInfo& info);

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_NATIVEDATATYPE_H
