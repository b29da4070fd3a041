// Floating samples rounded into 8- and 16-bit integers a vector at a time. The half is
// added in the source precision, then:
// - with 512-bit vectors, doubles are clamped in their lanes, where minimum and maximum let
//   NaN through in the chosen operand order, truncated into 64-bit lanes (NaN into the
//   lowest integer, whose low half is 0, as the rules have it), and the low halves of two
//   vectors are gathered into one by a two-source permute;
// - floats, and doubles with 256-bit vectors, are clamped from above only and truncated
//   into 32-bit lanes. NaN gives 0 through a mask of the ordered lanes for signed results,
//   and for unsigned ones through the saturation of the lowest integer it truncates to;
//   with 256-bit vectors floats bound for signed results are rounded on their magnitude,
//   which a maximum turns to 0 for NaN, and take their signs back after the truncation.
// The 32-bit lanes are narrowed by saturating packs, which clamp floats from below, two or
// four vectors at a time: a pack takes one shuffle for two vectors where a narrowing of
// 64-bit lanes takes two for one.
// The vectorised loop cannot clamp before converting (a C++ conversion of NaN is undefined),
// so it clamps the converted lanes with compares and blends (two operations each without
// mask registers) and narrows them through permutes. Private to the library; compiled only
// with 256- or 512-bit vectors, with internal linkage, so that the copies of different
// kernel variants never mix.
#ifndef VRKFRAMEWORK_BASIC_CORE_KERNELS_FLOATINGNARROWING_H
#define VRKFRAMEWORK_BASIC_CORE_KERNELS_FLOATINGNARROWING_H

#include "vrkframework/basic/core/kernels/capabilities.h"
#include "vrkframework/basic/core/kernels/lanepieces.h"
#include "vrkframework/basic/core/kernels/plushalf.h"

#if KUBO_DETAIL_VECTOR_BITS >= 256
#include <immintrin.h>

#include <cstddef>  // std::size_t
#include <limits>
#include <type_traits>

namespace kora::kubo::detail {
namespace {

/// Whether `NarrowFloatingVectors` takes `Floating` samples into `Narrow`.
template <class Floating, class Narrow>
constexpr bool kNarrowsFloating = std::is_floating_point_v<Floating>&& std::is_integral_v<Narrow> &&
                                  sizeof(Narrow) <= 2;

#if KUBO_DETAIL_VECTOR_BITS == 512
// Every lane, written as a mask: the unmasked forms trip GCC 12's uninitialised-use
// warning, and the compiler drops a full mask.
constexpr __mmask8 kEightLanes = 0xFF;
constexpr __mmask16 kSixteenLanes = 0xFFFF;

/// 16 floats rounded into 32-bit lanes for the packs into `Narrow`.
template <class Narrow>
__m512i SixteenForPacking(const float* in) {
    const __m512 y = PlusHalf<std::is_signed_v<Narrow>>(_mm512_loadu_ps(in));
    const __m512 high = _mm512_set1_ps(std::numeric_limits<Narrow>::max());
    const __m512 clamped = _mm512_maskz_min_ps(kSixteenLanes, high, y);  // NaN stays NaN
    if constexpr (std::is_signed_v<Narrow>) {
        return _mm512_maskz_cvttps_epi32(_mm512_cmp_ps_mask(y, y, _CMP_ORD_Q), clamped);
    } else {
        return _mm512_maskz_cvttps_epi32(kSixteenLanes, clamped);
    }
}

/// 16 doubles rounded into 32-bit lanes for the packs into `Narrow`: clamped at both ends
/// in their own lanes, truncated into 64-bit lanes (NaN into the lowest integer, whose low
/// half is 0), whose low halves one two-source permute gathers.
template <class Narrow>
__m512i SixteenForPacking(const double* in) {
    constexpr bool kSigned = std::is_signed_v<Narrow>;
    const __m512d high = _mm512_set1_pd(std::numeric_limits<Narrow>::max());
    const __m512d low = _mm512_set1_pd(std::numeric_limits<Narrow>::lowest());
    const auto eight = [&](const double* at) {
        const __m512d y = PlusHalf<kSigned>(_mm512_loadu_pd(at));
        // Where either operand is NaN, minimum and maximum return the second.
        const __m512d clamped =
            kSigned
                ? _mm512_maskz_max_pd(kEightLanes, low, _mm512_maskz_min_pd(kEightLanes, high, y))
                : _mm512_maskz_min_pd(kEightLanes, high, _mm512_maskz_max_pd(kEightLanes, y, low));
        return _mm512_maskz_cvttpd_epi64(kEightLanes, clamped);
    };
    const __m512i lowHalves =
        _mm512_set_epi32(30, 28, 26, 24, 22, 20, 18, 16, 14, 12, 10, 8, 6, 4, 2, 0);
    return _mm512_maskz_permutex2var_epi32(kSixteenLanes, eight(in), lowHalves, eight(in + 8));
}

template <class Narrow>
__m512i PackIntoWords(__m512i a, __m512i b) {
    return std::is_signed_v<Narrow> ? _mm512_packs_epi32(a, b) : _mm512_packus_epi32(a, b);
}

/// Rounds 64 bytes' worth of samples into `out`. The packs work within 128-bit lanes, so
/// the pieces of the operands come out interleaved and one permute puts them in order.
template <class Narrow, class Floating>
void NarrowIntoALine(const Floating* in, Narrow* out) {
    __m512i line;
    if constexpr (sizeof(Narrow) == 2) {
        // Pieces of 4 words: a0 b0 a1 b1 a2 b2 a3 b3.
        const __m512i words = PackIntoWords<Narrow>(SixteenForPacking<Narrow>(in),
                                                    SixteenForPacking<Narrow>(in + 16));
        line = _mm512_maskz_permutexvar_epi64(kEightLanes, _mm512_set_epi64(7, 5, 3, 1, 6, 4, 2, 0),
                                              words);
    } else {
        // Pieces of 4 bytes: a0 b0 c0 d0 a1 b1 c1 d1 ...
        const __m512i first = PackIntoWords<Narrow>(SixteenForPacking<Narrow>(in),
                                                    SixteenForPacking<Narrow>(in + 16));
        const __m512i second = PackIntoWords<Narrow>(SixteenForPacking<Narrow>(in + 32),
                                                     SixteenForPacking<Narrow>(in + 48));
        const __m512i bytes = std::is_signed_v<Narrow> ? _mm512_packs_epi16(first, second)
                                                       : _mm512_packus_epi16(first, second);
        line = _mm512_maskz_permutexvar_epi32(
            kSixteenLanes, _mm512_set_epi32(15, 11, 7, 3, 14, 10, 6, 2, 13, 9, 5, 1, 12, 8, 4, 0),
            bytes);
    }
    _mm512_storeu_si512(out, line);
}

#else
/// y clamped from above (NaN stays NaN); for signed results NaN then gives +0.
template <class Narrow>
__m256d ClampForPacking(__m256d y, __m256d high) {
    const __m256d clamped = _mm256_min_pd(high, y);
    return std::is_signed_v<Narrow> ? _mm256_and_pd(clamped, _mm256_cmp_pd(y, y, _CMP_ORD_Q))
                                    : clamped;
}

/// 8 samples rounded into 32-bit lanes for the packs into `Narrow`. Signed results are
/// rounded on the magnitude, which rounds like the value in both directions, clamped at
/// the lowest value's magnitude (NaN to 0 by the operand order of a maximum), and take the
/// samples' signs back after the truncation: one operation fewer than the sign of the half
/// and a mask of the ordered lanes.
template <class Narrow>
__m256i EightForPacking(const float* in) {
    const __m256 x = _mm256_loadu_ps(in);
    if constexpr (std::is_signed_v<Narrow>) {
        const __m256 magnitude =
            _mm256_add_ps(_mm256_andnot_ps(_mm256_set1_ps(-0.0f), x), _mm256_set1_ps(0.5f));
        const __m256 clamped = _mm256_min_ps(
            _mm256_max_ps(magnitude, _mm256_setzero_ps()),
            _mm256_set1_ps(-static_cast<float>(std::numeric_limits<Narrow>::lowest())));
        return _mm256_sign_epi32(_mm256_cvttps_epi32(clamped), _mm256_castps_si256(x));
    } else {
        const __m256 y = _mm256_add_ps(x, _mm256_set1_ps(0.5f));
        return _mm256_cvttps_epi32(
            _mm256_min_ps(_mm256_set1_ps(std::numeric_limits<Narrow>::max()), y));
    }
}

template <class Narrow>
__m256i EightForPacking(const double* in) {
    const __m256d high = _mm256_set1_pd(std::numeric_limits<Narrow>::max());
    const auto four = [&](const double* at) {
        const __m256d y = PlusHalf<std::is_signed_v<Narrow>>(_mm256_loadu_pd(at));
        return _mm256_cvttpd_epi32(ClampForPacking<Narrow>(y, high));
    };
    return _mm256_set_m128i(four(in + 4), four(in));
}

template <class Narrow>
__m256i PackIntoWords(__m256i a, __m256i b) {
    return std::is_signed_v<Narrow> ? _mm256_packs_epi32(a, b) : _mm256_packus_epi32(a, b);
}

/// Rounds 32 bytes' worth of samples into `out`. The packs work within 128-bit lanes, so
/// the pieces of the operands come out interleaved and one permute puts them in order.
template <class Narrow, class Floating>
void NarrowIntoHalfALine(const Floating* in, Narrow* out) {
    __m256i half;
    if constexpr (sizeof(Narrow) == 2) {
        // Pieces of 4 words: a0 b0 a1 b1.
        half = PiecesOfEightInOrder(
            PackIntoWords<Narrow>(EightForPacking<Narrow>(in), EightForPacking<Narrow>(in + 8)));
    } else {
        // Pieces of 4 bytes: a0 b0 c0 d0 a1 b1 c1 d1.
        const __m256i first =
            PackIntoWords<Narrow>(EightForPacking<Narrow>(in), EightForPacking<Narrow>(in + 8));
        const __m256i second = PackIntoWords<Narrow>(EightForPacking<Narrow>(in + 16),
                                                     EightForPacking<Narrow>(in + 24));
        const __m256i bytes = std::is_signed_v<Narrow> ? _mm256_packs_epi16(first, second)
                                                       : _mm256_packus_epi16(first, second);
        half = PiecesOfFourInOrder(bytes);
    }
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(out), half);
}

#endif

/// Converts the whole vectors' worth at the start of `count` samples as the element loop
/// would: half away from zero into signed integers (the half added in the source
/// precision), plus a half and truncated into unsigned ones, saturated at both ends, NaN
/// into 0. Returns how many samples that was.
template <class Floating, class Narrow>
std::size_t NarrowFloatingVectors(const Floating* in, Narrow* out, std::size_t count) {
    static_assert(kNarrowsFloating<Floating, Narrow>);
#if KUBO_DETAIL_VECTOR_BITS == 512
    constexpr std::size_t kStep = 64 / sizeof(Narrow);
#else
    constexpr std::size_t kStep = 32 / sizeof(Narrow);
#endif
    std::size_t i = 0;
    for (; i + kStep <= count; i += kStep) {
#if KUBO_DETAIL_VECTOR_BITS == 512
        NarrowIntoALine(in + i, out + i);
#else
        NarrowIntoHalfALine(in + i, out + i);
#endif
    }
    return i;
}

}  // namespace
}  // namespace kora::kubo::detail

#endif  // KUBO_DETAIL_VECTOR_BITS >= 256

#endif  // VRKFRAMEWORK_BASIC_CORE_KERNELS_FLOATINGNARROWING_H
