// The copy of a block of results from the first-level cache to its place in memory with
// stores that bypass the caches (private to the library; compiled once per kernel variant,
// with internal linkage, so that the copies of different variants never mix).
#ifndef VRKFRAMEWORK_BASIC_CORE_KERNELS_STREAMINGCOPY_IMPL_H
#define VRKFRAMEWORK_BASIC_CORE_KERNELS_STREAMINGCOPY_IMPL_H

#include <cstddef>  // std::size_t
#include <cstdint>  // std::uintptr_t
#include <cstring>  // std::memcpy

#include "vrkframework/basic/core/kernels/capabilities.h"

#if KUBO_DETAIL_STREAMING_STORE_BYTES != 0
#include <immintrin.h>
#endif

namespace kora::kubo::detail {
namespace {

#if KUBO_DETAIL_STREAMING_STORE_BYTES == 64
using StreamedVector = __m512i;
inline StreamedVector LoadStreamed(const unsigned char* from) { return _mm512_loadu_si512(from); }
inline void StoreStreamed(unsigned char* to, StreamedVector v) {
    _mm512_stream_si512(reinterpret_cast<__m512i*>(to), v);
}
#elif KUBO_DETAIL_STREAMING_STORE_BYTES == 32
using StreamedVector = __m256i;
inline StreamedVector LoadStreamed(const unsigned char* from) {
    return _mm256_loadu_si256(reinterpret_cast<const __m256i*>(from));
}
inline void StoreStreamed(unsigned char* to, StreamedVector v) {
    _mm256_stream_si256(reinterpret_cast<__m256i*>(to), v);
}
#elif KUBO_DETAIL_STREAMING_STORE_BYTES == 16
using StreamedVector = __m128i;
inline StreamedVector LoadStreamed(const unsigned char* from) {
    return _mm_loadu_si128(reinterpret_cast<const __m128i*>(from));
}
inline void StoreStreamed(unsigned char* to, StreamedVector v) {
    _mm_stream_si128(reinterpret_cast<__m128i*>(to), v);
}
#endif

/// Copies `bytes` bytes from `block` to `dst`, which do not overlap. A result written with
/// plain stores is first read into the cache (a line is fetched before it is overwritten),
/// which for outputs far larger than the caches costs as much memory traffic as the writing
/// itself; stores that bypass the caches write whole lines without that read. The parts of
/// `dst` before its first and after its last aligned vector are copied plainly. With
/// `fence` set, the streamed stores of the thread so far are then ordered before any of its
/// later stores.
void CopyBypassingCaches(const void* block, void* dst, std::size_t bytes, bool fence) {
    const auto* from = static_cast<const unsigned char*>(block);
    auto* to = static_cast<unsigned char*>(dst);
#if KUBO_DETAIL_STREAMING_STORE_BYTES != 0
    constexpr std::size_t kWidth = KUBO_DETAIL_STREAMING_STORE_BYTES;
    const std::size_t misalignment = reinterpret_cast<std::uintptr_t>(to) % kWidth;
    const std::size_t head = misalignment == 0 ? 0 : kWidth - misalignment;
    if (bytes >= head + kWidth) {
        std::memcpy(to, from, head);
        const std::size_t body = (bytes - head) / kWidth * kWidth;
        for (std::size_t i = head; i < head + body; i += kWidth) {
            StoreStreamed(to + i, LoadStreamed(from + i));
        }
        from += head + body;
        to += head + body;
        bytes -= head + body;
    }
    if (fence) {
        _mm_sfence();
    }
#else
    static_cast<void>(fence);
#endif
    if (bytes != 0) {
        std::memcpy(to, from, bytes);
    }
}

}  // namespace
}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_KERNELS_STREAMINGCOPY_IMPL_H
