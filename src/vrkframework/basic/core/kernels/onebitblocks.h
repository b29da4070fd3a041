// Blocks of 64 one-bit samples (or flags) between a packed stream and one byte per sample,
// through mask registers: a byte compare or a masked move handles all 64 at once, where
// packing them with scalar words takes a multiply and a store per eight (private to the
// library; compiled only where KUBO_DETAIL_MASK_REGISTERS is set, with internal linkage, so
// that the copies of different kernel variants never mix).
#ifndef VRKFRAMEWORK_BASIC_CORE_KERNELS_ONEBITBLOCKS_H
#define VRKFRAMEWORK_BASIC_CORE_KERNELS_ONEBITBLOCKS_H

#include "vrkframework/basic/core/kernels/capabilities.h"

#if KUBO_DETAIL_MASK_REGISTERS
#include <immintrin.h>

#include <cstdint>
#include <cstring>  // std::memcpy

namespace kora::kubo::detail {
namespace {

/// Reverses the bytes of every 8-byte group: mask bit j of a group then stands for the
/// group's byte 7 - j, so that a group's first sample is the most significant bit of its
/// stream byte, as the stream orders them.
inline __m512i ReverseBytesInGroupsOfEight(__m512i bytes) {
    const __m512i order = _mm512_set_epi8(                     //
        8, 9, 10, 11, 12, 13, 14, 15, 0, 1, 2, 3, 4, 5, 6, 7,  //
        8, 9, 10, 11, 12, 13, 14, 15, 0, 1, 2, 3, 4, 5, 6, 7,  //
        8, 9, 10, 11, 12, 13, 14, 15, 0, 1, 2, 3, 4, 5, 6, 7,  //
        8, 9, 10, 11, 12, 13, 14, 15, 0, 1, 2, 3, 4, 5, 6, 7);
    return _mm512_shuffle_epi8(bytes, order);
}

/// Packs 64 byte samples into 8 stream bytes, first sample on top: a sample's bit is set
/// when it has one of the `tested` bits (1 for one-bit samples, all for flags).
inline void PackOneBitBlock(const void* samples, unsigned char* packed, char tested) {
    const __m512i ordered = ReverseBytesInGroupsOfEight(_mm512_loadu_si512(samples));
    const std::uint64_t bits =
        _cvtmask64_u64(_mm512_test_epi8_mask(ordered, _mm512_set1_epi8(tested)));
    std::memcpy(packed, &bits, sizeof bits);  // little-endian: byte g holds mask bits 8g on
}

/// Unpacks 8 stream bytes into 64 byte samples of 0 or 1.
inline void UnpackOneBitBlock(const unsigned char* packed, void* samples) {
    std::uint64_t bits;
    std::memcpy(&bits, packed, sizeof bits);
    const __m512i ones = _mm512_maskz_mov_epi8(_cvtu64_mask64(bits), _mm512_set1_epi8(1));
    _mm512_storeu_si512(samples, ReverseBytesInGroupsOfEight(ones));
}

}  // namespace
}  // namespace kora::kubo::detail

#endif  // KUBO_DETAIL_MASK_REGISTERS

#endif  // VRKFRAMEWORK_BASIC_CORE_KERNELS_ONEBITBLOCKS_H
