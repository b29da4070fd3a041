// Promotion of a list of sample types and the mapping to outside buffer formats.
#include "vrkframework/basic/kubo/raster/datatype.h"

#include <algorithm>  // std::max_element
#include <utility>    // std::pair

namespace kora::kubo {
namespace {

// The doubled-width type of a mixed group; 32 and 64 bits take the IEEE layout of
// that width when the remembered type is floating.
DataType DoubledWidth(const DataType& remembered, unsigned int width) {
    DataType doubled(2 * width, remembered.isSigned, remembered.isFloat, 2 * width, 0,
                     remembered.isComplex);
    if (doubled.bits == 32) {
        doubled.mantissaBits = 23;
        doubled.exponentBits = 8;
    } else if (doubled.bits == 64) {
        doubled.mantissaBits = 52;
        doubled.exponentBits = 11;
    }
    return doubled;
}

}  // namespace

DataType PromoteType(const std::vector<DataType>& types) {
    if (types.empty()) {
        return DataType::Type8U;
    }
    const unsigned int widest =
        std::max_element(types.begin(), types.end(), [](const DataType& a, const DataType& b) {
            return a.bits < b.bits;
        })->bits;

    // Narrower types take no part; within a group the last type met wins, its complex
    // flag with it.
    const DataType* lastFloat = nullptr;
    const DataType* lastSigned = nullptr;
    const DataType* lastUnsigned = nullptr;
    for (const DataType& type : types) {
        if (type.bits != widest) {
            continue;
        }
        if (type.isFloat) {
            lastFloat = &type;
        } else if (type.isSigned) {
            lastSigned = &type;
        } else {
            lastUnsigned = &type;
        }
    }

    if (lastFloat != nullptr) {
        if (lastSigned == nullptr && lastUnsigned == nullptr) {
            return *lastFloat;
        }
        return DoubledWidth(*lastFloat, widest);
    }
    if (lastSigned != nullptr) {
        if (lastUnsigned == nullptr) {
            return *lastSigned;
        }
        return DataType(2 * widest, true, false, 2 * widest, 0, lastSigned->isComplex);
    }
    return *lastUnsigned;
}

raster::BufferType VRKDataType2RasterBufferType(const DataType& type) {
    // First full match wins; complex types map to the real format of their whole width.
    static constexpr std::pair<DataType, raster::BufferType> kFormats[] = {
        {DataType::Type1U, raster::BUFFER_1U},    {DataType::Type8S, raster::BUFFER_8S},
        {DataType::Type8U, raster::BUFFER_8U},    {DataType::Type16S, raster::BUFFER_16S},
        {DataType::Type16U, raster::BUFFER_16U},  {DataType::Type32S, raster::BUFFER_32S},
        {DataType::Type32U, raster::BUFFER_32U},  {DataType::Type32R, raster::BUFFER_32R},
        {DataType::Type64S, raster::BUFFER_64S},  {DataType::Type64U, raster::BUFFER_64U},
        {DataType::Type64R, raster::BUFFER_64R},  {DataType::TypeC16S, raster::BUFFER_32S},
        {DataType::TypeC16U, raster::BUFFER_32U}, {DataType::TypeC32S, raster::BUFFER_64S},
        {DataType::TypeC32U, raster::BUFFER_64U}, {DataType::TypeC32R, raster::BUFFER_64R},
    };
    for (const auto& [candidate, format] : kFormats) {
        if (candidate == type) {
            return format;
        }
    }
    return raster::BUFFER_8U;
}

}  // namespace kora::kubo
