// The ten component types every type dispatch walks, as a compile-time list and as an
// X-macro for explicit instantiations, with the descriptor each of them matches.
//
// When you add a component type, change: ComponentTypes and KUBO_FOR_EACH_COMPONENT_TYPE
// below (same place in both), the dispatch tests, and every family instantiated with the
// X-macro (its explicit instantiation lists follow automatically).
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_TYPELIST_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_TYPELIST_H

#include <climits>  // CHAR_BIT
#include <cstdint>  // std::int64_t, std::uint64_t
#include <limits>
#include <type_traits>

#include "vrkframework/basic/kubo/raster/datatype.h"

namespace typeconv::priv {

/// Ends a type list; as a list of chosen types it is the empty list.
struct NullDataType {};

/// One cell of a compile-time list.
template <class Head, class Tail>
struct TypeList {
    using head = Head;
    using tail = Tail;
};

/// TypeList<T0, TypeList<T1, ... NullDataType>> of the given types.
template <class... Types>
struct MakeTypeList {
    using type = NullDataType;
};
template <class Head, class... Rest>
struct MakeTypeList<Head, Rest...> {
    using type = TypeList<Head, typename MakeTypeList<Rest...>::type>;
};
/// A trailing NullDataType ends the list too (lets an X-macro emit "T," items).
template <>
struct MakeTypeList<NullDataType> {
    using type = NullDataType;
};

/// The component types in dispatch (search) order.
using ComponentTypes = MakeTypeList<char, unsigned char, short, unsigned short, int, unsigned int,
                                    float, double, std::int64_t, std::uint64_t>::type;

// Samples of type `char` are signed 8-bit throughout the library.
static_assert(std::is_signed_v<char>, "kubo needs a signed char");

/// The real descriptor a component type matches, derived from its traits (so `long long`
/// matches the 64-bit signed descriptor as well).
template <class T>
constexpr kora::kubo::DataType RealDescriptor() {
    static_assert(std::is_arithmetic_v<T>, "component types are arithmetic");
    constexpr unsigned int bits = sizeof(T) * CHAR_BIT;
    if constexpr (std::is_floating_point_v<T>) {
        constexpr unsigned int mantissa = std::numeric_limits<T>::digits - 1;
        return kora::kubo::DataType(bits, true, true, mantissa, bits - mantissa - 1, false);
    } else {
        return kora::kubo::DataType(bits, std::is_signed_v<T>, false, bits, 0, false);
    }
}

/// The complex descriptor whose components are of type T.
template <class T>
constexpr kora::kubo::DataType ComplexDescriptor() {
    kora::kubo::DataType type = RealDescriptor<T>();
    type.isComplex = true;
    return type;
}

}  // namespace typeconv::priv

/// Applies X to each component type, in dispatch order.
#define KUBO_FOR_EACH_COMPONENT_TYPE(X) \
    X(char)                             \
    X(unsigned char)                    \
    X(short)                            \
    X(unsigned short)                   \
    X(int)                              \
    X(unsigned int)                     \
    X(float)                            \
    X(double)                           \
    X(std::int64_t)                     \
    X(std::uint64_t)

namespace typeconv::priv::detail {
#define KUBO_DETAIL_LIST_ITEM(T) T,
static_assert(std::is_same_v<ComponentTypes, MakeTypeList<KUBO_FOR_EACH_COMPONENT_TYPE(
                                                 KUBO_DETAIL_LIST_ITEM) NullDataType>::type>,
              "the type list and the X-macro must name the same types in the same order");
#undef KUBO_DETAIL_LIST_ITEM
}  // namespace typeconv::priv::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_TYPELIST_H
