// The 10 x 10 ordered pairs of component types, as an X-macro for the explicit
// instantiation lists of the two-type conversion families.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_COMPONENTPAIRS_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_COMPONENTPAIRS_H

#include <cstdint>  // std::int64_t, std::uint64_t
#include <type_traits>
#include <utility>  // std::pair

#include "vrkframework/basic/core/typeconv/typelist.h"

/// Applies X(A, B) to every ordered pair of component types, source-major, in dispatch
/// order. A macro cannot expand itself, so the ten types are listed here a second time;
/// the static_assert below keeps both lists equal to ComponentTypes.
#define KUBO_FOR_EACH_COMPONENT_PAIR(X)       \
    KUBO_DETAIL_PAIRS_FROM(X, char)           \
    KUBO_DETAIL_PAIRS_FROM(X, unsigned char)  \
    KUBO_DETAIL_PAIRS_FROM(X, short)          \
    KUBO_DETAIL_PAIRS_FROM(X, unsigned short) \
    KUBO_DETAIL_PAIRS_FROM(X, int)            \
    KUBO_DETAIL_PAIRS_FROM(X, unsigned int)   \
    KUBO_DETAIL_PAIRS_FROM(X, float)          \
    KUBO_DETAIL_PAIRS_FROM(X, double)         \
    KUBO_DETAIL_PAIRS_FROM(X, std::int64_t)   \
    KUBO_DETAIL_PAIRS_FROM(X, std::uint64_t)

#define KUBO_DETAIL_PAIRS_FROM(X, A) \
    X(A, char)                       \
    X(A, unsigned char)              \
    X(A, short)                      \
    X(A, unsigned short)             \
    X(A, int)                        \
    X(A, unsigned int)               \
    X(A, float)                      \
    X(A, double)                     \
    X(A, std::int64_t)               \
    X(A, std::uint64_t)

namespace typeconv::priv::detail {

template <class Source, class Targets>
struct PairsFrom {
    using type = NullDataType;
};
template <class Source, class Head, class Tail>
struct PairsFrom<Source, TypeList<Head, Tail>> {
    using type = TypeList<std::pair<Source, Head>, typename PairsFrom<Source, Tail>::type>;
};
template <class First, class Second>
struct Concat {
    using type = Second;
};
template <class Head, class Tail, class Second>
struct Concat<TypeList<Head, Tail>, Second> {
    using type = TypeList<Head, typename Concat<Tail, Second>::type>;
};
template <class Sources, class Targets>
struct Product {
    using type = NullDataType;
};
template <class Head, class Tail, class Targets>
struct Product<TypeList<Head, Tail>, Targets> {
    using type = typename Concat<typename PairsFrom<Head, Targets>::type,
                                 typename Product<Tail, Targets>::type>::type;
};

#define KUBO_DETAIL_PAIR_ITEM(A, B) std::pair<A, B>,
static_assert(std::is_same_v<Product<ComponentTypes, ComponentTypes>::type,
                             MakeTypeList<KUBO_FOR_EACH_COMPONENT_PAIR(KUBO_DETAIL_PAIR_ITEM)
                                              NullDataType>::type>,
              "the pair list must be every ordered pair of the component types, source-major");
#undef KUBO_DETAIL_PAIR_ITEM

}  // namespace typeconv::priv::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_COMPONENTPAIRS_H
