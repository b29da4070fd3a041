// Words loaded from and stored to bytes in a stated byte order, whatever the processor's
// (private to the library).
#ifndef VRKFRAMEWORK_BASIC_CORE_BYTEORDER_H
#define VRKFRAMEWORK_BASIC_CORE_BYTEORDER_H

#include <cstdint>  // std::uint32_t, std::uint64_t
#include <cstring>  // std::memcpy

#if defined(_MSC_VER) && !defined(__clang__)
#include <stdlib.h>  // _byteswap_uint64
#endif

namespace kora::kubo::detail {

#if defined(__BYTE_ORDER__)
constexpr bool kLittleEndian = __BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__;
#else
constexpr bool kLittleEndian = true;  // the MSVC targets are all little-endian
#endif

inline std::uint64_t ByteSwap(std::uint64_t value) {
#if defined(_MSC_VER) && !defined(__clang__)
    return _byteswap_uint64(value);
#else
    return __builtin_bswap64(value);
#endif
}

/// The 8 bytes at `bytes` with bytes[0] in the lowest byte.
inline std::uint64_t LoadLowFirst(const unsigned char* bytes) {
    std::uint64_t word;
    std::memcpy(&word, bytes, sizeof word);
    return kLittleEndian ? word : ByteSwap(word);
}

/// The 8 bytes at `bytes` with bytes[0] in the highest byte, so that a bit stream read
/// most significant bit first runs from bit 63 down.
inline std::uint64_t LoadHighFirst(const unsigned char* bytes) {
    std::uint64_t word;
    std::memcpy(&word, bytes, sizeof word);
    return kLittleEndian ? ByteSwap(word) : word;
}

/// Stores `word` at `bytes`, its lowest byte first.
inline void StoreLowFirst(unsigned char* bytes, std::uint64_t word) {
    word = kLittleEndian ? word : ByteSwap(word);
    std::memcpy(bytes, &word, sizeof word);
}

/// Stores the 4 bytes of `word` at `bytes`, its lowest byte first.
inline void StoreLowFirst(unsigned char* bytes, std::uint32_t word) {
    const auto ordered =
        kLittleEndian ? word : static_cast<std::uint32_t>(ByteSwap(std::uint64_t{word}) >> 32);
    std::memcpy(bytes, &ordered, sizeof ordered);
}

/// Stores `word` at `bytes`, its highest byte first.
inline void StoreHighFirst(unsigned char* bytes, std::uint64_t word) {
    word = kLittleEndian ? ByteSwap(word) : word;
    std::memcpy(bytes, &word, sizeof word);
}

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_BYTEORDER_H
