// The half the rounding rules add to floating samples before truncating them, a vector at
// a time: +0.5, or 0.5 with the sign of the sample (half away from zero), in the samples'
// own precision. Private to the library; compiled only with 256- or 512-bit vectors, with
// internal linkage, so that the copies of different kernel variants never mix.
#ifndef VRKFRAMEWORK_BASIC_CORE_KERNELS_PLUSHALF_H
#define VRKFRAMEWORK_BASIC_CORE_KERNELS_PLUSHALF_H

#include "vrkframework/basic/core/kernels/capabilities.h"

#if KUBO_DETAIL_VECTOR_BITS >= 256
#include <immintrin.h>

namespace kora::kubo::detail {
namespace {

#if KUBO_DETAIL_VECTOR_BITS == 512
/// x + 0.5, or x plus a half with the sign of x.
template <bool kAwayFromZero>
__m512d PlusHalf(__m512d x) {
    const __m512d half = _mm512_set1_pd(0.5);
    return _mm512_add_pd(
        x, kAwayFromZero ? _mm512_or_pd(half, _mm512_and_pd(x, _mm512_set1_pd(-0.0))) : half);
}

template <bool kAwayFromZero>
__m512 PlusHalf(__m512 x) {
    const __m512 half = _mm512_set1_ps(0.5f);
    return _mm512_add_ps(
        x, kAwayFromZero ? _mm512_or_ps(half, _mm512_and_ps(x, _mm512_set1_ps(-0.0f))) : half);
}
#else
/// x + 0.5, or x plus a half with the sign of x.
template <bool kAwayFromZero>
__m256d PlusHalf(__m256d x) {
    const __m256d half = _mm256_set1_pd(0.5);
    return _mm256_add_pd(
        x, kAwayFromZero ? _mm256_or_pd(half, _mm256_and_pd(x, _mm256_set1_pd(-0.0))) : half);
}

template <bool kAwayFromZero>
__m256 PlusHalf(__m256 x) {
    const __m256 half = _mm256_set1_ps(0.5f);
    return _mm256_add_ps(
        x, kAwayFromZero ? _mm256_or_ps(half, _mm256_and_ps(x, _mm256_set1_ps(-0.0f))) : half);
}
#endif

}  // namespace
}  // namespace kora::kubo::detail

#endif  // KUBO_DETAIL_VECTOR_BITS >= 256

#endif  // VRKFRAMEWORK_BASIC_CORE_KERNELS_PLUSHALF_H
