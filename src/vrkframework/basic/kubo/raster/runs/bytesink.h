// The growing output of an encoder, trimmed to what was written and handed to its owner
// (private to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_BYTESINK_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_BYTESINK_H

#include <cstddef>  // std::size_t
#include <cstdlib>  // std::aligned_alloc, std::malloc, std::realloc, std::free
#include <memory>   // std::unique_ptr
#include <new>      // std::bad_alloc

#if defined(__linux__)
#include <sys/mman.h>  // madvise
#endif

namespace kora::kubo::detail {

struct FreeBytes {
    void operator()(unsigned char* bytes) const { std::free(bytes); }
};

/// Bytes from the C allocator; a std::shared_ptr built from it keeps the deleter.
using EncodedBytes = std::unique_ptr<unsigned char, FreeBytes>;

/// Encoders reserve their worst case up front (or per run) and write through plain
/// pointers. The C allocator is used because its untouched pages cost nothing and
/// trimming the result usually happens in place, where a copy to an exact-size buffer
/// would cost as much again as the encoding of incompressible data.
class ByteSink {
public:
    explicit ByteSink(std::size_t capacity) {
        if (capacity >= kLarge) {
            AllocateLarge(capacity);
        } else {
            Grow(capacity);
        }
    }
    ByteSink(const ByteSink&) = delete;
    ByteSink& operator=(const ByteSink&) = delete;
    ByteSink(ByteSink&&) = delete;
    ByteSink& operator=(ByteSink&&) = delete;
    ~ByteSink() { std::free(m_begin); }

    /// Makes room for `bytes` more and returns where they go; Commit the new end after.
    unsigned char* Reserve(std::size_t bytes) {
        if (static_cast<std::size_t>(m_limit - m_end) < bytes) {
            Grow(Size() + bytes > 2 * Capacity() ? Size() + bytes : 2 * Capacity());
        }
        return m_end;
    }
    void Commit(unsigned char* end) { m_end = end; }
    const unsigned char* Data() const { return m_begin; }
    std::size_t Size() const { return static_cast<std::size_t>(m_end - m_begin); }

    /// Hands the written bytes over, trimmed to their size; the sink is then empty.
    EncodedBytes Release() {
        const std::size_t size = Size();
        // A failed trim keeps the larger block, which is just as valid.
        auto* trimmed = static_cast<unsigned char*>(std::realloc(m_begin, size == 0 ? 1 : size));
        EncodedBytes bytes(trimmed != nullptr ? trimmed : m_begin);
        m_begin = m_end = m_limit = nullptr;
        return bytes;
    }

private:
    static constexpr std::size_t kHugePage = std::size_t{2} << 20;
    static constexpr std::size_t kLarge = 4 * kHugePage;

    std::size_t Capacity() const { return static_cast<std::size_t>(m_limit - m_begin); }

    // Filling a large fresh block costs more in first-touch page faults than in
    // encoding; on Linux, huge pages cut those faults several times over. The advice is
    // a hint: refused or not, the block is valid.
    void AllocateLarge(std::size_t capacity) {
#if defined(__linux__)
        const std::size_t rounded = (capacity + kHugePage - 1) / kHugePage * kHugePage;
        m_begin = static_cast<unsigned char*>(std::aligned_alloc(kHugePage, rounded));
        if (m_begin == nullptr) {
            throw std::bad_alloc();
        }
        madvise(m_begin, rounded, MADV_HUGEPAGE);
        m_end = m_begin;
        m_limit = m_begin + rounded;
#else
        Grow(capacity);
#endif
    }

    void Grow(std::size_t capacity) {
        const std::size_t size = Size();
        auto* grown =
            static_cast<unsigned char*>(std::realloc(m_begin, capacity == 0 ? 1 : capacity));
        if (grown == nullptr) {
            throw std::bad_alloc();
        }
        m_begin = grown;
        m_end = grown + size;
        m_limit = grown + capacity;
    }

    unsigned char* m_begin = nullptr;
    unsigned char* m_end = nullptr;
    unsigned char* m_limit = nullptr;
};

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_RUNS_BYTESINK_H
