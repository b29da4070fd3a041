// How no-data values are stored for each element type, and how a stored value becomes the
// per-channel test the pixel loops run in the sample's own type (private to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_NODATASTORAGE_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_NODATASTORAGE_H

#include <cstdint>  // std::int64_t, std::uint64_t
#include <limits>
#include <type_traits>

/// A no-data value of type T and a tag: the storage of listed channels for the 64-bit
/// element types, which have no wider type to hold an out-of-range marker. In the global
/// namespace, as the kernel families that store it are.
template <class T>
struct OneMoreBit {
    enum Tag : unsigned char {
        kCompared = 0,     ///< a sample matches when it equals `value`
        kUntested = 1,     ///< the channel is not tested
        kMatchesNone = 2,  ///< no sample matches (never made by the factory)
        kMatchesAll = 3    ///< every sample matches (never made by the factory)
    };

    T value;
    unsigned char tag;
};

namespace kora::kubo::detail {

template <class T>
struct IsOneMoreBit : std::false_type {};
template <class T>
struct IsOneMoreBit<OneMoreBit<T>> : std::true_type {};

/// The storage of listed channels: a type that holds every sample of T and one value more,
/// the marker of an untested channel.
template <class T>
struct Wider;
template <>
struct Wider<char> {
    using type = short;
};
template <>
struct Wider<unsigned char> {
    using type = unsigned short;
};
template <>
struct Wider<short> {
    using type = int;
};
template <>
struct Wider<unsigned short> {
    using type = unsigned int;
};
template <>
struct Wider<int> {
    using type = std::int64_t;
};
template <>
struct Wider<unsigned int> {
    using type = std::uint64_t;
};
template <>
struct Wider<float> {
    using type = double;
};
template <>
struct Wider<std::int64_t> {
    using type = OneMoreBit<std::int64_t>;
};
template <>
struct Wider<std::uint64_t> {
    using type = OneMoreBit<std::uint64_t>;
};
template <>
struct Wider<double> {
    using type = OneMoreBit<double>;
};
template <class T>
using WiderType = typename Wider<T>::type;

/// The entry of a channel that is not tested: the largest value of the wider type (no
/// sample reaches it) or the tag that says so.
template <class S>
constexpr S UntestedEntry() {
    if constexpr (IsOneMoreBit<S>::value) {
        return S{0, S::kUntested};
    } else {
        return std::numeric_limits<S>::max();
    }
}

/// The bits of `v` truncated toward zero as a 64-bit integer; values from 2^63 up are
/// taken as unsigned with the usual offset. NaN and values outside [-2^63, 2^64) have no
/// integer; they give 2^63, the pattern x86 conversions produce for them.
inline std::uint64_t TruncatedBits(double v) {
    constexpr double kTwo63 = 9223372036854775808.0;
    if (v >= -kTwo63 && v < kTwo63) {
        return static_cast<std::uint64_t>(static_cast<std::int64_t>(v));
    }
    if (v >= kTwo63 && v < 2.0 * kTwo63) {
        return static_cast<std::uint64_t>(static_cast<std::int64_t>(v - kTwo63)) +
               static_cast<std::uint64_t>(kTwo63);
    }
    return static_cast<std::uint64_t>(kTwo63);
}

/// A no-data value in storage type S: integers keep the low bits of the truncated value
/// (-1.0 is 255 for unsigned 8-bit), float rounds to nearest (to infinity beyond its range),
/// double is kept. Nothing is clamped.
template <class S>
S ToStorage(double v) {
    if constexpr (IsOneMoreBit<S>::value) {
        return S{ToStorage<decltype(S::value)>(v), S::kCompared};
    } else if constexpr (std::is_same_v<S, double>) {
        return v;
    } else if constexpr (std::is_same_v<S, float>) {
        static_assert(std::numeric_limits<float>::is_iec559, "every double lies between floats");
        return static_cast<float>(v);
    } else {
        static_assert(std::is_integral_v<S>, "no-data storage is integer, float or tagged");
        return static_cast<S>(TruncatedBits(v));
    }
}

/// A channel whose samples are compared with one value of their own type.
template <class T>
struct PlainTest {
    T value;

    static constexpr bool IsTested() { return true; }
    bool Matches(T sample) const { return sample == value; }
};

/// A channel as a stored entry describes it, in the sample's own type: whether it is tested
/// at all (the all-channels rule passes untested channels over), whether every sample
/// matches, and whether a sample equal to `value` does.
template <class T>
struct ChannelTest {
    T value;
    bool tested;
    bool matchesAll;
    bool byValue;

    bool IsTested() const { return tested; }
    bool Matches(T sample) const { return matchesAll | (byValue & (sample == value)); }
};

template <class Test>
struct IsChannelTest : std::false_type {};
template <class T>
struct IsChannelTest<ChannelTest<T>> : std::true_type {};

/// The test of one stored entry. A wider entry matches a sample exactly when it is a value
/// of T and the sample equals it; so comparing in T gives the result of comparing the
/// widened sample (a float entry that is no float, such as 0.1, matches nothing).
template <class T, class S>
auto TestOf(const S& entry) {
    if constexpr (std::is_same_v<S, T>) {
        return PlainTest<T>{entry};
    } else if constexpr (IsOneMoreBit<S>::value) {
        return ChannelTest<T>{entry.value, entry.tag != S::kUntested, entry.tag == S::kMatchesAll,
                              entry.tag == S::kCompared};
    } else {
        const bool tested = entry != UntestedEntry<S>();
        bool isValue = false;
        T value = 0;
        if constexpr (std::is_floating_point_v<T>) {
            isValue = static_cast<S>(static_cast<T>(entry)) == entry;
        } else if constexpr (std::is_signed_v<T>) {
            isValue = entry >= static_cast<S>(std::numeric_limits<T>::min()) &&
                      entry <= static_cast<S>(std::numeric_limits<T>::max());
        } else {
            isValue = entry <= static_cast<S>(std::numeric_limits<T>::max());
        }
        if (isValue) {
            value = static_cast<T>(entry);
        }
        return ChannelTest<T>{value, tested, false, isValue};
    }
}

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_NODATASTORAGE_H
