// The predefined sample descriptors and the component types, walked at compile time or
// chosen at run time, for the tests and fuzz targets that sweep sample types.
#ifndef KUBO_TESTS_SUPPORT_DATATYPES_H
#define KUBO_TESTS_SUPPORT_DATATYPES_H

#include <cstddef>  // std::size_t
#include <string>
#include <type_traits>
#include <utility>  // std::index_sequence

#include "vrkframework/basic/core/typeconv/componenttraits.h"
#include "vrkframework/basic/kubo/raster/datatype.h"

namespace kubo_test {

using kora::kubo::DataType;

/// The 21 predefined descriptors: 1U, the real types, then the complex ones.
inline const DataType kPredefinedTypes[] = {
    DataType::Type1U,   DataType::Type8U,   DataType::Type8S,   DataType::Type16U,
    DataType::Type16S,  DataType::Type32U,  DataType::Type32S,  DataType::Type32R,
    DataType::Type64U,  DataType::Type64S,  DataType::Type64R,  DataType::TypeC8U,
    DataType::TypeC8S,  DataType::TypeC16U, DataType::TypeC16S, DataType::TypeC32U,
    DataType::TypeC32S, DataType::TypeC32R, DataType::TypeC64U, DataType::TypeC64S,
    DataType::TypeC64R};

using typeconv::detail::ForEachComponentType;

/// Calls f(TypeTag<T>{}) for the component type T at `index` in dispatch order; does nothing
/// for other indexes.
template <class F>
void WithComponent(int index, const F& f) {
    int at = 0;
    ForEachComponentType([&](auto tag) {
        if (at++ == index) {
            f(tag);
        }
    });
}

/// A component type's name in test names: Int16, UInt8, Float32, ...
template <class T>
std::string TypeName() {
    if constexpr (std::is_floating_point_v<T>) {
        return sizeof(T) == 4 ? "Float32" : "Float64";
    } else {
        return std::string(std::is_signed_v<T> ? "Int" : "UInt") + std::to_string(sizeof(T) * 8);
    }
}

}  // namespace kubo_test

#endif  // KUBO_TESTS_SUPPORT_DATATYPES_H
