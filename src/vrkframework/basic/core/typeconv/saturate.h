// The per-value rules of the sample promotions, each written once as a scalar inline
// helper without early returns (selects, min/max shapes) so that the kernel loops calling
// them vectorise. ConvertSample<B>(x) picks the rule of a pair.
//
// Every helper sits in an unnamed namespace: each kernel variant compiles this header with
// its own instruction set, and internal linkage keeps one variant's copy of a helper from
// being merged with, and used in place of, another's. Where the vector units convert or
// round directly (kernels/capabilities.h) a helper takes the direct form; elsewhere it
// builds the same result from signed 32-bit conversions.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_SATURATE_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_SATURATE_H

#include <cmath>  // std::copysign, std::fabs, std::trunc
#include <cstdint>
#include <cstring>  // std::memcpy
#include <limits>
#include <type_traits>

#include "vrkframework/basic/core/kernels/capabilities.h"

namespace typeconv::detail {

using kora::kubo::detail::kVectorRounding;
using kora::kubo::detail::kWideIntegerConversions;
namespace {

template <class T>
constexpr bool kIsSigned64 = std::is_integral_v<T>&& std::is_signed_v<T> && sizeof(T) == 8;
template <class T>
constexpr bool kIsUnsigned64 = std::is_integral_v<T>&& std::is_unsigned_v<T> && sizeof(T) == 8;
template <class T>
constexpr bool kIsNarrowSigned = std::is_integral_v<T>&& std::is_signed_v<T> && sizeof(T) < 8;

template <class To, class From>
inline To BitCast(From value) {
    static_assert(sizeof(To) == sizeof(From), "bit casts keep the size");
    To result;
    std::memcpy(&result, &value, sizeof result);
    return result;
}

// ---------------------------------------------------------------- integer to integer

/// Saturates to the range of B, at whichever end B is narrower than A.
template <class B, class A>
inline B ClampToRange(A x) {
    constexpr bool kClampHigh = static_cast<std::uint64_t>(std::numeric_limits<B>::max()) <
                                static_cast<std::uint64_t>(std::numeric_limits<A>::max());
    // Sign extension of the lowest values is the point of the comparison.
    constexpr bool kClampLow =
        static_cast<std::int64_t>(
            std::numeric_limits<B>::lowest()) >  // NOLINT(bugprone-signed-char-misuse)
        static_cast<std::int64_t>(std::numeric_limits<A>::lowest());
    if constexpr (kClampHigh) {
        constexpr A kHigh = static_cast<A>(std::numeric_limits<B>::max());
        x = x > kHigh ? kHigh : x;
    }
    if constexpr (kClampLow) {
        constexpr A kLow = static_cast<A>(std::numeric_limits<B>::lowest());
        x = x < kLow ? kLow : x;
    }
    return static_cast<B>(x);
}

/// Signed 8/16/32-bit into either 64-bit type: negatives give 0, deliberately also for
/// the signed destination.
template <class B, class A>
inline B ZeroBelowOne(A x) {
    return static_cast<B>(x < 1 ? A(0) : x);
}

/// 64-bit signed into a narrower type: only an upper clamp (signed comparison); below it
/// the low bits are kept, so negatives wrap (-200 into char gives 56), deliberately.
template <class B>
inline B ClampHighKeepLowBits(std::int64_t x) {
    constexpr std::int64_t kHigh = std::numeric_limits<B>::max();
    return static_cast<B>(x >= kHigh ? kHigh : x);
}

template <class B, class A>
inline B IntegerToInteger(A x) {
    // The same bits for the same width and sign, and for 64-bit signed into unsigned (a bit
    // copy: negatives become large).
    if constexpr ((sizeof(A) == sizeof(B) && std::is_signed_v<A> == std::is_signed_v<B>) ||
                  (kIsSigned64<A> && kIsUnsigned64<B>)) {
        return static_cast<B>(x);
    } else if constexpr (kIsSigned64<A>) {
        return ClampHighKeepLowBits<B>(x);
    } else if constexpr (kIsNarrowSigned<A> && sizeof(B) == 8) {
        return ZeroBelowOne<B>(x);
    } else {
        return ClampToRange<B>(x);
    }
}

// ---------------------------------------------------------------- integer to floating

/// Unsigned 32-bit to float or double through signed conversions, which vectorise: the
/// parts are exact and the one rounding of the final sum is that of a direct conversion.
template <class B>
inline B UInt32ToFloating(std::uint32_t x) {
    if constexpr (std::is_same_v<B, float>) {
        const float high = static_cast<float>(static_cast<std::int32_t>(x >> 16)) * 65536.0f;
        return high + static_cast<float>(static_cast<std::int32_t>(x & 0xFFFFu));
    } else {
        return static_cast<double>(static_cast<std::int32_t>(x ^ 0x80000000u)) + 2147483648.0;
    }
}

/// 64-bit integer to double, correctly rounded, with 64-bit integer and double operations
/// only: the high half goes into the mantissa of 2^84 and the low half into that of 2^52,
/// both exact; the final sum rounds once.
template <class A>
inline double Int64ToDouble(A x) {
    const std::uint64_t bits = static_cast<std::uint64_t>(x);
    std::uint64_t high = bits >> 32;
    double highBias = 0x1.00000001p84;  // 2^84 + 2^52
    if constexpr (std::is_signed_v<A>) {
        high ^= 0x80000000u;         // the signed high half, offset by 2^31 ...
        highBias = 0x1.00000801p84;  // ... taken back out with 2^63
    }
    const double highPart = BitCast<double>(high | 0x4530000000000000u) - highBias;
    const double lowPart = BitCast<double>((bits & 0xFFFFFFFFu) | 0x4330000000000000u);
    return highPart + lowPart;
}

/// 64-bit integer to float, correctly rounded. Rounding to double first can land on a
/// float midpoint, so beyond 2^53 in magnitude the low 11 bits are first rounded to odd
/// (kept as a sticky bit): the value is then exact in double and rounds once to float.
template <class A>
inline float Int64ToFloat(A x) {
    const std::uint64_t bits = static_cast<std::uint64_t>(x);
    const std::uint64_t sticky = ((bits & 0x7FFu) + 0x7FFu) & 0x800u;
    const std::uint64_t odd = (bits & ~std::uint64_t{0x7FF}) | sticky;
    const bool wide = std::is_signed_v<A>
                          ? bits + (std::uint64_t{1} << 53) >= std::uint64_t{1} << 54
                          : bits >= std::uint64_t{1} << 53;
    return static_cast<float>(Int64ToDouble(static_cast<A>(wide ? odd : bits)));
}

template <class B, class A>
inline B IntegerToFloating(A x) {
    if constexpr (sizeof(A) < 4 || (sizeof(A) == 4 && std::is_signed_v<A>) ||
                  kWideIntegerConversions) {
        return static_cast<B>(x);
    } else if constexpr (sizeof(A) == 4) {
        return UInt32ToFloating<B>(x);
    } else if constexpr (std::is_same_v<B, float>) {
        return Int64ToFloat(x);
    } else {
        return Int64ToDouble(x);
    }
}

// ---------------------------------------------------------------- floating to integer

/// The largest value of A below `limit` that converts to B: float(INT32_MAX) is 2^31 and
/// float(UINT32_MAX) is 2^32, one past the range; the double forms are in range.
template <class A, class B>
constexpr A LargestConvertibleBelow(A limit) {
    return static_cast<long double>(limit) <=
                   static_cast<long double>(std::numeric_limits<B>::max())
               ? limit
               : limit - limit * std::numeric_limits<A>::epsilon() / 2;
}

/// The signed type a clamped A within the 32-bit range truncates through on its way to B:
/// with wide integer conversions a double bound for 8 or 16 bits converts to 64-bit lanes,
/// like its own, which narrow faster than 32-bit ones; bound for 32 bits it converts to them
/// directly, with no narrowing after.
template <class A, class B>
using Truncation = std::conditional_t<kWideIntegerConversions && sizeof(A) == 8 && sizeof(B) < 4,
                                      std::int64_t, std::int32_t>;

/// Truncates c in [0, 2^32).
template <class A>
inline std::uint32_t TruncateToUInt32(A c) {
    if constexpr (kWideIntegerConversions) {
        using Direct = std::conditional_t<sizeof(A) == 8, std::int64_t, std::uint32_t>;
        return static_cast<std::uint32_t>(static_cast<Direct>(c));
    } else if constexpr (kVectorRounding) {
        // trunc(c) + 2^52 holds the integer in the low bits of its mantissa.
        return static_cast<std::uint32_t>(
            BitCast<std::uint64_t>(std::trunc(static_cast<double>(c)) + 0x1p52));
    } else {
        // Signed 32-bit conversions of the value below 2^31 and of the value less 2^31.
        constexpr A kTwo31 = A(2147483648.0);
        const bool high = c >= kTwo31;
        // Subtracting a selected constant, not selecting a difference: a floating operation
        // inside a select is not evaluated for every lane, which blocks vectorisation.
        const std::int32_t low = static_cast<std::int32_t>(c - (high ? kTwo31 : A(0)));
        return static_cast<std::uint32_t>(low) + (high ? 0x80000000u : 0u);
    }
}

/// Truncates c in [0, 2^64).
template <class A>
inline std::uint64_t TruncateToUInt64(A c) {
    if constexpr (kWideIntegerConversions) {
        return static_cast<std::uint64_t>(c);
    } else if constexpr (kVectorRounding) {
        // Without 64-bit conversions: the two halves of trunc(c) are exact doubles below
        // 2^32, and each reads as an integer from the mantissa of its sum with 2^52.
        const double whole = std::trunc(static_cast<double>(c));
        const double high = std::trunc(whole * 0x1p-32);
        const double low = whole - high * 0x1p32;
        const std::uint64_t bias = BitCast<std::uint64_t>(0x1p52);
        return (BitCast<std::uint64_t>(high + 0x1p52) ^ bias) << 32 |
               (BitCast<std::uint64_t>(low + 0x1p52) ^ bias);
    } else {
        constexpr A kTwo63 = A(9223372036854775808.0);
        const bool high = c >= kTwo63;
        const std::int64_t low = static_cast<std::int64_t>(c - (high ? kTwo63 : A(0)));
        return static_cast<std::uint64_t>(low) + (high ? std::uint64_t{1} << 63 : 0u);
    }
}

/// The bit pattern of a float or double read as a signed integer.
template <class A>
using SignedBits = std::conditional_t<sizeof(A) == 4, std::int32_t, std::int64_t>;

/// Clamps y, at least +0 or NaN, to [+0, limit] on its bit pattern (NaN gives +0):
/// non-negative floating values order like their bits read as signed integers. Integer
/// min and max vectorise where floating selects feeding a conversion end up as selects on
/// the converted, narrowed values.
template <class A>
inline A ClampNonNegative(A y, A limit) {
    constexpr SignedBits<A> kInfinity =
        static_cast<SignedBits<A>>(sizeof(A) == 4 ? 0x7F800000 : 0x7FF0000000000000);
    const SignedBits<A> bits = BitCast<SignedBits<A>>(y);
    const SignedBits<A> limitBits = BitCast<SignedBits<A>>(limit);
    const SignedBits<A> clamped = bits < limitBits ? bits : limitBits;
    return BitCast<A>(bits > kInfinity ? SignedBits<A>{0} : clamped);
}

/// Clamps y to [+0, limit] (limit at least 0; NaN gives +0): every negative value (-0
/// too) reads below +0 as a signed integer.
template <class A>
inline A ClampMagnitude(A y, A limit) {
    const SignedBits<A> bits = BitCast<SignedBits<A>>(y);
    return ClampNonNegative(BitCast<A>(bits > 0 ? bits : SignedBits<A>{0}), limit);
}

/// Clamps y to [low, high] (low below 0 below high; NaN gives `nan`) on its bit pattern:
/// read as unsigned, the negative values lie above the positive ones and grow with their
/// magnitude; read as signed, they lie below. Wide integer conversions come with both
/// minimums for both widths.
template <class A>
inline A ClampOnBits(A y, A low, A high, A nan) {
    using Bits = SignedBits<A>;
    using UnsignedBits = std::make_unsigned_t<Bits>;
    const UnsignedBits lowBits = BitCast<UnsignedBits>(low);
    const UnsignedBits unsignedBits = BitCast<UnsignedBits>(y);
    const Bits aboveLow = static_cast<Bits>(unsignedBits < lowBits ? unsignedBits : lowBits);
    const Bits highBits = BitCast<Bits>(high);
    const Bits clamped = aboveLow < highBits ? aboveLow : highBits;
    return BitCast<A>(y == y ? clamped : BitCast<Bits>(nan));
}

/// float or double into char, short, int: y = x + 0.5 at or above 0, x - 0.5 below (half
/// away from zero, in the source precision), then truncation; y at or above the maximum
/// gives the maximum, below the minimum the minimum. NaN gives INT32_MIN reduced to the
/// width of B: 0 for char and short, INT32_MIN for int.
template <class B, class A>
inline B FloatingToNarrowSigned(A x) {
    constexpr A kHigh = static_cast<A>(std::numeric_limits<B>::max());
    constexpr A kLow = static_cast<A>(std::numeric_limits<B>::lowest());
    constexpr A kCeiling = LargestConvertibleBelow<A, B>(kHigh);
    constexpr std::int32_t kMax = std::numeric_limits<B>::max();
    if constexpr (kWideIntegerConversions) {
        const A y = x + std::copysign(A(0.5), x);
        const A c = ClampOnBits(y, kLow, kCeiling, sizeof(B) < 4 ? A(0) : kLow);
        const B value = static_cast<B>(static_cast<Truncation<A, B>>(c));
        if constexpr (kCeiling == kHigh) {
            return value;
        } else {
            return y >= kHigh ? static_cast<B>(kMax) : value;
        }
    } else if constexpr (sizeof(B) < 4) {
        // On the magnitude: |y| = |x| + 0.5 rounds like y in both directions; clamped to
        // -minimum, truncated, signed, then capped at the maximum.
        const A magnitude = ClampNonNegative(std::fabs(x) + A(0.5), -kLow);
        const std::int32_t value = static_cast<std::int32_t>(std::copysign(magnitude, x));
        return static_cast<B>(value < kMax ? value : kMax);
    } else {
        const A y = x + (x >= A(0) ? A(0.5) : A(-0.5));
        A c = y > kLow ? y : kLow;  // NaN takes kLow, INT32_MIN, here
        c = c < kCeiling ? c : kCeiling;
        if constexpr (kCeiling == kHigh) {
            return static_cast<B>(c);
        } else {
            return y >= kHigh ? std::numeric_limits<B>::max() : static_cast<B>(c);
        }
    }
}

/// float or double into unsigned char, short, int: y = x + 0.5, then truncation; y at or
/// below 0 gives 0 and y at or above the maximum the maximum. NaN gives 0.
template <class B, class A>
inline B FloatingToNarrowUnsigned(A x) {
    constexpr A kHigh = static_cast<A>(std::numeric_limits<B>::max());
    constexpr A kCeiling = LargestConvertibleBelow<A, B>(kHigh);
    const A y = x + A(0.5);
    const A c = ClampMagnitude(y, kCeiling);
    if constexpr (sizeof(B) < 4) {
        return static_cast<B>(static_cast<Truncation<A, B>>(c));
    } else if constexpr (kCeiling == kHigh) {
        return TruncateToUInt32(c);
    } else {
        return y >= kHigh ? std::numeric_limits<B>::max() : TruncateToUInt32(c);
    }
}

/// float or double into a 64-bit integer: truncation, no rounding; x at or below 0 gives
/// 0 (deliberately also for the signed destination), x at or above 2^63 (signed) or 2^64
/// (unsigned) the maximum. NaN gives the value with only the top bit set.
template <class B, class A>
inline B FloatingToInt64(A x) {
    if constexpr (std::is_same_v<A, float>) {
        // In double, whose lanes match the 64-bit results; exact, and so are 2^63 and 2^64.
        return FloatingToInt64<B>(static_cast<double>(x));
    }
    constexpr A kHigh = std::is_signed_v<B> ? A(9223372036854775808.0) : A(18446744073709551616.0);
    constexpr B kNaN = static_cast<B>(std::uint64_t{1} << 63);
    A c = x > A(0) ? x : A(0);
    c = c < kHigh ? c : A(0);
    const B value = static_cast<B>(TruncateToUInt64(c));
    const B saturated = x >= kHigh ? std::numeric_limits<B>::max() : value;
    return x == x ? saturated : kNaN;
}

// ---------------------------------------------------------------- the rule of a pair

/// rule(x) for a source value x of A and a destination type B.
template <class B, class A>
inline B ConvertSample(A x) {
    if constexpr (std::is_floating_point_v<B>) {
        if constexpr (std::is_floating_point_v<A>) {
            return static_cast<B>(x);  // float to double exact, double to float may overflow
        } else {
            return IntegerToFloating<B>(x);
        }
    } else if constexpr (!std::is_floating_point_v<A>) {
        return IntegerToInteger<B>(x);
    } else if constexpr (sizeof(B) == 8) {
        return FloatingToInt64<B>(x);
    } else if constexpr (std::is_signed_v<B>) {
        return FloatingToNarrowSigned<B>(x);
    } else {
        return FloatingToNarrowUnsigned<B>(x);
    }
}

}  // namespace
}  // namespace typeconv::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_SATURATE_H
