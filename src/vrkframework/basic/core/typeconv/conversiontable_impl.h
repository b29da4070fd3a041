// The table of conversion kernels of one kernel variant: the element loops of every pair
// and layout and the packed codec of every integer type (private to the library; included
// once per variant by the kernel tables).
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_CONVERSIONTABLE_IMPL_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_CONVERSIONTABLE_IMPL_H

#include <array>
#include <type_traits>
#include <utility>  // std::index_sequence

#include "vrkframework/basic/core/kernels/streamingcopy_impl.h"
#include "vrkframework/basic/core/typeconv/componenttraits.h"
#include "vrkframework/basic/core/typeconv/conversionkernels.h"
#include "vrkframework/basic/core/typeconv/elementkernels_impl.h"
#include "vrkframework/basic/core/typeconv/packedcodec_impl.h"

namespace typeconv::detail {
namespace {

template <std::size_t Index>
using Component = ComponentAt<Index>;

template <class A, std::size_t Stride, std::size_t... To>
constexpr std::array<ConvertKernel, kComponentCount> MakeConvertRow(std::index_sequence<To...>) {
    return {{SelectConvertKernel<A, Component<To>, Stride>()...}};
}

template <class T>
constexpr UnpackKernel SelectUnpackKernel() {
    if constexpr (std::is_integral_v<T>) {
        return &Unpack<std::make_unsigned_t<T>>;
    } else {
        return nullptr;
    }
}

template <class T>
constexpr PackKernel SelectPackKernel() {
    if constexpr (std::is_integral_v<T>) {
        return &Pack<T>;
    } else {
        return nullptr;
    }
}

template <std::size_t... Index>
constexpr KernelSet MakeKernelSet(std::index_sequence<Index...> indices) {
    return KernelSet{
        {{MakeConvertRow<Component<Index>, 1>(indices)...}},
        {{MakeConvertRow<Component<Index>, 2>(indices)...}},
        kWideIntegerConversions
            ? std::array<ConvertKernel, 4>{}
            : std::array<ConvertKernel, 4>{{&InterleaveWithZeros<std::uint8_t>,
                                            &InterleaveWithZeros<std::uint16_t>,
                                            &InterleaveWithZeros<std::uint32_t>,
                                            &InterleaveWithZeros<std::uint64_t>}},
        {{SelectUnpackKernel<Component<Index>>()...}},
        {{SelectPackKernel<Component<Index>>()...}},
        &kora::kubo::detail::CopyBypassingCaches,
    };
}

/// The conversion kernels of the variant this file is compiled for.
constexpr KernelSet kConversionKernels = MakeKernelSet(std::make_index_sequence<kComponentCount>());

}  // namespace
}  // namespace typeconv::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_CONVERSIONTABLE_IMPL_H
