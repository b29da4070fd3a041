// 8-bit samples into doubles, one vector of doubles at a time: its bytes are widened into
// 32-bit lanes in one step and converted. The vectorised loop widens a whole vector of
// bytes through 16- and 32-bit lanes and extracts halves on the way, which keeps the shuffle
// port busier than the stores and measured 15 to 25 % slower in the caches (private to the
// library; compiled only where KUBO_DETAIL_WIDE_BYTE_SHUFFLES is set, with internal linkage,
// so that the copies of different kernel variants never mix).
#ifndef VRKFRAMEWORK_BASIC_CORE_KERNELS_BYTESTODOUBLES_H
#define VRKFRAMEWORK_BASIC_CORE_KERNELS_BYTESTODOUBLES_H

#include "vrkframework/basic/core/kernels/capabilities.h"

#if KUBO_DETAIL_WIDE_BYTE_SHUFFLES
#include <immintrin.h>

#include <cstddef>  // std::size_t
#include <cstdint>  // std::int32_t, std::int64_t
#include <cstring>  // std::memcpy
#include <type_traits>

namespace kora::kubo::detail {
namespace {

/// Converts the whole vectors' worth at the start of `count` bytes (sign-extended where
/// `Byte` is signed) into doubles; returns how many bytes that was.
template <class Byte>
std::size_t ConvertByteVectorsToDoubles(const Byte* bytes, double* doubles, std::size_t count) {
    static_assert(sizeof(Byte) == 1);
#if defined(__AVX512F__)
    constexpr std::size_t kLanes = 8;
    using Loaded = std::int64_t;
    const auto widen = [](Loaded loaded) {
        const __m128i narrow = _mm_cvtsi64_si128(loaded);
        const __m256i lanes =
            std::is_signed_v<Byte> ? _mm256_cvtepi8_epi32(narrow) : _mm256_cvtepu8_epi32(narrow);
        // All eight lanes; the unmasked form trips GCC 12's uninitialised-use warning.
        return _mm512_maskz_cvtepi32_pd(0xFF, lanes);
    };
    const auto store = [](double* to, __m512d values) { _mm512_storeu_pd(to, values); };
#else
    constexpr std::size_t kLanes = 4;
    using Loaded = std::int32_t;
    const auto widen = [](Loaded loaded) {
        const __m128i narrow = _mm_cvtsi32_si128(loaded);
        const __m128i lanes =
            std::is_signed_v<Byte> ? _mm_cvtepi8_epi32(narrow) : _mm_cvtepu8_epi32(narrow);
        return _mm256_cvtepi32_pd(lanes);
    };
    const auto store = [](double* to, __m256d values) { _mm256_storeu_pd(to, values); };
#endif
    std::size_t i = 0;
    for (; i + kLanes <= count; i += kLanes) {
        Loaded loaded;
        std::memcpy(&loaded, bytes + i, sizeof loaded);
        store(doubles + i, widen(loaded));
    }
    return i;
}

}  // namespace
}  // namespace kora::kubo::detail

#endif  // KUBO_DETAIL_WIDE_BYTE_SHUFFLES

#endif  // VRKFRAMEWORK_BASIC_CORE_KERNELS_BYTESTODOUBLES_H
