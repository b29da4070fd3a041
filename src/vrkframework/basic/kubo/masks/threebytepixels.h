// Flags of pixels of three 8-bit samples under the all- and any-channel rules, eight pixels
// a vector: each pixel's bytes are spread into a 32-bit lane, so that one lane compare tests
// its three channels at once. Compiled where the variant has wide byte shuffles (private to
// the library, internal linkage, as for the other per-variant loops).
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_THREEBYTEPIXELS_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_THREEBYTEPIXELS_H

#include "vrkframework/basic/core/kernels/capabilities.h"

#if KUBO_DETAIL_WIDE_BYTE_SHUFFLES
#include <immintrin.h>

#include <array>
#include <cstddef>  // std::size_t

#include "vrkframework/basic/kubo/masks/bkgdrule.h"
#include "vrkframework/basic/kubo/masks/nodatastorage.h"

namespace kora::kubo::detail {
namespace {

/// Flags pixels of three bytes at `samples` (the all- or any-channel rule), 32 a step, and
/// returns how many: all but the last 2 to 33 of `count`, as a step reads four bytes past
/// its pixels.
template <BkgdRule Rule>
std::size_t FlagThreeBytePixels(const unsigned char* samples, unsigned char* flags,
                                std::size_t count,
                                const std::array<PlainTest<unsigned char>, 3>& tests) {
    static_assert(Rule == BkgdAllChans || Rule == BkgdAnyChan, "pairs span pixels");
    // Pixel k of each 128-bit half goes to lane k, its third byte twice, to be compared with
    // the three values (the third twice as well).
    const __m256i spread = _mm256_setr_epi8(0, 1, 2, 2, 3, 4, 5, 5, 6, 7, 8, 8, 9, 10, 11, 11,  //
                                            0, 1, 2, 2, 3, 4, 5, 5, 6, 7, 8, 8, 9, 10, 11, 11);
    const unsigned int first = tests[0].value;
    const unsigned int second = tests[1].value;
    const unsigned int third = tests[2].value;
    const __m256i values =
        _mm256_set1_epi32(static_cast<int>(first | second << 8 | third << 16 | third << 24));
    // A lane all ones after the lane compare: every channel matched (all rule, background)
    // or none did (any rule, valid).
    const __m256i decisive = _mm256_set1_epi8(Rule == BkgdAllChans ? -1 : 0);
    const auto eightPixels = [&](const unsigned char* pixels) {
        const __m256i bytes = _mm256_inserti128_si256(
            _mm256_castsi128_si256(_mm_loadu_si128(reinterpret_cast<const __m128i*>(pixels))),
            _mm_loadu_si128(reinterpret_cast<const __m128i*>(pixels + 12)), 1);
        const __m256i matches = _mm256_cmpeq_epi8(_mm256_shuffle_epi8(bytes, spread), values);
        return _mm256_cmpeq_epi32(matches, decisive);
    };
    const __m256i one = _mm256_set1_epi8(1);
    std::size_t i = 0;
    for (; count - i >= 34; i += 32) {
        const unsigned char* block = samples + 3 * i;
        const __m256i bytes = _mm256_packs_epi16(
            _mm256_packs_epi32(eightPixels(block), eightPixels(block + 24)),
            _mm256_packs_epi32(eightPixels(block + 48), eightPixels(block + 72)));
        // The packs work per 128-bit half: groups of four pixels come out as 0, 2, 4, 6, 1,
        // 3, 5, 7.
        const __m256i ordered =
            _mm256_permutevar8x32_epi32(bytes, _mm256_setr_epi32(0, 4, 1, 5, 2, 6, 3, 7));
        const __m256i valid = Rule == BkgdAnyChan ? _mm256_and_si256(ordered, one)
                                                  : _mm256_andnot_si256(ordered, one);
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(flags + i), valid);
    }
    return i;
}

}  // namespace
}  // namespace kora::kubo::detail

#endif  // KUBO_DETAIL_WIDE_BYTE_SHUFFLES

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_THREEBYTEPIXELS_H
