// 64-bit integers narrowed into 8-, 16- and 32-bit integers with 256-bit vectors, which
// have no 64-bit minimum and no narrowing of 64-bit lanes: a compare flags the lanes above
// the destination's maximum (unsigned sources compare their bits above it with 0), the
// flagged lanes take the maximum (an or, where it is all ones in the destination's width or
// a minimum caps the narrowed lanes) and the others keep their low bits, which shuffles then
// gather: the pieces of two vectors into 32-bit lanes, of four into 16-bit ones, of four
// into bytes. The vectorised loop clamps with compares and blends too, but narrows one
// vector at a time through several shuffles each. Private to the library; compiled only
// with 256-bit vectors (512-bit ones narrow 64-bit lanes directly), with internal linkage,
// so that the copies of different kernel variants never mix.
#ifndef VRKFRAMEWORK_BASIC_CORE_KERNELS_WIDEINTEGERNARROWING_H
#define VRKFRAMEWORK_BASIC_CORE_KERNELS_WIDEINTEGERNARROWING_H

#include "vrkframework/basic/core/kernels/capabilities.h"
#include "vrkframework/basic/core/kernels/lanepieces.h"

#if KUBO_DETAIL_VECTOR_BITS == 256
#include <immintrin.h>

#include <cstddef>  // std::size_t
#include <limits>
#include <type_traits>

namespace kora::kubo::detail {
namespace {

/// Whether `NarrowWideIntegerVectors` takes `Wide` samples into `Narrow`.
template <class Wide, class Narrow>
constexpr bool kNarrowsWideIntegers = std::is_integral_v<Wide>&& std::is_integral_v<Narrow> &&
                                      sizeof(Wide) == 8 && sizeof(Narrow) < 8;

/// Whether the lanes above the destination's maximum are set to all ones, and the narrowed
/// lanes then capped at the maximum: for unsigned sources into signed destinations, whose
/// other lanes lie at or below it as unsigned numbers, one minimum for a whole vector.
template <class Wide, class Narrow>
constexpr bool kCapsWhenNarrow = std::is_unsigned_v<Wide>&& std::is_signed_v<Narrow>;

/// 4 samples at `in`: the destination's maximum where above it (all ones in its width for
/// unsigned destinations and where it caps when narrow), else as they are.
template <class Wide, class Narrow>
__m256i ClampFromAbove(const Wide* in) {
    constexpr long long kMax = std::numeric_limits<Narrow>::max();
    const __m256i x = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in));
    // Unsigned sources compare the bits above the maximum's (2^k - 1) with 0: an exclusive
    // or of the top bits would make the compiler see an unsigned compare, which it spells
    // with one more operation.
    constexpr int kMaxBits = std::numeric_limits<Narrow>::digits;
    const __m256i above =
        std::is_signed_v<Wide>
            ? _mm256_cmpgt_epi64(x, _mm256_set1_epi64x(kMax))
            : _mm256_cmpgt_epi64(_mm256_srli_epi64(x, kMaxBits), _mm256_setzero_si256());
    if constexpr (std::is_signed_v<Narrow> && !kCapsWhenNarrow<Wide, Narrow>) {
        return _mm256_blendv_epi8(x, _mm256_set1_epi64x(kMax), above);
    } else {
        return _mm256_or_si256(x, above);
    }
}

/// The low `Narrow` of each 32-bit lane of `lanes` moved into slot `k` (of the slots of
/// 4 bytes for bytes, of 8 for words) of each 128-bit piece, the rest of it cleared.
template <class Narrow>
__m256i IntoSlot(__m256i lanes, int k) {
    if constexpr (sizeof(Narrow) == 1) {
        const int bytes = 0x0C080400;  // bytes 0, 4, 8 and 12
        const auto slot = [&](int at) { return at == k ? bytes : -1; };
        return _mm256_shuffle_epi8(lanes, _mm256_setr_epi32(slot(0), slot(1), slot(2), slot(3),
                                                            slot(0), slot(1), slot(2), slot(3)));
    } else {
        const long long words = 0x0D0C090805040100;  // words 0, 2, 4 and 6
        const auto slot = [&](int at) { return at == k ? words : -1LL; };
        return _mm256_shuffle_epi8(lanes, _mm256_setr_epi64x(slot(0), slot(1), slot(0), slot(1)));
    }
}

/// Narrows 32 bytes' worth of samples at `in` into `out`.
template <class Wide, class Narrow>
void NarrowWideIntoHalfALine(const Wide* in, Narrow* out) {
    const auto halves = [in](int pair) {
        return LowHalves(ClampFromAbove<Wide, Narrow>(in + 8 * pair),
                         ClampFromAbove<Wide, Narrow>(in + 8 * pair + 4));
    };
    __m256i line;
    if constexpr (sizeof(Narrow) == 4) {
        line = halves(0);
    } else if constexpr (sizeof(Narrow) == 2) {
        // Pieces of 8 bytes: a0 b0 | a1 b1.
        const __m256i pieces =
            _mm256_or_si256(IntoSlot<Narrow>(halves(0), 0), IntoSlot<Narrow>(halves(1), 1));
        line = PiecesOfEightInOrder(pieces);
    } else {
        // Pieces of 4 bytes: a0 b0 c0 d0 | a1 b1 c1 d1.
        const __m256i pieces = _mm256_or_si256(
            _mm256_or_si256(IntoSlot<Narrow>(halves(0), 0), IntoSlot<Narrow>(halves(1), 1)),
            _mm256_or_si256(IntoSlot<Narrow>(halves(2), 2), IntoSlot<Narrow>(halves(3), 3)));
        line = PiecesOfFourInOrder(pieces);
    }
    if constexpr (kCapsWhenNarrow<Wide, Narrow>) {
        const auto cap = static_cast<int>(std::numeric_limits<Narrow>::max());
        if constexpr (sizeof(Narrow) == 1) {
            line = _mm256_min_epu8(line, _mm256_set1_epi8(static_cast<char>(cap)));
        } else if constexpr (sizeof(Narrow) == 2) {
            line = _mm256_min_epu16(line, _mm256_set1_epi16(static_cast<short>(cap)));
        } else {
            line = _mm256_min_epu32(line, _mm256_set1_epi32(cap));
        }
    }
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(out), line);
}

/// Converts the whole vectors' worth at the start of `count` samples as the element loop
/// would: the destination's maximum from it on (compared as signed or unsigned, as the
/// source is), the low bits below it. Returns how many samples that was.
template <class Wide, class Narrow>
std::size_t NarrowWideIntegerVectors(const Wide* in, Narrow* out, std::size_t count) {
    static_assert(kNarrowsWideIntegers<Wide, Narrow>);
    constexpr std::size_t kStep = 32 / sizeof(Narrow);
    std::size_t i = 0;
    for (; i + kStep <= count; i += kStep) {
        NarrowWideIntoHalfALine(in + i, out + i);
    }
    return i;
}

}  // namespace
}  // namespace kora::kubo::detail

#endif  // KUBO_DETAIL_VECTOR_BITS == 256

#endif  // VRKFRAMEWORK_BASIC_CORE_KERNELS_WIDEINTEGERNARROWING_H
