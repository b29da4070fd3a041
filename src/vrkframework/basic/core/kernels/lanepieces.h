// Pieces of 256-bit vectors put in order after operations that work within 128-bit lanes
// (packs, byte shuffles, two-source shuffles) left them interleaved. Private to the
// library; compiled only with 256-bit vectors, with internal linkage, so that the copies of
// different kernel variants never mix.
#ifndef VRKFRAMEWORK_BASIC_CORE_KERNELS_LANEPIECES_H
#define VRKFRAMEWORK_BASIC_CORE_KERNELS_LANEPIECES_H

#include "vrkframework/basic/core/kernels/capabilities.h"

#if KUBO_DETAIL_VECTOR_BITS == 256
#include <immintrin.h>

namespace kora::kubo::detail {
namespace {

/// Pieces of 8 bytes a0 b0 | a1 b1 (the bar between the 128-bit lanes) as a0 a1 b0 b1.
inline __m256i PiecesOfEightInOrder(__m256i pieces) {
    return _mm256_permute4x64_epi64(pieces, 0xD8);
}

/// Pieces of 4 bytes a0 b0 c0 d0 | a1 b1 c1 d1 as a0 a1 b0 b1 c0 c1 d0 d1.
inline __m256i PiecesOfFourInOrder(__m256i pieces) {
    return _mm256_permutevar8x32_epi32(pieces, _mm256_setr_epi32(0, 4, 1, 5, 2, 6, 3, 7));
}

/// The low halves of the 64-bit lanes of `a`, then of `b`.
inline __m256i LowHalves(__m256i a, __m256i b) {
    // In pieces of 8 bytes a0 a1 b0 b1 | a2 a3 b2 b3.
    const __m256 halves =
        _mm256_shuffle_ps(_mm256_castsi256_ps(a), _mm256_castsi256_ps(b), _MM_SHUFFLE(2, 0, 2, 0));
    return PiecesOfEightInOrder(_mm256_castps_si256(halves));
}

}  // namespace
}  // namespace kora::kubo::detail

#endif  // KUBO_DETAIL_VECTOR_BITS == 256

#endif  // VRKFRAMEWORK_BASIC_CORE_KERNELS_LANEPIECES_H
