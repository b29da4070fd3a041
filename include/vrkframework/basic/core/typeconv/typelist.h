// The ten component types every type dispatch walks, listed once, and every form derived
// from that list: the compile-time list ComponentTypes, the X-macros that write explicit
// instantiations, and the descriptor each type matches.
//
// When you add a component type, add one line to KUBO_COMPONENT_TYPES below (its place is
// its dispatch order). The type list, the instantiation lists, the component count,
// indices, sizes, bit widths and names, the conversion kernel tables and the test sweeps
// follow from it. By hand you then give it:
//   - a real and a complex descriptor that DataType names (raster/datatype.h) and a
//     NativeDataTypeCode, if it is to have masks (raster/nativedatatype.h);
//   - its wider storage type and untested marker for listed no-data channels
//     (src/.../masks/nodatastorage.h);
//   - its per-value conversion rules against every other type (src/.../typeconv/saturate.h)
//     and their reference in the tests (tests/support/promotereference.h);
//   - the numpy dtype of the Python module (python/src/datatypes.cpp).
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_TYPELIST_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_TYPELIST_H

#include <climits>  // CHAR_BIT
#include <cstdint>  // std::int64_t, std::uint64_t
#include <limits>
#include <type_traits>

#include "vrkframework/basic/kubo/raster/datatype.h"

/// The component types, one line each: X(type, framework name, INTEGER or FLOATING, arg),
/// in dispatch order; `arg` is passed through. The one list every other is derived from.
#define KUBO_COMPONENT_TYPES(X, arg)                  \
    X(char, "char", INTEGER, arg)                     \
    X(unsigned char, "unsigned char", INTEGER, arg)   \
    X(short, "short", INTEGER, arg)                   \
    X(unsigned short, "unsigned short", INTEGER, arg) \
    X(int, "int", INTEGER, arg)                       \
    X(unsigned int, "unsigned int", INTEGER, arg)     \
    X(float, "float", FLOATING, arg)                  \
    X(double, "double", FLOATING, arg)                \
    X(std::int64_t, "__int64", INTEGER, arg)          \
    X(std::uint64_t, "unsigned __int64", INTEGER, arg)

/// The compile-time type lists of the type dispatcher.
namespace typeconv::priv {

/// Ends a type list; as a list of chosen types it is the empty list.
struct NullDataType {};

/// One cell of a compile-time list.
template <class Head, class Tail>
struct TypeList {
    using head = Head;  ///< the first type
    using tail = Tail;  ///< the rest of the list
};

/// TypeList<T0, TypeList<T1, ... NullDataType>> of the given types.
template <class... Types>
struct MakeTypeList {
    using type = NullDataType;  ///< the list
};
/// A list with a first type.
template <class Head, class... Rest>
struct MakeTypeList<Head, Rest...> {
    using type = TypeList<Head, typename MakeTypeList<Rest...>::type>;  ///< the list
};
/// A trailing NullDataType ends the list too (lets an X-macro emit "T," items).
template <>
struct MakeTypeList<NullDataType> {
    using type = NullDataType;  ///< the empty list
};

#define KUBO_DETAIL_LIST_ITEM(T, name, kind, unused) T,
/// The component types in dispatch (search) order.
using ComponentTypes =
    MakeTypeList<KUBO_COMPONENT_TYPES(KUBO_DETAIL_LIST_ITEM, ) NullDataType>::type;
#undef KUBO_DETAIL_LIST_ITEM

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
    using type = NullDataType;  ///< none found
};
/// The search in a list with a first type.
template <class T, class Head, class Tail>
struct FindComponent<T, TypeList<Head, Tail>> {
    /// Head when it has T's traits, else the search in the tail.
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
    /// The component type.
    using type = typename FindComponent<T, ComponentTypes>::type;
    static_assert(!std::is_same_v<type, NullDataType>,
                  "no component type has the size, signedness and floatness of T");
};
/// The component type a sample type T stands for (see ComponentOf).
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

/// Applies X(T) to each component type, in dispatch order.
#define KUBO_FOR_EACH_COMPONENT_TYPE(X) KUBO_COMPONENT_TYPES(KUBO_DETAIL_TYPE_ONLY, X)
#define KUBO_DETAIL_TYPE_ONLY(T, name, kind, X) X(T)

/// Applies X(A, B) to every ordered pair of component types, source-major, in dispatch
/// order. The list is walked inside its own walk: the inner walk is deferred past the outer
/// one and expanded by one more scan, as a macro cannot expand within its own expansion.
#define KUBO_FOR_EACH_COMPONENT_PAIR(X) \
    KUBO_DETAIL_EXPAND(KUBO_COMPONENT_TYPES(KUBO_DETAIL_PAIRS_FROM, X))
#define KUBO_DETAIL_PAIRS_FROM(A, name, kind, X) \
    KUBO_DETAIL_DEFER(KUBO_DETAIL_TYPES)()(KUBO_DETAIL_PAIR_WITH, (X, A))
#define KUBO_DETAIL_PAIR_WITH(B, name, kind, XA) \
    KUBO_DETAIL_APPLY_PAIR(KUBO_DETAIL_FIRST XA, KUBO_DETAIL_SECOND XA, B)
#define KUBO_DETAIL_APPLY_PAIR(X, A, B) X(A, B)
#define KUBO_DETAIL_FIRST(X, A) X
#define KUBO_DETAIL_SECOND(X, A) A
#define KUBO_DETAIL_TYPES() KUBO_COMPONENT_TYPES
#define KUBO_DETAIL_EMPTY()
#define KUBO_DETAIL_DEFER(M) M KUBO_DETAIL_EMPTY()
#define KUBO_DETAIL_EXPAND(...) __VA_ARGS__

/// Applies X(N, T) to every packed bit count N (1 to 31 but 8 and 16) and integer component
/// type T: the layouts of the packed converters.
#define KUBO_FOR_EACH_PACKED_LAYOUT(X) KUBO_COMPONENT_TYPES(KUBO_DETAIL_PACKED_OF, X)
#define KUBO_DETAIL_PACKED_OF(T, name, kind, X) KUBO_DETAIL_PACKED_##kind(X, T)
#define KUBO_DETAIL_PACKED_FLOATING(X, T)
// clang-format off
#define KUBO_DETAIL_PACKED_INTEGER(X, T)                                                       \
    X(1, T) X(2, T) X(3, T) X(4, T) X(5, T) X(6, T) X(7, T) X(9, T) X(10, T) X(11, T) X(12, T) \
    X(13, T) X(14, T) X(15, T) X(17, T) X(18, T) X(19, T) X(20, T) X(21, T) X(22, T)         \
    X(23, T) X(24, T) X(25, T) X(26, T) X(27, T) X(28, T) X(29, T) X(30, T) X(31, T)
// clang-format on

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_TYPELIST_H
