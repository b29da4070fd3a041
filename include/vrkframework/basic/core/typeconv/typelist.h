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

/// The first type of the list with the size, signedness and floatness of T; NullDataType
/// when none has them.
template <class T, class List>
struct FindComponent {
    using type = NullDataType;
};
template <class T, class Head, class Tail>
struct FindComponent<T, TypeList<Head, Tail>> {
    using type =
        std::conditional_t<sizeof(Head) == sizeof(T) &&
                               std::is_signed_v<Head> == std::is_signed_v<T> &&
                               std::is_floating_point_v<Head> == std::is_floating_point_v<T>,
                           Head, typename FindComponent<T, Tail>::type>;
};

/// The component type a sample type T stands for: T itself for the ten component types;
/// another arithmetic type of the same traits, such as `long long` where `std::int64_t` is
/// `long`, maps to the component type that has them. The public conversion templates are
/// written on it, so that they instantiate for every such type.
template <class T>
struct ComponentOf {
    static_assert(std::is_arithmetic_v<T>, "samples are of an arithmetic type");
    using type = typename FindComponent<T, ComponentTypes>::type;
    static_assert(!std::is_same_v<type, NullDataType>,
                  "no component type has the size, signedness and floatness of T");
};
template <class T>
using Component = typename ComponentOf<T>::type;

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
