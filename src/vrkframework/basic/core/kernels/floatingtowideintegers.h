// Floating samples converted into 32- and 64-bit integers with 256-bit vectors, whose only
// conversion of floating lanes into integer lanes is the truncation into signed 32-bit
// ones, which gives the lowest integer for NaN and for everything out of its range:
// - signed 32-bit results: the half added, the truncation, and for floats an exclusive or
//   that turns the lowest integer into the highest where the value lies at or above 2^31
//   (for doubles a minimum does it first);
// - unsigned 32-bit results: floats at or above 2^31 take the truncation of the value less
//   2^31 under the top bit the first truncation left; doubles, clamped, are added to 2^52
//   and hold the integer in the low half of their bits;
// - 64-bit results: the mantissa with its implicit bit at the top of the lane, shifted
//   right by what the exponent leaves (a count out of range, for everything negative or
//   too large, shifts everything out); the saturated lanes, and for unsigned results the
//   NaN lanes, are set from compares.
// The vectorised loop builds the same results from selects, each two operations without
// mask registers, and 64-bit results from two halves of the whole value. Private to the
// library; compiled only with 256-bit vectors (512-bit ones convert directly), with
// internal linkage, so that the copies of different kernel variants never mix.
#ifndef VRKFRAMEWORK_BASIC_CORE_KERNELS_FLOATINGTOWIDEINTEGERS_H
#define VRKFRAMEWORK_BASIC_CORE_KERNELS_FLOATINGTOWIDEINTEGERS_H

#include "vrkframework/basic/core/kernels/capabilities.h"
#include "vrkframework/basic/core/kernels/lanepieces.h"
#include "vrkframework/basic/core/kernels/plushalf.h"

#if KUBO_DETAIL_VECTOR_BITS == 256
#include <immintrin.h>

#include <cstddef>  // std::size_t
#include <cstdint>  // std::int32_t, std::int64_t
#include <limits>
#include <type_traits>

namespace kora::kubo::detail {
namespace {

/// Whether `ConvertFloatingToWideVectors` takes `Floating` samples into `Wide`.
template <class Floating, class Wide>
constexpr bool kConvertsFloatingToWide =
    std::is_floating_point_v<Floating>&& std::is_integral_v<Wide> && sizeof(Wide) >= 4;

/// 8 samples rounded half away from zero into signed 32-bit integers.
inline __m256i EightIntoInt32(const float* in) {
    const __m256 y = PlusHalf<true>(_mm256_loadu_ps(in));
    const __m256 top = _mm256_cmp_ps(y, _mm256_set1_ps(0x1p31f), _CMP_GE_OQ);
    return _mm256_xor_si256(_mm256_cvttps_epi32(y), _mm256_castps_si256(top));
}

inline __m256i EightIntoInt32(const double* in) {
    const auto four = [](const double* at) {
        const __m256d y = PlusHalf<true>(_mm256_loadu_pd(at));
        // Where y is NaN the minimum returns it, for the truncation to take to the lowest.
        return _mm256_cvttpd_epi32(
            _mm256_min_pd(_mm256_set1_pd(std::numeric_limits<std::int32_t>::max()), y));
    };
    return _mm256_set_m128i(four(in + 4), four(in));
}

/// 8 samples plus a half truncated into unsigned 32-bit integers.
inline __m256i EightIntoUInt32(const float* in) {
    const __m256 y = _mm256_add_ps(_mm256_loadu_ps(in), _mm256_set1_ps(0.5f));
    // Where y is NaN the maximum returns 0.
    const __m256 c = _mm256_max_ps(y, _mm256_setzero_ps());
    const __m256i belowTop = _mm256_cvttps_epi32(c);
    const __m256i lessTop = _mm256_cvttps_epi32(_mm256_sub_ps(c, _mm256_set1_ps(0x1p31f)));
    const __m256i value =
        _mm256_or_si256(belowTop, _mm256_and_si256(lessTop, _mm256_srai_epi32(belowTop, 31)));
    const __m256 saturated = _mm256_cmp_ps(y, _mm256_set1_ps(0x1p32f), _CMP_GE_OQ);
    return _mm256_or_si256(value, _mm256_castps_si256(saturated));
}

inline __m256i EightIntoUInt32(const double* in) {
    const auto four = [](const double* at) {
        const __m256d y = _mm256_add_pd(_mm256_loadu_pd(at), _mm256_set1_pd(0.5));
        const __m256d c = _mm256_min_pd(_mm256_max_pd(y, _mm256_setzero_pd()),
                                        _mm256_set1_pd(std::numeric_limits<std::uint32_t>::max()));
        const __m256d whole = _mm256_round_pd(c, _MM_FROUND_TO_ZERO | _MM_FROUND_NO_EXC);
        return _mm256_castpd_si256(_mm256_add_pd(whole, _mm256_set1_pd(0x1p52)));
    };
    return LowHalves(four(in), four(in + 4));
}

/// 4 doubles truncated into 64-bit integers, as `Wide` has it: 0 at or below 0, the
/// maximum from the limit (2^63 or 2^64) on, the top bit alone for NaN.
template <class Wide>
__m256i FourIntoInt64(__m256d x) {
    constexpr bool kSigned = std::is_signed_v<Wide>;
    constexpr double kLimit = kSigned ? 0x1p63 : 0x1p64;
    __m256d c = x;
    if constexpr (kSigned) {
        // Clamped below 2^63; NaN, which the first minimum returns, is replaced by the
        // second with 2^63 itself, whose shift below gives the top bit alone.
        c = _mm256_min_pd(_mm256_min_pd(_mm256_set1_pd(0x1.fffffffffffffp62), x),
                          _mm256_set1_pd(0x1p63));
    }
    const __m256i bits = _mm256_castpd_si256(c);
    // The mantissa and its implicit bit, moved to the top of the lane, then right by 1086
    // less the exponent field: by 64 or more for values below 1, by a negative count, read
    // as a huge one, for values from 2^64 on, for infinities, NaN and anything negative.
    const __m256i mantissa =
        _mm256_or_si256(_mm256_slli_epi64(bits, 11), _mm256_set1_epi64x(INT64_MIN));
    const __m256i shift = _mm256_sub_epi64(_mm256_set1_epi64x(1086), _mm256_srli_epi64(bits, 52));
    const __m256i value = _mm256_srlv_epi64(mantissa, shift);
    const __m256i saturated =
        _mm256_castpd_si256(_mm256_cmp_pd(x, _mm256_set1_pd(kLimit), _CMP_GE_OQ));
    if constexpr (kSigned) {
        // Masks rather than shifts, which compete with the ones above for fewer ports.
        return _mm256_or_si256(value, _mm256_and_si256(saturated, _mm256_set1_epi64x(INT64_MAX)));
    } else {
        const __m256i nan = _mm256_castpd_si256(_mm256_cmp_pd(x, x, _CMP_UNORD_Q));
        return _mm256_or_si256(_mm256_or_si256(value, saturated),
                               _mm256_and_si256(nan, _mm256_set1_epi64x(INT64_MIN)));
    }
}

inline __m256d FourAsDoubles(const float* in) { return _mm256_cvtps_pd(_mm_loadu_ps(in)); }
inline __m256d FourAsDoubles(const double* in) { return _mm256_loadu_pd(in); }

/// Converts the whole vectors' worth at the start of `count` samples as the element loop
/// would. Returns how many samples that was.
template <class Floating, class Wide>
std::size_t ConvertFloatingToWideVectors(const Floating* in, Wide* out, std::size_t count) {
    static_assert(kConvertsFloatingToWide<Floating, Wide>);
    constexpr std::size_t kStep = 32 / sizeof(Wide);
    std::size_t i = 0;
    for (; i + kStep <= count; i += kStep) {
        __m256i lanes;
        if constexpr (sizeof(Wide) == 8) {
            lanes = FourIntoInt64<Wide>(FourAsDoubles(in + i));
        } else if constexpr (std::is_signed_v<Wide>) {
            lanes = EightIntoInt32(in + i);
        } else {
            lanes = EightIntoUInt32(in + i);
        }
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + i), lanes);
    }
    return i;
}

}  // namespace
}  // namespace kora::kubo::detail

#endif  // KUBO_DETAIL_VECTOR_BITS == 256

#endif  // VRKFRAMEWORK_BASIC_CORE_KERNELS_FLOATINGTOWIDEINTEGERS_H
