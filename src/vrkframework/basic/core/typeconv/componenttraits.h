// What the kernels know of each component type: its count, index, size, bit width and
// framework name, all derived from the one list of component types (private to the
// library).
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_COMPONENTTRAITS_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_COMPONENTTRAITS_H

#include <array>
#include <climits>  // CHAR_BIT
#include <cstddef>  // std::size_t
#include <type_traits>
#include <utility>  // std::index_sequence

#include "vrkframework/basic/core/typeconv/typelist.h"

namespace typeconv::detail {

template <class List>
struct ListLength : std::integral_constant<std::size_t, 0> {};
template <class Head, class Tail>
struct ListLength<priv::TypeList<Head, Tail>>
    : std::integral_constant<std::size_t, 1 + ListLength<Tail>::value> {};

template <class T, class List>
struct IndexInList;
template <class T, class Tail>
struct IndexInList<T, priv::TypeList<T, Tail>> : std::integral_constant<std::size_t, 0> {};
template <class T, class Head, class Tail>
struct IndexInList<T, priv::TypeList<Head, Tail>>
    : std::integral_constant<std::size_t, 1 + IndexInList<T, Tail>::value> {};

template <std::size_t Index, class List>
struct AtIndex : AtIndex<Index - 1, typename List::tail> {};
template <class List>
struct AtIndex<0, List> {
    using type = typename List::head;
};

/// Number of component types.
constexpr std::size_t kComponentCount = ListLength<priv::ComponentTypes>::value;

/// Index, in dispatch order, of the component type T stands for (so `long long` has the
/// index of std::int64_t where that is `long`).
template <class T>
constexpr std::size_t ComponentIndexOf() {
    return IndexInList<priv::Component<T>, priv::ComponentTypes>::value;
}

/// The component type at `Index` of the dispatch order.
template <std::size_t Index>
using ComponentAt = typename AtIndex<Index, priv::ComponentTypes>::type;

template <class T>
struct TypeTag {
    using type = T;
};

template <class F, std::size_t... Index>
void ForEachComponentTypeIn(const F& f, std::index_sequence<Index...>) {
    (f(TypeTag<ComponentAt<Index>>{}), ...);
}

/// Calls f(TypeTag<T>{}) for every component type T, in dispatch order.
template <class F>
void ForEachComponentType(const F& f) {
    ForEachComponentTypeIn(f, std::make_index_sequence<kComponentCount>());
}

template <class T>
constexpr unsigned int kBitsOf = static_cast<unsigned int>(sizeof(T) * CHAR_BIT);

#define KUBO_DETAIL_SIZE_ITEM(T, name, kind, unused) sizeof(T),
#define KUBO_DETAIL_NAME_ITEM(T, name, kind, unused) name,
#define KUBO_DETAIL_INTEGER_ITEM(T, name, kind, unused) std::is_integral_v<T>,
/// Bytes of each component type, by index.
constexpr std::array<std::size_t, kComponentCount> kComponentSizes = {
    {KUBO_COMPONENT_TYPES(KUBO_DETAIL_SIZE_ITEM, )}};
/// The framework's spelling of each component type, as function texts show it.
constexpr std::array<const char*, kComponentCount> kComponentTypeNames = {
    {KUBO_COMPONENT_TYPES(KUBO_DETAIL_NAME_ITEM, )}};
/// Whether each component type, by index, is an integer type.
constexpr std::array<bool, kComponentCount> kComponentIsInteger = {
    {KUBO_COMPONENT_TYPES(KUBO_DETAIL_INTEGER_ITEM, )}};
#undef KUBO_DETAIL_SIZE_ITEM
#undef KUBO_DETAIL_INTEGER_ITEM
#undef KUBO_DETAIL_NAME_ITEM

}  // namespace typeconv::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_COMPONENTTRAITS_H
