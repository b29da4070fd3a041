// The sample type descriptor, its predefined constants, and the rules that relate types.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_DATATYPE_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_DATATYPE_H

#include <vector>

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/platform/buffertype.h"

/// The raster library: sample descriptors, rasters and their margins, conversions, masks,
/// compressed rasters, lookup tables and control points.
namespace kora::kubo {

/// Describes one sample: its width, signedness, floating layout and whether it is a
/// (real, imaginary) pair. For a complex type every field describes one component.
/// Integer descriptors whose `bits` is not a multiple of 8 describe packed samples.
struct KUBO_API DataType {
    unsigned int bits;          ///< bits of one sample, of one component if complex (C32R: 32)
    bool isSigned;              ///< values can be negative; set for every floating type
    bool isFloat;               ///< IEEE floating point
    unsigned int mantissaBits;  ///< `bits` for integers, 23 for 32-bit and 52 for 64-bit floats
    unsigned int exponentBits;  ///< 0 for integers, 8 for 32-bit and 11 for 64-bit floats
    bool isComplex;             ///< each sample is a (real, imaginary) pair of components

    /// All fields zero: equal to no predefined type.
    constexpr DataType()
        : bits(0),
          isSigned(false),
          isFloat(false),
          mantissaBits(0),
          exponentBits(0),
          isComplex(false) {}

    /// Takes the six fields in declaration order; any combination is accepted.
    constexpr DataType(unsigned int bitCount, bool signedType, bool floatType,
                       unsigned int mantissaBitCount, unsigned int exponentBitCount,
                       bool complexType)
        : bits(bitCount),
          isSigned(signedType),
          isFloat(floatType),
          mantissaBits(mantissaBitCount),
          exponentBits(exponentBitCount),
          isComplex(complexType) {}

    /// Exact equality of all six fields.
    constexpr bool operator==(const DataType& other) const {
        return bits == other.bits && isSigned == other.isSigned && isFloat == other.isFloat &&
               mantissaBits == other.mantissaBits && exponentBits == other.exponentBits &&
               isComplex == other.isComplex;
    }
    /// True when any of the six fields differs.
    constexpr bool operator!=(const DataType& other) const { return !(*this == other); }

    /// @name Predefined types
    ///@{

    /// A predefined type. The name after Type is its label: the bits of one component,
    /// then U (unsigned), S (signed) or R (floating), with a C in front for complex types
    /// (TypeC32R holds two floats). Type1U is the type of bit masks.
    static const DataType Type1U;
    static const DataType Type8U;
    static const DataType Type8S;
    static const DataType Type16U;
    static const DataType Type16S;
    static const DataType Type32U;
    static const DataType Type32S;
    static const DataType Type32R;
    static const DataType Type64U;
    static const DataType Type64S;
    static const DataType Type64R;
    static const DataType TypeC8U;
    static const DataType TypeC8S;
    static const DataType TypeC16U;
    static const DataType TypeC16S;
    static const DataType TypeC32U;
    static const DataType TypeC32S;
    static const DataType TypeC32R;
    static const DataType TypeC64U;
    static const DataType TypeC64S;
    static const DataType TypeC64R;
    ///@}
};

// Constant-initialised, so other static initialisers and constant expressions may use them.
inline constexpr DataType DataType::Type1U{1, false, false, 1, 0, false};
inline constexpr DataType DataType::Type8U{8, false, false, 8, 0, false};
inline constexpr DataType DataType::Type8S{8, true, false, 8, 0, false};
inline constexpr DataType DataType::Type16U{16, false, false, 16, 0, false};
inline constexpr DataType DataType::Type16S{16, true, false, 16, 0, false};
inline constexpr DataType DataType::Type32U{32, false, false, 32, 0, false};
inline constexpr DataType DataType::Type32S{32, true, false, 32, 0, false};
inline constexpr DataType DataType::Type32R{32, true, true, 23, 8, false};
inline constexpr DataType DataType::Type64U{64, false, false, 64, 0, false};
inline constexpr DataType DataType::Type64S{64, true, false, 64, 0, false};
inline constexpr DataType DataType::Type64R{64, true, true, 52, 11, false};
inline constexpr DataType DataType::TypeC8U{8, false, false, 8, 0, true};
inline constexpr DataType DataType::TypeC8S{8, true, false, 8, 0, true};
inline constexpr DataType DataType::TypeC16U{16, false, false, 16, 0, true};
inline constexpr DataType DataType::TypeC16S{16, true, false, 16, 0, true};
inline constexpr DataType DataType::TypeC32U{32, false, false, 32, 0, true};
inline constexpr DataType DataType::TypeC32S{32, true, false, 32, 0, true};
inline constexpr DataType DataType::TypeC32R{32, true, true, 23, 8, true};
inline constexpr DataType DataType::TypeC64U{64, false, false, 64, 0, true};
inline constexpr DataType DataType::TypeC64S{64, true, false, 64, 0, true};
inline constexpr DataType DataType::TypeC64R{64, true, true, 52, 11, true};

/// The common type of a list: only the widest types take part; a float mixed with an
/// integer of the same width, or a signed with an unsigned integer, doubles the width
/// (results of 128 bits match no predefined type and are returned as they are).
/// An empty list yields 8U.
KUBO_API DataType PromoteType(const std::vector<DataType>& types);

/// The outside raster library's buffer format of a type; complex types map to the real
/// format of their whole sample width, anything unknown to unsigned 8-bit.
KUBO_API raster::BufferType VRKDataType2RasterBufferType(const DataType& type);

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_DATATYPE_H
