// 8-bit samples widened into 64-bit lanes, one vector of them at a time: doubles, and with
// 512-bit vectors also 64-bit integers. The bytes of one vector are widened in one step
// (into 32-bit lanes for doubles, then converted). The vectorised loop widens a whole vector
// of bytes through 16- and 32-bit lanes and extracts halves on the way, which keeps the
// shuffle port busier than the stores: about a fifth slower in the caches with 256-bit
// vectors, and with 512-bit ones when the core's other thread competes for that port (as
// fast when it does not). Private to the library; compiled only where
// KUBO_DETAIL_WIDE_BYTE_SHUFFLES is set, with internal linkage, so that the copies of
// different kernel variants never mix.
#ifndef VRKFRAMEWORK_BASIC_CORE_KERNELS_BYTEWIDENING_H
#define VRKFRAMEWORK_BASIC_CORE_KERNELS_BYTEWIDENING_H

#include "vrkframework/basic/core/kernels/capabilities.h"

#if KUBO_DETAIL_WIDE_BYTE_SHUFFLES
#include <immintrin.h>

#include <cstddef>  // std::size_t
#include <cstdint>  // std::int32_t, std::int64_t
#include <cstring>  // std::memcpy
#include <type_traits>

namespace kora::kubo::detail {
namespace {

/// Whether `WidenByteVectors` takes 8-bit samples into `Wide`: doubles, or unsigned 64-bit
/// integers where the vectors hold eight of them (with four, the vectorised loop is as fast).
template <class Byte, class Wide>
constexpr bool kWidensBytes = sizeof(Byte) == 1 &&
                              (std::is_same_v<Wide, double> ||
                               (KUBO_DETAIL_VECTOR_BITS == 512 && std::is_integral_v<Wide> &&
                                std::is_unsigned_v<Wide> && sizeof(Wide) == 8));

/// Converts the whole vectors' worth at the start of `count` bytes into `Wide`, as the
/// element loop would: signed bytes are sign-extended into doubles and give 0 below 0 in
/// unsigned integers. Returns how many bytes that was.
template <class Byte, class Wide>
std::size_t WidenByteVectors(const Byte* bytes, Wide* wide, std::size_t count) {
    static_assert(kWidensBytes<Byte, Wide>);
    constexpr bool kSigned = std::is_signed_v<Byte>;
#if KUBO_DETAIL_VECTOR_BITS == 512
    constexpr std::size_t kLanes = 8;
    // Every lane, written as a mask: the unmasked forms trip GCC 12's uninitialised-use
    // warning, and the compiler drops a full mask.
    constexpr __mmask8 kAllLanes = 0xFF;
    using Loaded = std::int64_t;
    const auto widen = [](Loaded loaded, Wide* to) {
        __m128i narrow = _mm_cvtsi64_si128(loaded);
        if constexpr (std::is_same_v<Wide, double>) {
            const __m256i lanes =
                kSigned ? _mm256_cvtepi8_epi32(narrow) : _mm256_cvtepu8_epi32(narrow);
            _mm512_storeu_pd(to, _mm512_maskz_cvtepi32_pd(kAllLanes, lanes));
        } else {
            narrow = kSigned ? _mm_max_epi8(narrow, _mm_setzero_si128()) : narrow;
            _mm512_storeu_si512(to, _mm512_maskz_cvtepu8_epi64(kAllLanes, narrow));
        }
    };
#else
    constexpr std::size_t kLanes = 4;
    using Loaded = std::int32_t;
    const auto widen = [](Loaded loaded, double* to) {
        const __m128i narrow = _mm_cvtsi32_si128(loaded);
        const __m128i lanes = kSigned ? _mm_cvtepi8_epi32(narrow) : _mm_cvtepu8_epi32(narrow);
        _mm256_storeu_pd(to, _mm256_cvtepi32_pd(lanes));
    };
#endif
    std::size_t i = 0;
    for (; i + kLanes <= count; i += kLanes) {
        Loaded loaded;
        std::memcpy(&loaded, bytes + i, sizeof loaded);
        widen(loaded, wide + i);
    }
    return i;
}

}  // namespace
}  // namespace kora::kubo::detail

#endif  // KUBO_DETAIL_WIDE_BYTE_SHUFFLES

#endif  // VRKFRAMEWORK_BASIC_CORE_KERNELS_BYTEWIDENING_H
