// Member bodies of the inner factories, instantiated by promotefactory.cpp.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_PROMOTEFACTORY_IMPL_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_PROMOTEFACTORY_IMPL_H

#include <array>
#include <type_traits>
#include <utility>  // std::index_sequence

#include "vrkframework/basic/core/typeconv/packedpromote.h"
#include "vrkframework/basic/kubo/raster/datatype.h"
#include "vrkframework/basic/kubo/raster/promotefactory.h"

namespace kora::kubo {
namespace detail {

constexpr unsigned int kLargestPackedBits = 31;

template <class T, unsigned int N>
typeconv::IPromote* NewSpecialPromote(bool pack) {
    if constexpr (N == 0 || N == 8 || N == 16) {
        return nullptr;
    } else if (pack) {
        return new typeconv::SpecialPromote<N, T, 1>();
    } else {
        return new typeconv::SpecialPromote<N, T, 0>();
    }
}

/// The packed converter of T for a run-time bit count of at most 31.
template <class T, std::size_t... N>
typeconv::IPromote* NewSpecialPromote(unsigned int bits, bool pack, std::index_sequence<N...>) {
    using Creator = typeconv::IPromote* (*)(bool);
    static constexpr std::array<Creator, sizeof...(N)> kCreators = {
        {&NewSpecialPromote<T, static_cast<unsigned int>(N)>...}};
    return kCreators[bits](pack);
}

}  // namespace detail

template <class T>
typeconv::IPromote* PromoteFactory::PackedFactory<T>::Create(const DataType& from,
                                                             const DataType& to) const {
    if constexpr (std::is_floating_point_v<T>) {
        return nullptr;
    } else {
        unsigned int bits = from.bits;
        bool pack = false;
        if (from.bits % 8 == 0 && to.bits % 8 != 0 && !to.isFloat) {
            bits = to.bits;
            pack = true;
        }
        if (bits == 0 || bits > detail::kLargestPackedBits) {
            return nullptr;
        }
        return detail::NewSpecialPromote<T>(
            bits, pack, std::make_index_sequence<detail::kLargestPackedBits + 1>());
    }
}

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_PROMOTEFACTORY_IMPL_H
