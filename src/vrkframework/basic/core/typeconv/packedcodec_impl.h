// The packed-stream codec: N-bit samples unpacked into and packed from whole-byte
// integers, compiled once per kernel variant (private to the library; included by the
// kernel tables only). Everything has internal linkage, so that the copies of different
// variants never mix.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDCODEC_IMPL_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDCODEC_IMPL_H

#include <algorithm>  // std::min
#include <cstddef>    // std::size_t
#include <cstdint>
#include <type_traits>

#include "vrkframework/basic/core/byteorder.h"
#include "vrkframework/basic/core/kernels/capabilities.h"
#include "vrkframework/basic/core/kernels/onebitblocks.h"

namespace typeconv::detail {
namespace {

using kora::kubo::detail::kVector64BitMultiply;
using kora::kubo::detail::LoadHighFirst;
using kora::kubo::detail::LoadLowFirst;
using kora::kubo::detail::StoreHighFirst;
using kora::kubo::detail::StoreLowFirst;

/// How many leading samples of a `bits`-bit stream of `count` samples start in a byte
/// followed by at least 7 more stream bytes: 8-byte accesses from their byte stay inside
/// the stream.
inline std::size_t SamplesWithWholeWindow(std::size_t count, unsigned int bits) {
    const std::size_t streamBytes = (count * bits + 7) / 8;
    // Sample i qualifies while i * bits / 8 <= streamBytes - 8, that is i * bits is
    // below (streamBytes - 7) * 8.
    return streamBytes < 8 ? 0 : ((streamBytes - 7) * 8 - 1) / bits + 1;
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

/// Bits dividing 8: each byte spreads into 8 / Bits samples, most significant bits first.
/// Returns the samples done (whole bytes), as the other special loops do.
template <unsigned int Bits, class T>
std::size_t UnpackWithinBytes(const unsigned char* __restrict packed, T* __restrict samples,
                              std::size_t count) {
    constexpr unsigned int kPerByte = 8 / Bits;
    std::size_t i = 0;
#if KUBO_DETAIL_MASK_REGISTERS
    if constexpr (Bits == 1 && sizeof(T) == 1) {
        for (; i + 8 <= count / 8; i += 8) {
            kora::kubo::detail::UnpackOneBitBlock(packed + i, samples + 8 * i);
        }
    }
#endif
    for (; i < count / kPerByte; ++i) {
        const unsigned int byte = packed[i];
        if constexpr (Bits == 1 && sizeof(T) == 1 && kVector64BitMultiply) {
            // Where 64-bit lanes multiply this is the fastest (the shifts are elsewhere):
            // a copy of the byte in every byte of the word, masked
            // to bit 7 - j in byte j; adding 0x7F carries each such bit into bit 7.
            const std::uint64_t spread = (byte * 0x0101010101010101u) & 0x0102040810204080u;
            const std::uint64_t ones = (spread + 0x7F7F7F7F7F7F7F7Fu) >> 7 & 0x0101010101010101u;
            StoreLowFirst(reinterpret_cast<unsigned char*>(samples + 8 * i), ones);
        } else {
            for (unsigned int j = 0; j < kPerByte; ++j) {
                samples[kPerByte * i + j] =
                    static_cast<T>((byte >> (8 - Bits * (j + 1))) & ((1u << Bits) - 1));
            }
        }
    }
    return count / kPerByte * kPerByte;
}

/// Twelve-bit samples: each three bytes hold two samples.
template <class T>
std::size_t UnpackTwelveBits(const unsigned char* __restrict packed, T* __restrict samples,
                             std::size_t count) {
    for (std::size_t i = 0; i < count / 2; ++i) {
        const unsigned int first = packed[3 * i];
        const unsigned int middle = packed[3 * i + 1];
        const unsigned int last = packed[3 * i + 2];
        samples[2 * i] = static_cast<T>(first << 4 | middle >> 4);
        samples[2 * i + 1] = static_cast<T>((middle & 0xFu) << 8 | last);
    }
    return count / 2 * 2;
}

/// Any bit count: one 8-byte load from the byte of every PerWord-th sample feeds that
/// sample and the PerWord - 1 after it (the first may start 7 bits into the word, so
/// PerWord * bits is at most 57). Returns the samples done, the rest being left to a
/// byte-wise tail.
template <unsigned int PerWord, class T>
std::size_t UnpackWords(const unsigned char* __restrict packed, T* __restrict samples,
                        std::size_t count, unsigned int bits) {
    // Words start at samples below `windowed` that have PerWord samples from them.
    const std::size_t windowed = SamplesWithWholeWindow(count, bits);
    const std::size_t end = count < PerWord ? 0 : std::min(windowed, count - PerWord + 1);
    std::size_t done = 0;
    for (std::size_t position = 0; done < end;
         done += PerWord, position += std::size_t{PerWord} * bits) {
        std::uint64_t word = LoadHighFirst(packed + position / 8) << (position % 8);
        for (unsigned int j = 0; j < PerWord; ++j) {
            samples[done + j] = static_cast<T>(word >> (64 - bits));
            word <<= bits;
        }
    }
    return done;
}

/// Unpacks into T of the element size (zero extension gives the same bits for both signs).
template <class T>
void Unpack(const unsigned char* packed, void* target, std::size_t count, unsigned int bits) {
    T* samples = static_cast<T*>(target);
    std::size_t done = bits == 1    ? UnpackWithinBytes<1>(packed, samples, count)
                       : bits == 2  ? UnpackWithinBytes<2>(packed, samples, count)
                       : bits == 4  ? UnpackWithinBytes<4>(packed, samples, count)
                       : bits == 12 ? UnpackTwelveBits(packed, samples, count)
                       : bits <= 7  ? UnpackWords<8>(packed, samples, count, bits)
                       : bits <= 14 ? UnpackWords<4>(packed, samples, count, bits)
                       : bits <= 28 ? UnpackWords<2>(packed, samples, count, bits)
                                    : UnpackWords<1>(packed, samples, count, bits);
    for (; done < count; ++done) {
        samples[done] = static_cast<T>(GatherBits(packed, done * bits, bits));
    }
}

/// `sample` sign- or zero-extended to Bits bits, as an unsigned number.
template <unsigned int Bits = 64, class T>
auto Widen(T sample) {
    using Unsigned = std::conditional_t<Bits == 64, std::uint64_t, std::uint32_t>;
    using Wide = std::conditional_t<std::is_signed_v<T>, std::make_signed_t<Unsigned>, Unsigned>;
    return static_cast<Unsigned>(static_cast<Wide>(sample));
}

/// Bits dividing 8: 8 / Bits samples per byte, the first on top. Samples never span two
/// bytes, so each keeps only its Bits low bits. One-bit byte samples go eight at a time
/// through a multiplication that moves bit 0 of byte j of the little-endian word to bit
/// 63 - j; no two partial products share a bit, so nothing carries into the top byte.
template <unsigned int Bits, class T>
std::size_t PackWithinBytes(const T* __restrict samples, unsigned char* __restrict packed,
                            std::size_t count) {
    constexpr unsigned int kPerByte = 8 / Bits;
    std::size_t i = 0;
#if KUBO_DETAIL_MASK_REGISTERS
    if constexpr (Bits == 1 && sizeof(T) == 1) {
        for (; i + 8 <= count / 8; i += 8) {
            kora::kubo::detail::PackOneBitBlock(samples + 8 * i, packed + i, 1);
        }
    }
#endif
    for (; i < count / kPerByte; ++i) {
        if constexpr (Bits == 1 && sizeof(T) == 1) {
            const std::uint64_t lows =
                LoadLowFirst(reinterpret_cast<const unsigned char*>(samples + 8 * i)) &
                0x0101010101010101u;
            packed[i] = static_cast<unsigned char>((lows * 0x8040201008040201u) >> 56);
        } else {
            unsigned int byte = 0;
            for (unsigned int j = 0; j < kPerByte; ++j) {
                byte |= (static_cast<unsigned int>(samples[kPerByte * i + j]) & ((1u << Bits) - 1))
                        << (8 - Bits * (j + 1));
            }
            packed[i] = static_cast<unsigned char>(byte);
        }
    }
    return count / kPerByte * kPerByte;
}

/// Twelve-bit samples: two samples into three bytes; the second sample's bits above 11
/// reach the first sample's low nibble, as PackKept describes.
template <class T>
std::size_t PackTwelveBits(const T* __restrict samples, unsigned char* __restrict packed,
                           std::size_t count) {
    for (std::size_t i = 0; i < count / 2; ++i) {
        const std::uint64_t first = Widen(samples[2 * i]);
        const std::uint64_t second = Widen(samples[2 * i + 1]);
        packed[3 * i] = static_cast<unsigned char>(first >> 4);
        packed[3 * i + 1] = static_cast<unsigned char>(first << 4 | second >> 8);
        packed[3 * i + 2] = static_cast<unsigned char>(second);
    }
    return count / 2 * 2;
}

/// The bits a `bits`-bit sample leaves in a cleared stream at `offset` bits into a byte:
/// within one byte its `bits` low bits; across bytes also the `offset` bits above them,
/// which the first byte receives unmasked (so they land in the previous sample).
inline std::uint64_t PackKept(std::uint64_t value, unsigned int bits, unsigned int offset) {
    const unsigned int spill = offset + bits > 8 ? offset : 0;
    return value & (~std::uint64_t{0} >> (64 - bits - spill));
}

/// Writes a stream from a byte boundary on. The top m_fill bits of m_pending (fewer than
/// 8 between appends) begin the byte at m_next; the bytes before it are final. Bytes are
/// stored, not ORed, so the stream needs no clearing first.
class BitWriter {
public:
    explicit BitWriter(unsigned char* next) : m_next(next) {}

    /// The offset of the next sample in its byte.
    unsigned int GetOffsetInByte() const { return m_fill; }

    /// Appends `bits` bits (at most 56) from `word`; bits of `word` above them are ORed
    /// into the pending bits before. Stores 8 bytes from m_next, which must be writable.
    void Append(std::uint64_t word, unsigned int bits) {
        m_pending |= word << (64 - m_fill - bits);
        m_fill += bits;
        StoreHighFirst(m_next, m_pending);
        m_next += m_fill / 8;
        m_pending <<= m_fill / 8 * 8;
        m_fill %= 8;
    }

    /// Appends `bits` bits (at most 56, a whole number of bytes) from `word` at a byte
    /// boundary, where the next append starts on one again: nothing is pending between them,
    /// so one append's store does not wait for the last. Stores 8 bytes from m_next.
    void AppendBytes(std::uint64_t word, unsigned int bits) {
        StoreHighFirst(m_next, word << (64 - bits));
        m_next += bits / 8;
    }

    /// The same as `Append`, storing only the completed bytes: near the end of the stream.
    void AppendNearEnd(std::uint64_t word, unsigned int bits) {
        m_pending |= word << (64 - m_fill - bits);
        for (m_fill += bits; m_fill >= 8; m_fill -= 8) {
            *m_next++ = static_cast<unsigned char>(m_pending >> 56);
            m_pending <<= 8;
        }
    }

    /// Stores the last, partial byte (its unused low bits 0).
    void Finish() {
        if (m_fill != 0) {
            *m_next = static_cast<unsigned char>(m_pending >> 56);
        }
    }

private:
    unsigned char* m_next;
    std::uint64_t m_pending = 0;
    unsigned int m_fill = 0;
};

/// PerWord samples from `samples` side by side in the low PerWord * bits bits, the first on
/// top. Each sample must fit in `bits` bits.
template <unsigned int PerWord, class T>
std::uint64_t Group(const T* samples, unsigned int bits) {
    std::uint64_t word = 0;
    for (unsigned int j = 0; j < PerWord; ++j) {
        word |= Widen(samples[j]) << (PerWord - 1 - j) * bits;
    }
    return word;
}

/// Any bit count, PerWord samples per append (PerWord * bits at most 56). Blocks whose
/// samples all fit in `bits` bits (the usual case) go a word at a time while 8 bytes of
/// stream remain; other samples go one by one with their exact over-wide bits. Where a
/// word is whole bytes, as 8 samples of up to 7 bits, 4 of an even count or 2 of a multiple
/// of 4 are, every block starts on a byte boundary (256 samples are whole bytes too) and its
/// words are stored side by side.
template <unsigned int PerWord, class T>
void PackWords(const T* __restrict samples, unsigned char* __restrict packed, std::size_t count,
               unsigned int bits) {
    constexpr std::size_t kBlock = 256;
    const unsigned int wordBits = PerWord * bits;
    const std::size_t windowed = SamplesWithWholeWindow(count, bits);
    BitWriter writer(packed);
    for (std::size_t done = 0; done < count; done += kBlock) {
        const std::size_t n = count - done < kBlock ? count - done : kBlock;
        const T* block = samples + done;
        // Set bits above `bits` (fewer than 32) show in 32-bit lanes, sign extension included,
        // unless the samples are wider.
        constexpr unsigned int kLaneBits = sizeof(T) <= 4 ? 32 : 64;
        decltype(Widen<kLaneBits>(T{})) over = 0;
        for (std::size_t i = 0; i < n; ++i) {
            over |= Widen<kLaneBits>(block[i]) >> bits;
        }
        // Whole words whose first sample has 8 bytes of stream from its byte.
        const std::size_t windowedHere = done < windowed ? windowed - done : 0;
        const std::size_t words =
            over != 0 ? 0 : std::min(n / PerWord, (windowedHere + PerWord - 1) / PerWord);
        std::size_t i = 0;
        if (wordBits % 8 == 0) {
            for (; i < words * PerWord; i += PerWord) {
                writer.AppendBytes(Group<PerWord>(block + i, bits), wordBits);
            }
        } else {
            for (; i < words * PerWord; i += PerWord) {
                writer.Append(Group<PerWord>(block + i, bits), wordBits);
            }
        }
        for (; i < n; ++i) {
            writer.AppendNearEnd(PackKept(Widen(block[i]), bits, writer.GetOffsetInByte()), bits);
        }
    }
    writer.Finish();
}

template <class T>
void Pack(const void* source, unsigned char* packed, std::size_t count, unsigned int bits) {
    const T* samples = static_cast<const T*>(source);
    const std::size_t done = bits == 1    ? PackWithinBytes<1>(samples, packed, count)
                             : bits == 2  ? PackWithinBytes<2>(samples, packed, count)
                             : bits == 4  ? PackWithinBytes<4>(samples, packed, count)
                             : bits == 12 ? PackTwelveBits(samples, packed, count)
                                          : 0;
    // The special loops end on a byte boundary, where the general packing goes on.
    const T* rest = samples + done;
    unsigned char* const next = packed + done * bits / 8;
    if (bits <= 7) {
        PackWords<8>(rest, next, count - done, bits);
    } else if (bits <= 14) {
        PackWords<4>(rest, next, count - done, bits);
    } else if (bits <= 28) {
        PackWords<2>(rest, next, count - done, bits);
    } else {
        PackWords<1>(rest, next, count - done, bits);
    }
}

}  // namespace
}  // namespace typeconv::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDCODEC_IMPL_H
