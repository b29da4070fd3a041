// Plain references of the conversion rules, for the conversion tests and fuzz targets: the
// per-value rule of every pair of component types, and the packed N-bit stream layout
// written out bit by bit.
#ifndef KUBO_TESTS_SUPPORT_PROMOTEREFERENCE_H
#define KUBO_TESTS_SUPPORT_PROMOTEREFERENCE_H

#include <cmath>    // std::isnan, std::trunc
#include <cstddef>  // std::size_t
#include <cstdint>  // std::int64_t, std::uint64_t
#include <cstring>  // std::memcmp
#include <limits>
#include <type_traits>
#include <vector>

namespace kubo_test {

// ------------------------------------------------------------------ whole samples

template <class T>
constexpr bool kSmallSigned = std::is_integral_v<T>&& std::is_signed_v<T> && sizeof(T) < 8;

template <class T>
long double High() {
    return static_cast<long double>(std::numeric_limits<T>::max());
}
template <class T>
long double Low() {
    return static_cast<long double>(std::numeric_limits<T>::lowest());
}

/// The documented result of NaN: INT32_MIN reduced to the width of B, or the top bit
/// alone in 64-bit destinations.
template <class B>
B NaNResult() {
    if constexpr (sizeof(B) == 8) {
        return static_cast<B>(std::uint64_t{1} << 63);
    } else if constexpr (std::is_same_v<B, int>) {
        return std::numeric_limits<int>::min();
    } else {
        return 0;
    }
}

/// x < y for integers of any two types, by value.
template <class X, class Y>
bool Less(X x, Y y) {
    if constexpr (std::is_signed_v<X> == std::is_signed_v<Y>) {
        return x < y;
    } else if constexpr (std::is_signed_v<X>) {
        return x < 0 || static_cast<std::uint64_t>(x) < static_cast<std::uint64_t>(y);
    } else {
        return y > 0 && static_cast<std::uint64_t>(x) < static_cast<std::uint64_t>(y);
    }
}

template <class B, class A>
B ExpectedFromInteger(A x) {
    constexpr B kMax = std::numeric_limits<B>::max();
    constexpr B kMin = std::numeric_limits<B>::lowest();
    if constexpr (std::is_floating_point_v<B>) {
        return static_cast<B>(x);  // the ordinary conversion: the nearest value
    } else if constexpr (std::is_same_v<A, std::int64_t>) {
        if constexpr (std::is_same_v<B, std::uint64_t>) {
            return static_cast<B>(x);  // bit copy
        } else {
            return Less(x, kMax) ? static_cast<B>(x) : kMax;  // below the maximum: wraps
        }
    } else if constexpr (std::is_same_v<A, std::uint64_t>) {
        return Less(kMax, x) ? kMax : static_cast<B>(x);
    } else if constexpr (kSmallSigned<A> && sizeof(B) == 8) {
        return x < 1 ? B(0) : static_cast<B>(x);
    } else {
        if (Less(kMax, x)) {
            return kMax;
        }
        if (Less(x, kMin)) {
            return kMin;
        }
        return static_cast<B>(x);
    }
}

template <class B, class A>
B ExpectedFromFloating(A x) {
    if constexpr (std::is_floating_point_v<B>) {
        return static_cast<B>(x);
    } else {
        if (std::isnan(x)) {
            return NaNResult<B>();
        }
        const long double v = static_cast<long double>(x);
        if constexpr (sizeof(B) == 8) {
            const long double high = std::is_signed_v<B> ? 0x1p63L : 0x1p64L;
            if (v <= 0) {
                return 0;
            }
            if (v >= high) {
                return std::numeric_limits<B>::max();
            }
            return static_cast<B>(std::trunc(v));
        } else {
            // y = x + 0.5 (or x - 0.5 for signed destinations below 0), one rounding to
            // A; the thresholds are B's limits as values of A.
            const long double half = std::is_signed_v<B> && v < 0 ? -0.5L : 0.5L;
            const long double y = static_cast<long double>(static_cast<A>(v + half));
            const long double high =
                static_cast<long double>(static_cast<A>(std::numeric_limits<B>::max()));
            if (y >= high) {
                return std::numeric_limits<B>::max();
            }
            if (std::is_signed_v<B> ? y < Low<B>() : y <= 0) {
                return std::numeric_limits<B>::lowest();
            }
            return static_cast<B>(std::trunc(y));
        }
    }
}

/// rule(x): the value a converter from A to B writes for x.
template <class B, class A>
B Expected(A x) {
    if constexpr (std::is_floating_point_v<A>) {
        return ExpectedFromFloating<B>(x);
    } else {
        return ExpectedFromInteger<B>(x);
    }
}

/// Equal values, floating ones bit for bit (-0.0 is not 0.0) except that any NaN matches
/// an expected NaN.
template <class B>
bool SameValue(B actual, B expected) {
    if constexpr (std::is_floating_point_v<B>) {
        if (std::isnan(expected)) {
            return std::isnan(actual);
        }
        return std::memcmp(&actual, &expected, sizeof actual) == 0;
    } else {
        return actual == expected;
    }
}

// ------------------------------------------------------------------ packed streams

inline std::size_t StreamBytes(std::size_t count, unsigned int bits) {
    return (count * bits + 7) / 8;
}

/// Stream bit k is bit 7 - k % 8 of byte k / 8.
inline bool StreamBit(const unsigned char* bytes, std::size_t k) {
    return (bytes[k / 8] >> (7 - k % 8)) & 1;
}
inline void SetStreamBit(std::vector<unsigned char>& bytes, std::size_t k) {
    bytes[k / 8] = static_cast<unsigned char>(bytes[k / 8] | 1 << (7 - k % 8));
}

/// The documented packing, bit by bit: each sample's N low bits, most significant first;
/// a sample spanning bytes also ORs its value shifted right by the bits that follow its
/// first byte into that byte (where bits above N-1 meet the previous sample).
template <class T>
std::vector<unsigned char> ReferencePack(const T* samples, std::size_t count, unsigned int bits) {
    std::vector<unsigned char> bytes(StreamBytes(count, bits), 0);
    for (std::size_t i = 0; i < count; ++i) {
        // As an infinite two's complement value: signed samples extend their sign.
        const long long value =
            std::is_signed_v<T> ? static_cast<long long>(samples[i])
                                : static_cast<long long>(static_cast<std::uint64_t>(samples[i]));
        const std::size_t first = i * bits;
        for (unsigned int j = 0; j < bits; ++j) {
            if ((value >> (bits - 1 - j)) & 1) {
                SetStreamBit(bytes, first + j);
            }
        }
        const unsigned int inFirstByte = 8 - static_cast<unsigned int>(first % 8);
        if (bits > inFirstByte) {
            const long long spill = value >> (bits - inFirstByte);
            bytes[first / 8] = static_cast<unsigned char>(bytes[first / 8] | (spill & 0xFF));
        }
    }
    return bytes;
}

/// The documented unpacking: sample i is stream bits N*i .. N*i + N - 1, zero-extended.
template <class T>
std::vector<T> ReferenceUnpack(const unsigned char* bytes, std::size_t count, unsigned int bits) {
    std::vector<T> samples(count);
    for (std::size_t i = 0; i < count; ++i) {
        std::uint64_t value = 0;
        for (unsigned int j = 0; j < bits; ++j) {
            value = value << 1 | (StreamBit(bytes, i * bits + j) ? 1u : 0u);
        }
        samples[i] = static_cast<T>(value);
    }
    return samples;
}

}  // namespace kubo_test

#endif  // KUBO_TESTS_SUPPORT_PROMOTEREFERENCE_H
