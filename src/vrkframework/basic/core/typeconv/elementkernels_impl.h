// The element conversion loops of every pair of component types, compiled once per kernel
// variant (private to the library; included by the kernel tables only). Everything has
// internal linkage, so that the copies of different variants never mix.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_ELEMENTKERNELS_IMPL_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_ELEMENTKERNELS_IMPL_H

#include <cstdint>
#include <cstring>  // std::memcpy
#include <type_traits>

#include "vrkframework/basic/core/kernels/bytewidening.h"
#include "vrkframework/basic/core/kernels/floatingnarrowing.h"
#include "vrkframework/basic/core/kernels/floatingtowideintegers.h"
#include "vrkframework/basic/core/kernels/wideintegernarrowing.h"
#include "vrkframework/basic/core/typeconv/conversionkernels.h"
#include "vrkframework/basic/core/typeconv/saturate.h"

namespace typeconv::detail {
namespace {

/// Converts every Stride-th value: 1 for contiguous values, 2 for the real parts of
/// (real, imaginary) pairs, read in place rather than gathered first.
template <class A, class B, std::size_t Stride>
void ConvertLoop(const A* __restrict src, B* __restrict dst, std::size_t count) {
    for (std::size_t i = 0; i < count; ++i) {
        dst[i] = ConvertSample<B>(src[Stride * i]);
    }
}

template <class A, class B, std::size_t Stride>
void Convert(const void* src, void* dst, std::size_t count) {
    ConvertLoop<A, B, Stride>(static_cast<const A*>(src), static_cast<B*>(dst), count);
}

/// Whole vectors converted as the variant spells them out (`Vectors` returns how many
/// samples that was), the rest by the loop.
template <class A, class B, std::size_t (*Vectors)(const A*, B*, std::size_t)>
void VectorsThenLoop(const void* src, void* dst, std::size_t count) {
    const auto* from = static_cast<const A*>(src);
    auto* to = static_cast<B*>(dst);
    const std::size_t done = Vectors(from, to, count);
    ConvertLoop<A, B, 1>(from + done, to + done, count - done);
}

/// `Convert`, or vectors spelled out where the variant has them for the pair: 8-bit samples
/// widened (bytewidening.h), floating samples narrowed (floatingnarrowing.h) and, with
/// 256-bit vectors, floating samples converted into 32- and 64-bit integers
/// (floatingtowideintegers.h) and 64-bit integers narrowed (wideintegernarrowing.h).
template <class A, class B, std::size_t Stride>
constexpr ConvertKernel SpelledOutOrConvert() {
#if KUBO_DETAIL_WIDE_BYTE_SHUFFLES
    if constexpr (Stride == 1 && kora::kubo::detail::kWidensBytes<A, B>) {
        return &VectorsThenLoop<A, B, &kora::kubo::detail::WidenByteVectors<A, B>>;
    }
#endif
#if KUBO_DETAIL_VECTOR_BITS >= 256
    if constexpr (Stride == 1 && kora::kubo::detail::kNarrowsFloating<A, B>) {
        return &VectorsThenLoop<A, B, &kora::kubo::detail::NarrowFloatingVectors<A, B>>;
    }
#endif
#if KUBO_DETAIL_VECTOR_BITS == 256
    if constexpr (Stride == 1 && kora::kubo::detail::kConvertsFloatingToWide<A, B>) {
        return &VectorsThenLoop<A, B, &kora::kubo::detail::ConvertFloatingToWideVectors<A, B>>;
    }
    if constexpr (Stride == 1 && kora::kubo::detail::kNarrowsWideIntegers<A, B>) {
        return &VectorsThenLoop<A, B, &kora::kubo::detail::NarrowWideIntegerVectors<A, B>>;
    }
#endif
    return &Convert<A, B, Stride>;
}

template <std::size_t Size>
using UnsignedOfSize = std::conditional_t<
    Size == 1, std::uint8_t,
    std::conditional_t<Size == 2, std::uint16_t,
                       std::conditional_t<Size == 4, std::uint32_t, std::uint64_t>>>;

template <std::size_t Size>
void Copy(const void* src, void* dst, std::size_t count) {
    if (count != 0) {
        std::memcpy(dst, src, count * Size);
    }
}

/// Pairs whose rule is the identity on the bits share the copy (or, strided, the unsigned
/// identity); unsigned sources into wider integers (zero extension) and signed 8/16/32-bit
/// sources into 64-bit integers (negatives to 0) give the same bits for both signs of the
/// destination and share the unsigned destination's kernel.
///
/// Every variant compiles every pair; a processor family that runs some of them faster
/// from the variant below takes them from there (processortuning.h).
template <class A, class B, std::size_t Stride>
constexpr ConvertKernel SelectConvertKernel() {
    constexpr bool kSameBits =
        sizeof(A) == sizeof(B) && std::is_integral_v<A> && std::is_integral_v<B> &&
        (std::is_signed_v<A> == std::is_signed_v<B> || (std::is_signed_v<A> && sizeof(A) == 8));
    if constexpr ((std::is_same_v<A, B> || kSameBits) && Stride == 1) {
        return &Copy<sizeof(A)>;
    } else if constexpr (std::is_same_v<A, B> || kSameBits) {
        return &Convert<UnsignedOfSize<sizeof(A)>, UnsignedOfSize<sizeof(A)>, Stride>;
    } else if constexpr (std::is_integral_v<A> && std::is_integral_v<B> &&
                         (std::is_unsigned_v<A> ? sizeof(B) > sizeof(A)
                                                : sizeof(B) == 8 && sizeof(A) < 8)) {
        return SpelledOutOrConvert<A, std::make_unsigned_t<B>, Stride>();
    } else {
        return SpelledOutOrConvert<A, B, Stride>();
    }
}

template <class T>
void InterleaveWithZeros(const void* values, void* pairs, std::size_t count) {
    const T* __restrict in = static_cast<const T*>(values);
    T* __restrict out = static_cast<T*>(pairs);
    for (std::size_t i = 0; i < count; ++i) {
        out[2 * i] = in[i];
        out[2 * i + 1] = 0;
    }
}

}  // namespace
}  // namespace typeconv::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_ELEMENTKERNELS_IMPL_H
