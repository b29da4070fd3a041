// Word-at-a-time searches for the end of a run of equal bytes or bits, used by the
// run-length encoders (private to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_WORDSCAN_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_WORDSCAN_H

#include <algorithm>  // std::min
#include <cstddef>    // std::size_t
#include <cstdint>    // std::uint64_t
#include <cstring>    // std::memcpy

#include "vrkframework/basic/core/byteorder.h"

#if defined(_MSC_VER) && !defined(__clang__)
#include <intrin.h>  // _BitScanForward64, _BitScanReverse64
#endif

namespace kora::kubo::detail {

constexpr std::uint64_t kEveryByte = 0x0101010101010101ull;

/// Index of the lowest set bit; `value` is not 0.
inline unsigned int LowestSetBit(std::uint64_t value) {
#if defined(_MSC_VER) && !defined(__clang__)
    unsigned long index;
    _BitScanForward64(&index, value);
    return index;
#else
    return static_cast<unsigned int>(__builtin_ctzll(value));
#endif
}

/// Number of zero bits above the highest set bit; `value` is not 0.
inline unsigned int LeadingZeros(std::uint64_t value) {
#if defined(_MSC_VER) && !defined(__clang__)
    unsigned long index;
    _BitScanReverse64(&index, value);
    return 63u - index;
#else
    return static_cast<unsigned int>(__builtin_clzll(value));
#endif
}

/// Flags the high bit of every zero byte of `word`. A borrow can flag a byte above a zero
/// one as well, never one below: the result is 0 exactly when no byte is zero, and its
/// lowest flag is exact.
inline std::uint64_t ZeroBytes(std::uint64_t word) {
    return (word - kEveryByte) & ~word & (kEveryByte << 7);
}

/// The sum of the 8 bytes at `bytes`, added pairwise in 16-bit lanes so nothing carries.
inline std::uint64_t SumOfEightBytes(const unsigned char* bytes) {
    constexpr std::uint64_t kLowBytes = 0x00FF00FF00FF00FFull;
    const std::uint64_t word = LoadLowFirst(bytes);
    const std::uint64_t pairs = (word & kLowBytes) + ((word >> 8) & kLowBytes);
    return (pairs * 0x0001000100010001ull) >> 48;
}

/// The sum of the kCount bytes at `bytes`, a count small enough for the sum to fit 16 bits:
/// the loop vectorises in 16-bit lanes, twice as many per vector as 32-bit ones.
template <std::size_t kCount>
std::uint32_t SumOfBytes(const unsigned char* bytes) {
    static_assert(kCount * 255 <= 0xFFFF, "the sum fits 16 bits");
    std::uint16_t sum = 0;
    for (std::size_t k = 0; k < kCount; ++k) {
        sum = static_cast<std::uint16_t>(sum + bytes[k]);
    }
    return sum;
}

/// As LoadHighFirst for the `count` (< 8) bytes left at the end of a buffer; the missing
/// low bytes read as zero.
inline std::uint64_t LoadHighFirstTail(const unsigned char* bytes, std::size_t count) {
    unsigned char padded[8] = {};
    std::memcpy(padded, bytes, count);
    return LoadHighFirst(padded);
}

/// First index in [begin, end) whose byte differs from `value`, or `end`.
inline std::size_t FindByteChange(const unsigned char* data, std::size_t begin, std::size_t end,
                                  unsigned char value) {
    const std::uint64_t pattern = kEveryByte * value;
    // Four words per step on long runs; the first differing word then locates the byte.
    while (end - begin >= 32) {
        const std::uint64_t a = LoadLowFirst(data + begin) ^ pattern;
        const std::uint64_t b = LoadLowFirst(data + begin + 8) ^ pattern;
        const std::uint64_t c = LoadLowFirst(data + begin + 16) ^ pattern;
        const std::uint64_t d = LoadLowFirst(data + begin + 24) ^ pattern;
        if ((a | b | c | d) != 0) {
            break;
        }
        begin += 32;
    }
    for (; end - begin >= 8; begin += 8) {
        const std::uint64_t difference = LoadLowFirst(data + begin) ^ pattern;
        if (difference != 0) {
            return begin + LowestSetBit(difference) / 8;
        }
    }
    while (begin < end && data[begin] == value) {
        ++begin;
    }
    return begin;
}

/// First index in [begin, end) holding a zero byte, or `end`.
inline std::size_t FindZeroByte(const unsigned char* data, std::size_t begin, std::size_t end) {
    for (; end - begin >= 8; begin += 8) {
        const std::uint64_t zeros = ZeroBytes(LoadLowFirst(data + begin));
        if (zeros != 0) {
            return begin + LowestSetBit(zeros) / 8;
        }
    }
    while (begin < end && data[begin] != 0) {
        ++begin;
    }
    return begin;
}

/// First bit in [begin, end) of the stream read from `data` most significant bit first
/// whose value differs from `value`, or `end`. `data` holds at least (end + 7) / 8 bytes.
inline std::uint64_t FindBitChange(const unsigned char* data, std::uint64_t begin,
                                   std::uint64_t end, bool value) {
    const std::size_t byteCount = static_cast<std::size_t>((end + 7) / 8);
    const std::uint64_t flip = value ? ~std::uint64_t{0} : 0;
    while (begin < end) {
        const auto byte = static_cast<std::size_t>(begin / 8);
        const auto skipped = static_cast<unsigned int>(begin % 8);
        const std::uint64_t word = byteCount - byte >= 8
                                       ? LoadHighFirst(data + byte)
                                       : LoadHighFirstTail(data + byte, byteCount - byte);
        const std::uint64_t difference = (word ^ flip) << skipped;
        if (difference != 0) {
            // Padding past the end may read as a change; the end bounds it.
            return std::min(begin + LeadingZeros(difference), end);
        }
        begin += 64u - skipped;
    }
    return end;
}

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_WORDSCAN_H
