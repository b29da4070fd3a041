// The kernel loops and their table, compiled once per instruction set: each kernel file
// includes this header once and returns kKernelSet. Everything here has internal
// linkage so that the copies compiled for different instruction sets never mix.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_KERNELSET_IMPL_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_KERNELSET_IMPL_H

#include <cstdint>
#include <cstring>  // std::memcpy, std::memset
#include <type_traits>
#include <utility>  // std::index_sequence

#include "vrkframework/basic/core/typeconv/kernels.h"
#include "vrkframework/basic/core/typeconv/saturate.h"
#include "vrkframework/basic/core/typeconv/typelist.h"

namespace typeconv::detail {
namespace {

// ---------------------------------------------------------------- element conversions

template <class A, class B>
void ConvertLoop(const A* __restrict src, B* __restrict dst, std::size_t count) {
    for (std::size_t i = 0; i < count; ++i) {
        dst[i] = ConvertSample<B>(src[i]);
    }
}

template <class A, class B>
void Convert(const void* src, void* dst, std::size_t count) {
    ConvertLoop(static_cast<const A*>(src), static_cast<B*>(dst), count);
}

template <std::size_t Size>
void Copy(const void* src, void* dst, std::size_t count) {
    if (count != 0) {
        std::memcpy(dst, src, count * Size);
    }
}

/// Pairs whose rule is the identity on the bits share the copy; unsigned sources into
/// wider integers (zero extension) and signed 8/16/32-bit sources into 64-bit integers
/// (negatives to 0) give the same bits for both signs of the destination and share the
/// unsigned destination's kernel.
template <class A, class B>
constexpr ConvertKernel SelectConvertKernel() {
    constexpr bool kSameBits =
        sizeof(A) == sizeof(B) && std::is_integral_v<A> && std::is_integral_v<B> &&
        (std::is_signed_v<A> == std::is_signed_v<B> || (std::is_signed_v<A> && sizeof(A) == 8));
    if constexpr (std::is_same_v<A, B> || kSameBits) {
        return &Copy<sizeof(A)>;
    } else if constexpr (std::is_integral_v<A> && std::is_integral_v<B> &&
                         (std::is_unsigned_v<A> ? sizeof(B) > sizeof(A)
                                                : sizeof(B) == 8 && sizeof(A) < 8)) {
        return &Convert<A, std::make_unsigned_t<B>>;
    } else {
        return &Convert<A, B>;
    }
}

template <class T>
void InterleaveWithZeros(const void* values, void* pairs, std::size_t count) {
    const T* __restrict in = static_cast<const T*>(values);
    T* __restrict out = static_cast<T*>(pairs);
    for (std::size_t i = 0; i < count; ++i) {
        out[2 * i] = in[i];
        out[2 * i + 1] = 0;
    }
}

template <class T>
void TakeRealParts(const void* pairs, void* values, std::size_t count) {
    const T* __restrict in = static_cast<const T*>(pairs);
    T* __restrict out = static_cast<T*>(values);
    for (std::size_t i = 0; i < count; ++i) {
        out[i] = in[2 * i];
    }
}

// ---------------------------------------------------------------- packed streams

/// The 8 bytes at `bytes` as a big-endian number (one load and a byte swap once compiled).
inline std::uint64_t LoadBigEndian64(const unsigned char* bytes) {
    std::uint64_t word = 0;
    for (int k = 0; k < 8; ++k) {
        word = word << 8 | bytes[k];
    }
    return word;
}

/// The `bits`-bit sample at stream bit `position`, read byte by byte (never past the
/// last byte the sample touches).
inline std::uint32_t GatherBits(const unsigned char* packed, std::size_t position,
                                unsigned int bits) {
    const unsigned char* byte = packed + position / 8;
    const unsigned int available = 8 - static_cast<unsigned int>(position % 8);
    std::uint32_t value = *byte & (0xFFu >> (8 - available));
    if (bits <= available) {
        return value >> (available - bits);
    }
    unsigned int missing = bits - available;
    for (; missing >= 8; missing -= 8) {
        value = value << 8 | *++byte;
    }
    if (missing != 0) {
        value = value << missing | static_cast<std::uint32_t>(*++byte >> (8 - missing));
    }
    return value;
}

/// One-bit samples: each byte spreads into eight 0/1 values, most significant bit first.
template <class T>
void UnpackOneBit(const unsigned char* __restrict packed, T* __restrict samples,
                  std::size_t count) {
    for (std::size_t i = 0; i < count / 8; ++i) {
        const unsigned int byte = packed[i];
        for (unsigned int j = 0; j < 8; ++j) {
            samples[8 * i + j] = static_cast<T>((byte >> (7 - j)) & 1u);
        }
    }
}

/// Twelve-bit samples: each three bytes hold two samples.
template <class T>
void UnpackTwelveBits(const unsigned char* __restrict packed, T* __restrict samples,
                      std::size_t count) {
    for (std::size_t i = 0; i < count / 2; ++i) {
        const unsigned int first = packed[3 * i];
        const unsigned int middle = packed[3 * i + 1];
        const unsigned int last = packed[3 * i + 2];
        samples[2 * i] = static_cast<T>(first << 4 | middle >> 4);
        samples[2 * i + 1] = static_cast<T>((middle & 0xFu) << 8 | last);
    }
}

/// Unpacks into T of the element size (zero extension gives the same bits for both signs).
template <class T>
void Unpack(const unsigned char* packed, void* target, std::size_t count, unsigned int bits) {
    T* samples = static_cast<T*>(target);
    std::size_t done = 0;
    if (bits == 1) {
        UnpackOneBit(packed, samples, count);
        done = count / 8 * 8;
    } else if (bits == 12) {
        UnpackTwelveBits(packed, samples, count);
        done = count / 2 * 2;
    } else {
        // A 64-bit window holds any sample (offset up to 7 plus up to 31 bits) as long as
        // 8 bytes remain readable.
        const std::size_t streamBytes = (count * bits + 7) / 8;
        for (; done < count && (done * bits) / 8 + 8 <= streamBytes; ++done) {
            const std::size_t position = done * bits;
            const std::uint64_t window = LoadBigEndian64(packed + position / 8);
            samples[done] = static_cast<T>((window << (position % 8)) >> (64 - bits));
        }
    }
    for (; done < count; ++done) {
        samples[done] = static_cast<T>(GatherBits(packed, done * bits, bits));
    }
}

/// ORs one sample into a cleared stream. Within one byte only its `bits` low bits count;
/// across bytes the first byte receives everything above the bits that follow it,
/// unmasked, so bits above `bits` - 1 land in the previous sample. `value` is the sample
/// sign-extended (signed types) or zero-extended to 64 bits.
inline void PutBits(unsigned char* packed, std::size_t position, unsigned int bits,
                    std::uint64_t value) {
    unsigned char* byte = packed + position / 8;
    const unsigned int available = 8 - static_cast<unsigned int>(position % 8);
    if (bits <= available) {
        const std::uint64_t mask = (std::uint64_t{1} << bits) - 1;
        *byte = static_cast<unsigned char>(*byte | (value & mask) << (available - bits));
        return;
    }
    unsigned int remaining = bits - available;
    *byte = static_cast<unsigned char>(*byte | value >> remaining);
    for (; remaining >= 8; remaining -= 8) {
        *++byte = static_cast<unsigned char>(value >> (remaining - 8));
    }
    if (remaining != 0) {
        *++byte = static_cast<unsigned char>(value << (8 - remaining));
    }
}

template <class T>
std::uint64_t Widen(T sample) {
    using Wide = std::conditional_t<std::is_signed_v<T>, std::int64_t, std::uint64_t>;
    return static_cast<std::uint64_t>(static_cast<Wide>(sample));
}

/// One-bit samples: eight low bits gathered into one byte, the first sample on top.
template <class T>
void PackOneBit(const T* __restrict samples, unsigned char* __restrict packed, std::size_t count) {
    for (std::size_t i = 0; i < count / 8; ++i) {
        unsigned int byte = 0;
        for (unsigned int j = 0; j < 8; ++j) {
            byte |= (static_cast<unsigned int>(samples[8 * i + j]) & 1u) << (7 - j);
        }
        packed[i] = static_cast<unsigned char>(byte);
    }
}

/// Twelve-bit samples: two samples into three bytes; the second sample's bits above 11
/// reach the first sample's low nibble, as PutBits does.
template <class T>
void PackTwelveBits(const T* __restrict samples, unsigned char* __restrict packed,
                    std::size_t count) {
    for (std::size_t i = 0; i < count / 2; ++i) {
        const std::uint64_t first = Widen(samples[2 * i]);
        const std::uint64_t second = Widen(samples[2 * i + 1]);
        packed[3 * i] = static_cast<unsigned char>(first >> 4);
        packed[3 * i + 1] = static_cast<unsigned char>(first << 4 | second >> 8);
        packed[3 * i + 2] = static_cast<unsigned char>(second);
    }
}

template <class T>
void Pack(const void* source, unsigned char* packed, std::size_t count, unsigned int bits) {
    const T* samples = static_cast<const T*>(source);
    // The byte count is formed in 32-bit unsigned arithmetic, as the stream limit implies.
    const std::uint32_t bytes = (static_cast<std::uint32_t>(count) * bits + 7u) / 8u;
    std::memset(packed, 0, bytes);
    std::size_t done = 0;
    if (bits == 1) {
        PackOneBit(samples, packed, count);
        done = count / 8 * 8;
    } else if (bits == 12) {
        PackTwelveBits(samples, packed, count);
        done = count / 2 * 2;
    }
    for (; done < count; ++done) {
        PutBits(packed, done * bits, bits, Widen(samples[done]));
    }
}

// ---------------------------------------------------------------- the table

template <std::size_t Index, class List = priv::ComponentTypes>
struct ComponentAt : ComponentAt<Index - 1, typename List::tail> {};
template <class List>
struct ComponentAt<0, List> {
    using type = typename List::head;
};

template <std::size_t Index>
using Component = typename ComponentAt<Index>::type;

template <class A, std::size_t... To>
constexpr std::array<ConvertKernel, kComponentCount> MakeConvertRow(std::index_sequence<To...>) {
    return {{SelectConvertKernel<A, Component<To>>()...}};
}

template <class T>
constexpr UnpackKernel SelectUnpackKernel() {
    if constexpr (std::is_integral_v<T>) {
        return &Unpack<std::make_unsigned_t<T>>;
    } else {
        return nullptr;
    }
}

template <class T>
constexpr PackKernel SelectPackKernel() {
    if constexpr (std::is_integral_v<T>) {
        return &Pack<T>;
    } else {
        return nullptr;
    }
}

template <std::size_t... Index>
constexpr KernelSet MakeKernelSet(std::index_sequence<Index...> indices) {
    return KernelSet{
        {{MakeConvertRow<Component<Index>>(indices)...}},
        {{&InterleaveWithZeros<std::uint8_t>, &InterleaveWithZeros<std::uint16_t>,
          &InterleaveWithZeros<std::uint32_t>, &InterleaveWithZeros<std::uint64_t>}},
        {{&TakeRealParts<std::uint8_t>, &TakeRealParts<std::uint16_t>,
          &TakeRealParts<std::uint32_t>, &TakeRealParts<std::uint64_t>}},
        {{SelectUnpackKernel<Component<Index>>()...}},
        {{SelectPackKernel<Component<Index>>()...}},
    };
}

constexpr KernelSet kKernelSet = MakeKernelSet(std::make_index_sequence<kComponentCount>());

}  // namespace
}  // namespace typeconv::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_KERNELSET_IMPL_H
