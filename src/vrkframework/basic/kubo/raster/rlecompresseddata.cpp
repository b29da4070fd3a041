// (count, value) pair compression of raw raster bytes, and its whole and window decoders.
#include "vrkframework/basic/kubo/raster/rlecompresseddata.h"

#include <algorithm>  // std::min
#include <cstdint>    // std::uint16_t, std::uint32_t, std::uint64_t
#include <cstring>    // std::memcpy

#include "vrkframework/basic/kubo/raster/count32.h"
#include "vrkframework/basic/kubo/raster/runs/bytesink.h"
#include "vrkframework/basic/kubo/raster/runs/decodedbytes.h"
#include "vrkframework/basic/kubo/raster/runs/rowprefetch.h"
#include "vrkframework/basic/kubo/raster/runs/runcheckpoints.h"
#include "vrkframework/basic/kubo/raster/runs/wordscan.h"
#include "vrkframework/platform/exception.h"

namespace kora::kubo {
namespace {

constexpr char kSourcePath[] = "vrkframework/basic/kubo/raster/rlecompresseddata";
constexpr char kNullOutput[] = "pBuffer is NULL, cannot Decode in NULL buffer";

// Noise is handled a block of single-byte runs at a time, through 16-bit lanes that hold
// one (count, value) pair each; the loops are written for the compiler to vectorise.
constexpr std::size_t kBlock = 32;
constexpr unsigned int kCountShift = detail::kLittleEndian ? 0 : 8;
constexpr unsigned int kValueShift = 8 - kCountShift;

// Four pairs loaded lowest byte first: the counts in the low byte of each 16-bit lane.
constexpr std::uint64_t kCountBytes = 0x00FF00FF00FF00FFull;
constexpr std::uint64_t kLaneOnes = 0x0001000100010001ull;

// The values of the four pairs in `pairs` (loaded lowest byte first), in the low bytes.
std::uint32_t ValuesOfFour(std::uint64_t pairs) {
    std::uint64_t values = (pairs >> 8) & kCountBytes;
    values = (values | (values >> 8)) & 0x0000FFFF0000FFFFull;
    return static_cast<std::uint32_t>(values | (values >> 16));
}

std::uint16_t LoadLane(const unsigned char* bytes) {
    std::uint16_t lane;
    std::memcpy(&lane, bytes, sizeof lane);
    return lane;
}

// Writes the pairs (1, b) of the block's bytes when no byte equals its successor (the
// byte after the block is read too).
bool EncodeSingles(const unsigned char* in, unsigned char* out) {
    unsigned char repeats = 0;
    for (std::size_t k = 0; k < kBlock; ++k) {
        repeats |= static_cast<unsigned char>(in[k] == in[k + 1]);
    }
    if (repeats != 0) {
        return false;
    }
    for (std::size_t k = 0; k < kBlock; ++k) {
        const auto lane =
            static_cast<std::uint16_t>((1u << kCountShift) | (unsigned{in[k]} << kValueShift));
        std::memcpy(out + 2 * k, &lane, sizeof lane);
    }
    return true;
}

// Writes the values of a block of pairs when every count is 1.
bool DecodeSingles(const unsigned char* pairs, unsigned char* out) {
    std::uint16_t others = 0;
    for (std::size_t k = 0; k < kBlock; ++k) {
        const unsigned int lane = LoadLane(pairs + 2 * k);
        others |= static_cast<std::uint16_t>(((lane >> kCountShift) & 0xFFu) ^ 1u);
    }
    if (others != 0) {
        return false;
    }
    for (std::size_t k = 0; k < kBlock; ++k) {
        out[k] = static_cast<unsigned char>(unsigned{LoadLane(pairs + 2 * k)} >> kValueShift);
    }
    return true;
}

// Writes the values of the 4 pairs at `pairs` and returns how many of them come first
// with count 1: those bytes are decoded, the ones after them are left to be overwritten.
unsigned int DecodeLeadingSingles(const unsigned char* pairs, unsigned char* out) {
    const std::uint64_t four = detail::LoadLowFirst(pairs);
    const std::uint64_t others = (four & kCountBytes) ^ kLaneOnes;
    detail::StoreLowFirst(out, ValuesOfFour(four));
    return others == 0 ? 4 : detail::LowestSetBit(others) / 16;
}

detail::EncodedBytes EncodePairs(const unsigned char* in, std::size_t count, std::size_t& size) {
    detail::ByteSink sink(2 * count);
    unsigned char* out = sink.Reserve(2 * count);
    for (std::size_t i = 0; i < count;) {
        // Noise: a block of runs of one at once.
        if (count - i > kBlock && EncodeSingles(in + i, out)) {
            out += 2 * kBlock;
            i += kBlock;
            continue;
        }
        const unsigned char value = in[i];
        std::size_t end = i + 1;
        if (end < count && in[end] == value) {
            end = detail::FindByteChange(in, end + 1, count, value);
        }
        std::size_t length = end - i;
        for (; length > 255; length -= 255) {
            out[0] = 255;
            out[1] = value;
            out += 2;
        }
        out[0] = static_cast<unsigned char>(length);
        out[1] = value;
        out += 2;
        i = end;
    }
    sink.Commit(out);
    size = sink.Size();
    return sink.Release();
}

// The pairs as the window decoder sees them: outside the stream every pair is empty with
// value 0, so that an unchecked window never reads past the stream.
class PairStream {
public:
    PairStream(const unsigned char* pairs, std::size_t bytes)
        : m_pairs(pairs), m_count(bytes / 2) {}

    std::size_t Size() const { return m_count; }
    std::uint32_t Count(std::size_t pair) const { return pair < m_count ? m_pairs[2 * pair] : 0u; }
    unsigned char Value(std::size_t pair) const {
        return pair < m_count ? m_pairs[2 * pair + 1] : 0;
    }

    // The sum of the counts of the 4 x `words` pairs from `pair` on (all within the stream;
    // at most 64 pairs), added in the 16-bit lanes of one word.
    template <std::size_t words>
    std::uint32_t SumOf(std::size_t pair) const {
        std::uint64_t counts = 0;
        for (std::size_t k = 0; k < words; ++k) {
            counts += detail::LoadLowFirst(m_pairs + 2 * pair + 8 * k) & kCountBytes;
        }
        return static_cast<std::uint32_t>((counts * kLaneOnes) >> 48);
    }

    // Moves `pair` over blocks of 4 x `words` pairs while their counts fit in `room`, which
    // shrinks by each block's sum, as long as whole blocks are left in the stream.
    template <std::size_t words>
    void SkipBlocks(std::size_t& pair, std::uint64_t& room) const {
        while (m_count - pair >= 4 * words) {
            const std::uint64_t sum = SumOf<words>(pair);
            if (sum > room) {
                return;
            }
            room -= sum;
            pair += 4 * words;
        }
    }

    // How many of the 4 pairs from `pair` (all within the stream) can be added one after
    // the other without their sum passing `room`, and that sum in `sum`. The running sums
    // of the four counts lie in the 16-bit lanes of one word and are compared with the
    // room all at once; they grow with each pair, so the ones that fit come first.
    unsigned int FitOfFour(std::size_t pair, std::uint64_t room, std::uint64_t& sum) const {
        constexpr std::uint64_t kLaneSigns = kLaneOnes << 15;
        const std::uint64_t running =
            (detail::LoadLowFirst(m_pairs + 2 * pair) & kCountBytes) * kLaneOnes;
        // Sums stay below 2^15, so a lane holding 2^15 + room keeps its sign bit exactly
        // where the room reaches the sum, and no lane borrows from the next.
        const std::uint64_t lanes = std::min<std::uint64_t>(room, 0x7FFF) * kLaneOnes;
        const std::uint64_t misses = ~((lanes | kLaneSigns) - running) & kLaneSigns;
        const unsigned int fit = misses == 0 ? 4 : detail::LowestSetBit(misses) / 16;
        sum = fit == 4 ? running >> 48 : ((running << 16) >> (16 * fit)) & 0xFFFF;
        return fit;
    }

    // Whether the `count` pairs after `pair` lie in the stream.
    bool HasAfter(std::size_t pair, std::size_t count) const {
        return pair < m_count && m_count - pair > count;
    }
    const unsigned char* At(std::size_t pair) const { return m_pairs + 2 * pair; }

private:
    const unsigned char* m_pairs;
    std::size_t m_count;
};

}  // namespace

RLECompressedData::RLECompressedData(unsigned char* buffer, RasterInfo& info,
                                     RasterContext& context)
    : m_info(info.width + 2 * context.xMargin, info.height + 2 * context.yMargin, info.channels,
             info.dataType),
      m_size(0) {
    if (buffer == nullptr) {
        throw kora::DataException("pBuffer is NULL, cannot compress NULL buffer", kSourcePath,
                                  "__cdecl kora::kubo::RLECompressedData::RLECompressedData("
                                  "unsigned char *,class kora::kubo::RasterInfo &,class "
                                  "kora::kubo::RasterContext &)",
                                  30);
    }
    m_buffer = EncodePairs(buffer, GetRasterSize(), m_size);
    m_checkpoints = std::make_shared<const detail::RunCheckpoints>(m_buffer.get(), m_size / 2, 2);
}

RLECompressedData::RLECompressedData(const RLECompressedData& other) = default;
RLECompressedData& RLECompressedData::operator=(const RLECompressedData& other) = default;
// Moving copies: the source stays usable, and the shared data is not duplicated.
RLECompressedData::RLECompressedData(RLECompressedData&& other) noexcept
    // NOLINTNEXTLINE(performance-move-constructor-init)
    : RLECompressedData(static_cast<const RLECompressedData&>(other)) {}
RLECompressedData& RLECompressedData::operator=(RLECompressedData&& other) noexcept {
    return *this = static_cast<const RLECompressedData&>(other);
}
RLECompressedData::~RLECompressedData() = default;

unsigned int RLECompressedData::GetCompressedSize() const {
    return detail::Count32(
        m_size, "A compressed size", kSourcePath,
        "unsigned int __cdecl kora::kubo::RLECompressedData::GetCompressedSize(void) const");
}

std::size_t RLECompressedData::GetRasterSize() const {
    return std::size_t{m_info.width} * m_info.height * m_info.channels *
           ((m_info.dataType.bits + 7u) / 8u);
}

unsigned char* RLECompressedData::Decode() const {
    return detail::NewDecoded(GetRasterSize(), [this](unsigned char* out) { Decode(out); });
}

unsigned char* RLECompressedData::Decode(int x, int y, int w, int h) const {
    const auto size = GetRasterSize();
    return detail::NewDecoded(size,
                              [&](unsigned char* out) { DecodeWindow(x, y, w, h, out, size); });
}

void RLECompressedData::Decode(unsigned char* out) const {
    if (out == nullptr) {
        throw kora::DataException(
            kNullOutput, kSourcePath,
            "void __cdecl kora::kubo::RLECompressedData::Decode(unsigned char *) const", 107);
    }
    const unsigned char* pair = m_buffer.get();
    const unsigned char* const end = pair + m_size;
    while (pair != end) {
        // Noise: a block of pairs of count 1 at once; a block that holds a longer run is
        // decoded pair by pair before the next block is tried.
        const unsigned char* blockEnd = end;
        if (static_cast<std::size_t>(end - pair) >= 2 * kBlock) {
            if (DecodeSingles(pair, out)) {
                out += kBlock;
                pair += 2 * kBlock;
                continue;
            }
            blockEnd = pair + 2 * kBlock;
        }
        do {
            // Inside such a block, the pairs of count 1 before the longer run go four at a
            // time; writing all four values is safe, as four more pairs are left.
            if (end - pair >= 8) {
                const unsigned int singles = DecodeLeadingSingles(pair, out);
                out += singles;
                pair += std::size_t{2} * singles;
                if (singles == 4) {
                    continue;
                }
            }
            // Pairs of one value split at 255 are joined into one fill.
            const unsigned char value = pair[1];
            std::size_t length = pair[0];
            for (pair += 2; pair != end && pair[1] == value; pair += 2) {
                length += pair[0];
            }
            detail::FillBytes(out, value, length);
            out += length;
        } while (pair < blockEnd);
    }
}

void RLECompressedData::Decode(int x, int y, int w, int h, unsigned char* out) const {
    if (out == nullptr) {
        throw kora::DataException(kNullOutput, kSourcePath,
                                  "void __cdecl kora::kubo::RLECompressedData::Decode(int,int,int,"
                                  "int,unsigned char *) const",
                                  146);
    }
    DecodeWindow(x, y, w, h, out, SIZE_MAX);
}

void RLECompressedData::DecodeWindow(int x, int y, int w, int h, unsigned char* out,
                                     std::size_t capacity) const {
    if (h < 1 || w < 1) {
        return;
    }
    // Positions, the running total and the run count-down are 64-bit unsigned, so no
    // position of a raster wraps; a negative x or y wraps into a position past the stream.
    const std::uint64_t pixel = std::uint64_t{(m_info.dataType.bits + 7u) / 8u} * m_info.channels;
    const std::uint64_t stride = m_info.width * pixel;
    std::uint64_t start =
        (std::uint64_t{m_info.width} * static_cast<std::uint64_t>(std::int64_t{y}) +
         static_cast<std::uint64_t>(std::int64_t{x})) *
        pixel;
    const auto rowBytes = static_cast<std::size_t>(w);
    const PairStream pairs(m_buffer.get(), m_size);
    const detail::RunCheckpoints& checkpoints = *m_checkpoints;
    std::size_t pair = 0;
    std::uint64_t total = 0;
    // The counts of the pairs before `pair` while it lies in the stream. The running total
    // drifts from it by the row rule below, and the drift stays the same while seeking.
    std::uint64_t passed = 0;
    detail::RowPrefetch prefetch(m_buffer.get(), pairs.Size(), 2, checkpoints);
    for (std::size_t o = 0; h > 0 && o < capacity; --h, o += rowBytes, start += stride) {
        // Seek: add counts until the total passes the row's start. Whole stretches of
        // pairs go at once while the total stays at or below it: first up to the last
        // checkpoint that keeps it so, then sixty-four and sixteen pairs at a time, then
        // four at a time up to the pair that passes. A block that does not fit does not fit
        // from any later pair either (no count is negative), so each size is given up for
        // the next at its first failure. Past the stream nothing is added. Where the rows
        // before guess the row's start less than sixty-four pairs ahead, that size is not
        // tried: it would only fail.
        if (total <= start && pair < pairs.Size()) {
            std::uint64_t room = start - total;
            const std::size_t guess = prefetch.NextRow();
            const auto checkpoint = checkpoints.LastWithin(
                passed > UINT64_MAX - room ? UINT64_MAX : passed + room, pair, guess);
            if (checkpoint.run > pair) {
                room -= checkpoint.total - passed;
                pair = checkpoint.run;
            }
            if (guess == 0 || guess - pair >= 64) {  // also a guess behind, which wraps
                pairs.SkipBlocks<16>(pair, room);
            }
            pairs.SkipBlocks<4>(pair, room);
            for (unsigned int fit = 4; fit == 4 && pairs.Size() - pair >= 4;) {
                std::uint64_t sum;
                fit = pairs.FitOfFour(pair, room, sum);
                room -= sum;
                pair += fit;
            }
            passed += (start - room) - total;
            total = start - room;
        }
        while (total <= start && pair < pairs.Size()) {
            const std::uint64_t count = pairs.Count(pair++);
            total += count;
            passed += count;
        }
        // The step back is taken on every row, also when the seek added nothing.
        --pair;
        std::uint64_t remaining = total - start;
        unsigned char value = pairs.Value(pair);
        total -= pairs.Count(pair);
        passed -= pairs.Count(pair);
        prefetch.RowStarts(pair);

        unsigned char* row = out + o;
        for (std::size_t left = std::min(rowBytes, capacity - o); left > 0;) {
            if (remaining == 0) {
                // Noise: pairs of count 1 are entered without a fill each, a block at once
                // where the whole block is such pairs, else up to four.
                std::size_t singles = 0;
                if (pairs.Count(pair + 1) == 1) {
                    if (left >= kBlock && pairs.HasAfter(pair, kBlock) &&
                        DecodeSingles(pairs.At(pair + 1), row)) {
                        singles = kBlock;
                    } else if (left >= 4 && pairs.HasAfter(pair, 4)) {
                        singles = DecodeLeadingSingles(pairs.At(pair + 1), row);
                    }
                }
                if (singles != 0) {
                    passed += pairs.Count(pair) + (singles - 1);
                    total += singles;
                    pair += singles;
                    row += singles;
                    left -= singles;
                    continue;
                }
                // The total grows by the count of the pair entered (not of the one left):
                // the next row's seek is defined on that total.
                passed += pairs.Count(pair);
                remaining = pairs.Count(++pair);
                value = pairs.Value(pair);
                total += remaining;
            }
            // An empty pair (only past the stream) makes the count-down wrap, so its
            // value covers the rest of the row.
            const std::size_t run =
                remaining == 0 ? left
                               : static_cast<std::size_t>(std::min<std::uint64_t>(remaining, left));
            detail::FillBytes(row, value, run);
            row += run;
            left -= run;
            remaining -= run;
        }
        prefetch.RowEnds(pair);
    }
}

}  // namespace kora::kubo
