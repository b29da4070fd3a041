// Reading a fuzz input as a few parameters followed by raster bytes, and the checks the
// fuzz targets stop on.
#ifndef KUBO_FUZZ_FUZZINPUT_H
#define KUBO_FUZZ_FUZZINPUT_H

#include <algorithm>  // std::fill_n
#include <cstddef>    // std::size_t
#include <cstdint>    // std::uint8_t
#include <cstdio>     // std::fprintf
#include <cstdlib>    // std::abort
#include <vector>

namespace kubo_fuzz {

/// Stops the run (a crash for the fuzzer, a failure for the replay) when `ok` is false.
inline void Check(bool ok, const char* what) {
    if (!ok) {
        std::fprintf(stderr, "check failed: %s\n", what);
        std::abort();
    }
}

class FuzzInput {
public:
    FuzzInput(const std::uint8_t* data, std::size_t size) : m_data(data), m_size(size) {}

    /// The next parameter byte reduced below `limit`; 0 once the input is used up.
    unsigned int Take(unsigned int limit) {
        return m_next < m_size ? m_data[m_next++] % limit : 0u;
    }

    /// `count` bytes made of the rest of the input, repeated as needed (zeros when nothing
    /// is left). With `mask` set, each byte becomes 0 or 0xFF by its lowest bit and holds
    /// for `stretch` bytes, giving the long runs of masks.
    std::vector<unsigned char> Bytes(std::size_t count, bool mask = false,
                                     unsigned int stretch = 1) {
        std::vector<unsigned char> bytes(count, 0);
        Fill(bytes.data(), count, mask, stretch);
        return bytes;
    }

    /// As Bytes, written to `out`.
    void Fill(unsigned char* out, std::size_t count, bool mask = false, unsigned int stretch = 1) {
        if (m_next == m_size) {
            std::fill_n(out, count, 0);
            return;
        }
        // Byte i comes from input byte (i / stretch) % left, counted rather than divided:
        // rasters of a few hundred kilobytes are made for every input.
        std::size_t from = m_next;
        unsigned int uses = 0;
        for (std::size_t i = 0; i < count; ++i) {
            const unsigned char byte = m_data[from];
            out[i] = mask ? static_cast<unsigned char>((byte & 1u) != 0 ? 0xFF : 0) : byte;
            if (++uses == stretch) {
                uses = 0;
                from = from + 1 == m_size ? m_next : from + 1;
            }
        }
    }

private:
    const std::uint8_t* m_data;
    std::size_t m_size;
    std::size_t m_next = 0;
};

}  // namespace kubo_fuzz

#endif  // KUBO_FUZZ_FUZZINPUT_H
