// Run-time choice of a class template instance from a vector of sample descriptors.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPEDISPATCH_EXTENDTYPEDISPATCH_H
#define VRKFRAMEWORK_BASIC_CORE_TYPEDISPATCH_EXTENDTYPEDISPATCH_H

#include <cstddef>  // std::size_t
#include <type_traits>
#include <vector>

#include "vrkframework/basic/core/typeconv/typelist.h"
#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/raster/datatype.h"

#if defined(_MSC_VER)
#define KUBO_DETAIL_DISPATCH_SIGNATURE __FUNCSIG__
#else
#define KUBO_DETAIL_DISPATCH_SIGNATURE __PRETTY_FUNCTION__
#endif

/// Run-time choice of a class template instance from sample descriptors.
namespace kora::typedispatch {

/// Adapts a one-parameter class template: creates `new Template<T0>` as `Interface*`.
template <template <class> class Template, class InterfaceType>
struct Factory1Template {
    using Interface = InterfaceType;  ///< what Create returns
    /// A new Template<T0>; the caller owns it.
    template <class T0>
    static Interface* Create() {
        return new Template<T0>();
    }
};

/// Adapts a two-parameter class template: T0 is chosen for position 0, T1 for position 1.
template <template <class, class> class Template, class InterfaceType>
struct Factory2Template {
    using Interface = InterfaceType;  ///< what Create returns
    /// A new Template<T0, T1>; the caller owns it.
    template <class T0, class T1>
    static Interface* Create() {
        return new Template<T0, T1>();
    }
};

/// Used by ExtendDispatchTypes: types[position]; a vector too short for it is reported
/// (kora::Exception "Not enough type in the vector for the dispatcher you are using.") at
/// `shortLine`, with `function` as the function text. Out of line, so no caller's compiler
/// sees an index past a short literal list.
KUBO_API const kora::kubo::DataType& DispatchedDescriptor(
    const std::vector<kora::kubo::DataType>& types, std::size_t position, unsigned int shortLine,
    const char* function);
/// Used by ExtendDispatchTypes: reports a descriptor that matches no candidate
/// (kora::Exception "Invalid type requested.", line 175).
[[noreturn]] KUBO_API void ThrowUnmatchedDescriptor(const char* function);

namespace detail {

/// True when `type` equals T's real descriptor or, if accepted, its complex one.
template <class T>
bool Matches(const kora::kubo::DataType& type, bool acceptComplex) {
    constexpr kora::kubo::DataType kReal = typeconv::priv::RealDescriptor<T>();
    constexpr kora::kubo::DataType kComplex = typeconv::priv::ComplexDescriptor<T>();
    return type == kReal || (acceptComplex && type == kComplex);
}

/// Calls Factory::Create with the types of a chosen list, position 0 first.
template <class Factory, class Chosen, class... Ordered>
struct CreateChosen;
template <class Factory, class... Ordered>
struct CreateChosen<Factory, typeconv::priv::NullDataType, Ordered...> {
    static typename Factory::Interface* Create() { return Factory::template Create<Ordered...>(); }
};
template <class Factory, class Head, class Tail, class... Ordered>
struct CreateChosen<Factory, typeconv::priv::TypeList<Head, Tail>, Ordered...>
    : CreateChosen<Factory, Tail, Ordered..., Head> {};

}  // namespace detail

/// Resolves positions N-1 down to 0 of a descriptor vector against the candidate list,
/// first match wins, then creates the factory's object for the chosen types.
///
/// - `N`: positions still to resolve; `FullList`: all candidates; `Candidates`: those still
///   to try at position N-1; `Chosen`: types chosen for positions N and above.
/// - `Dispatch(types, acceptComplex)` reads only positions 0..N-1; with `acceptComplex` a
///   position also matches the complex descriptor of a candidate. It returns a new object
///   the caller owns, never null.
/// - Throws kora::Exception "Not enough type in the vector for the dispatcher you are
///   using." when `types` is too short (line 114, or 163 when only the last candidate is
///   left), and "Invalid type requested." (line 175) when no candidate matches.
template <class Factory, int N, class FullList, class Candidates, class Chosen>
struct ExtendDispatchTypes;

/// The dispatch with candidates left to try at position N - 1.
template <class Factory, int N, class FullList, class Head, class Tail, class Chosen>
struct ExtendDispatchTypes<Factory, N, FullList, typeconv::priv::TypeList<Head, Tail>, Chosen> {
    static_assert(N >= 1, "a dispatch resolves at least one position");

    /// See ExtendDispatchTypes.
    static typename Factory::Interface* Dispatch(const std::vector<kora::kubo::DataType>& types,
                                                 bool acceptComplex) {
        constexpr bool kLastCandidate = std::is_same_v<Tail, typeconv::priv::NullDataType>;
        const kora::kubo::DataType& type =
            DispatchedDescriptor(types, static_cast<std::size_t>(N - 1),
                                 kLastCandidate ? 163u : 114u, KUBO_DETAIL_DISPATCH_SIGNATURE);
        if (detail::Matches<Head>(type, acceptComplex)) {
            using NowChosen = typeconv::priv::TypeList<Head, Chosen>;
            if constexpr (N == 1) {
                return detail::CreateChosen<Factory, NowChosen>::Create();
            } else {
                return ExtendDispatchTypes<Factory, N - 1, FullList, FullList, NowChosen>::Dispatch(
                    types, acceptComplex);
            }
        }
        if constexpr (kLastCandidate) {
            ThrowUnmatchedDescriptor(KUBO_DETAIL_DISPATCH_SIGNATURE);
        } else {
            return ExtendDispatchTypes<Factory, N, FullList, Tail, Chosen>::Dispatch(types,
                                                                                     acceptComplex);
        }
    }
};

}  // namespace kora::typedispatch

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPEDISPATCH_EXTENDTYPEDISPATCH_H
