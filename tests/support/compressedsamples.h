// Sample rasters and expected windows for the compressed raster tests and fuzz targets.
#ifndef KUBO_TESTS_SUPPORT_COMPRESSEDSAMPLES_H
#define KUBO_TESTS_SUPPORT_COMPRESSEDSAMPLES_H

#include <cstddef>  // std::size_t
#include <cstdint>  // std::int64_t, std::uint64_t
#include <memory>   // std::unique_ptr
#include <random>
#include <vector>

namespace kubo_test {

using Bytes = std::vector<unsigned char>;

/// Independent random bytes: almost every byte starts a new run.
inline Bytes NoiseBytes(std::size_t count, unsigned int seed) {
    std::mt19937 random(seed);
    Bytes bytes(count);
    for (unsigned char& byte : bytes) {
        byte = static_cast<unsigned char>(random() & 0xFFu);
    }
    return bytes;
}

/// Runs of 1 to `longest` equal bytes drawn from `values` (so neighbouring runs may share
/// a value, and runs cross 255 and row ends).
inline Bytes RunBytes(std::size_t count, unsigned int seed, const Bytes& values,
                      unsigned int longest = 700) {
    std::mt19937 random(seed);
    Bytes bytes;
    bytes.reserve(count);
    while (bytes.size() < count) {
        const unsigned char value = values[random() % values.size()];
        const std::size_t length = 1 + random() % longest;
        for (std::size_t i = 0; i < length && bytes.size() < count; ++i) {
            bytes.push_back(value);
        }
    }
    return bytes;
}

/// The `w` bytes from byte x of each of the `h` rows from row y, rows `rowBytes` apart.
inline Bytes Slice(const Bytes& raster, std::size_t rowBytes, std::size_t x, std::size_t y,
                   std::size_t w, std::size_t h) {
    Bytes window(w * h);
    for (std::size_t row = 0; row < h; ++row) {
        for (std::size_t i = 0; i < w; ++i) {
            window[row * w + i] = raster[(y + row) * rowBytes + x + i];
        }
    }
    return window;
}

/// Takes ownership of a buffer a decoder allocated and returns its first `count` bytes.
inline Bytes Take(unsigned char* buffer, std::size_t count) {
    const std::unique_ptr<unsigned char[]> owner(buffer);
    return Bytes(buffer, buffer + count);
}

/// The window rule of the (count, value) pair stream written out byte by byte, as the
/// oracle of the optimised decoder: a running total that grows by the count of every
/// pair entered, a step back on every row, 64-bit unsigned arithmetic (a negative x or y
/// wraps), and pairs past the stream read as empty pairs of value 0.
inline Bytes PairWindowReference(const unsigned char* pairs, std::size_t size, std::uint64_t width,
                                 std::uint64_t pixelBytes, int x, int y, int w, int h) {
    const std::size_t pairCount = size / 2;
    const auto count = [&](std::size_t p) -> std::uint64_t {
        return p < pairCount ? pairs[2 * p] : 0u;
    };
    const auto value = [&](std::size_t p) -> unsigned char {
        return p < pairCount ? pairs[2 * p + 1] : 0;
    };
    Bytes out;
    std::uint64_t start = (width * static_cast<std::uint64_t>(std::int64_t{y}) +
                           static_cast<std::uint64_t>(std::int64_t{x})) *
                          pixelBytes;
    std::size_t p = 0;
    std::uint64_t total = 0;
    for (int row = 0; row < h; ++row) {
        if (total <= start) {
            do {
                if (p >= pairCount) {
                    break;
                }
                total += count(p);
                p += 1;
            } while (!(total > start));
        }
        p -= 1;
        std::uint64_t remaining = total - start;
        unsigned char current = value(p);
        total -= count(p);
        for (int i = 0; i < w; ++i) {
            if (remaining == 0) {
                p += 1;
                remaining = count(p);
                current = value(p);
                total += count(p);
            }
            out.push_back(current);
            remaining -= 1;
        }
        start += width * pixelBytes;
    }
    return out;
}

}  // namespace kubo_test

#endif  // KUBO_TESTS_SUPPORT_COMPRESSEDSAMPLES_H
