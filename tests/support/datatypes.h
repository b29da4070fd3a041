// The predefined sample descriptors, and the component type of an index chosen at run
// time, for the tests and fuzz targets that sweep sample types.
#ifndef KUBO_TESTS_SUPPORT_DATATYPES_H
#define KUBO_TESTS_SUPPORT_DATATYPES_H

#include <cstdint>  // std::int64_t, std::uint64_t

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

template <class T>
struct Tag {
    using type = T;
};

/// Calls f(Tag<T>{}) for the component type T at `index` in dispatch order (signed 8-bit,
/// unsigned 8-bit, 16-bit, 32-bit, float, double, 64-bit); does nothing for other indexes.
template <class F>
void WithComponent(int index, const F& f) {
    switch (index) {
        case 0:
            return f(Tag<char>{});
        case 1:
            return f(Tag<unsigned char>{});
        case 2:
            return f(Tag<short>{});
        case 3:
            return f(Tag<unsigned short>{});
        case 4:
            return f(Tag<int>{});
        case 5:
            return f(Tag<unsigned int>{});
        case 6:
            return f(Tag<float>{});
        case 7:
            return f(Tag<double>{});
        case 8:
            return f(Tag<std::int64_t>{});
        case 9:
            return f(Tag<std::uint64_t>{});
        default:
            break;
    }
}

}  // namespace kubo_test

#endif  // KUBO_TESTS_SUPPORT_DATATYPES_H
