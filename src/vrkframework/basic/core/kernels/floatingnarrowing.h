// Floating samples rounded into 8- and 16-bit integers, one 512-bit vector at a time: the
// clamp happens in the floating lanes, where minimum and maximum let NaN through in the
// chosen operand order, and one truncating conversion into integer lanes of the same width
// and one truncating narrowing follow. NaN converts to the lowest integer of the lane,
// whose low bytes are 0, as the rules have it. The vectorised loop cannot clamp in the
// floating lanes (a C++ conversion of NaN is undefined), so it clamps the converted 64-bit
// lanes with compares and blends and narrows them through permutes, several shuffles per
// vector more. Private to the library; compiled only with 512-bit vectors, with internal
// linkage, so that the copies of different kernel variants never mix.
#ifndef VRKFRAMEWORK_BASIC_CORE_KERNELS_FLOATINGNARROWING_H
#define VRKFRAMEWORK_BASIC_CORE_KERNELS_FLOATINGNARROWING_H

#include "vrkframework/basic/core/kernels/capabilities.h"

#if KUBO_DETAIL_VECTOR_BITS == 512
#include <immintrin.h>

#include <cstddef>  // std::size_t
#include <cstring>  // std::memcpy
#include <limits>
#include <type_traits>

namespace kora::kubo::detail {
namespace {

/// Whether `NarrowFloatingVectors` takes `Floating` samples into `Narrow`.
template <class Floating, class Narrow>
constexpr bool kNarrowsFloating = std::is_floating_point_v<Floating>&& std::is_integral_v<Narrow> &&
                                  sizeof(Narrow) <= 2;

/// The operations `NarrowFloatingVectors` needs on one vector of floats or doubles.
template <class Floating>
struct FloatingVector;

template <>
struct FloatingVector<double> {
    using Type = __m512d;
    /// Every lane, written as a mask: the unmasked forms trip GCC 12's uninitialised-use
    /// warning, and the compiler drops a full mask.
    static constexpr __mmask8 kAllLanes = 0xFF;
    static Type Load(const double* from) { return _mm512_loadu_pd(from); }
    static Type Splat(double value) { return _mm512_set1_pd(value); }
    static Type Add(Type a, Type b) { return _mm512_add_pd(a, b); }
    /// The second operand where either is NaN, as for `Max`.
    static Type Min(Type a, Type b) { return _mm512_maskz_min_pd(kAllLanes, a, b); }
    static Type Max(Type a, Type b) { return _mm512_maskz_max_pd(kAllLanes, a, b); }
    /// |magnitude| with the sign of `sign`, for a non-negative magnitude.
    static Type WithSignOf(Type magnitude, Type sign) {
        return _mm512_or_pd(magnitude, _mm512_and_pd(sign, Splat(-0.0)));
    }
    static __m512i Truncate(Type value) { return _mm512_maskz_cvttpd_epi64(kAllLanes, value); }
};

template <>
struct FloatingVector<float> {
    using Type = __m512;
    static constexpr __mmask16 kAllLanes = 0xFFFF;
    static Type Load(const float* from) { return _mm512_loadu_ps(from); }
    static Type Splat(float value) { return _mm512_set1_ps(value); }
    static Type Add(Type a, Type b) { return _mm512_add_ps(a, b); }
    static Type Min(Type a, Type b) { return _mm512_maskz_min_ps(kAllLanes, a, b); }
    static Type Max(Type a, Type b) { return _mm512_maskz_max_ps(kAllLanes, a, b); }
    static Type WithSignOf(Type magnitude, Type sign) {
        return _mm512_or_ps(magnitude, _mm512_and_ps(sign, Splat(-0.0f)));
    }
    static __m512i Truncate(Type value) { return _mm512_maskz_cvttps_epi32(kAllLanes, value); }
};

/// Keeps the low `NarrowBytes` bytes of each `LaneBytes`-byte lane, packed together.
template <std::size_t LaneBytes, std::size_t NarrowBytes>
auto KeepLowBytes(__m512i lanes) {
    if constexpr (LaneBytes == 8 && NarrowBytes == 1) {
        return _mm512_maskz_cvtepi64_epi8(__mmask8{0xFF}, lanes);
    } else if constexpr (LaneBytes == 8) {
        return _mm512_maskz_cvtepi64_epi16(__mmask8{0xFF}, lanes);
    } else if constexpr (NarrowBytes == 1) {
        return _mm512_maskz_cvtepi32_epi8(__mmask16{0xFFFF}, lanes);
    } else {
        return _mm512_maskz_cvtepi32_epi16(__mmask16{0xFFFF}, lanes);
    }
}

/// Converts the whole vectors' worth at the start of `count` samples as the element loop
/// would: half away from zero into signed integers (the half added in the source
/// precision), plus a half and truncated into unsigned ones, saturated at both ends, NaN
/// into 0. Returns how many samples that was.
template <class Floating, class Narrow>
std::size_t NarrowFloatingVectors(const Floating* in, Narrow* out, std::size_t count) {
    static_assert(kNarrowsFloating<Floating, Narrow>);
    using Vector = FloatingVector<Floating>;
    constexpr std::size_t kLanes = 64 / sizeof(Floating);
    const typename Vector::Type half = Vector::Splat(Floating(0.5));
    const typename Vector::Type high = Vector::Splat(std::numeric_limits<Narrow>::max());
    const typename Vector::Type low = Vector::Splat(std::numeric_limits<Narrow>::lowest());
    std::size_t i = 0;
    for (; i + kLanes <= count; i += kLanes) {
        const typename Vector::Type x = Vector::Load(in + i);
        typename Vector::Type clamped;
        if constexpr (std::is_signed_v<Narrow>) {
            const typename Vector::Type y = Vector::Add(x, Vector::WithSignOf(half, x));
            clamped = Vector::Max(low, Vector::Min(high, y));  // NaN stays NaN
        } else {
            const typename Vector::Type y = Vector::Add(x, half);
            clamped = Vector::Min(high, Vector::Max(y, low));  // NaN gives 0
        }
        const auto narrow =
            KeepLowBytes<sizeof(Floating), sizeof(Narrow)>(Vector::Truncate(clamped));
        std::memcpy(out + i, &narrow, kLanes * sizeof(Narrow));
    }
    return i;
}

}  // namespace
}  // namespace kora::kubo::detail

#endif  // KUBO_DETAIL_VECTOR_BITS == 512

#endif  // VRKFRAMEWORK_BASIC_CORE_KERNELS_FLOATINGNARROWING_H
