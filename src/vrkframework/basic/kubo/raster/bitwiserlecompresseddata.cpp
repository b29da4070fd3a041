// Bit-run compression of raw raster bytes, the whole decoder and the window decoder with
// its seeking read cursor.
#include "vrkframework/basic/kubo/raster/bitwiserlecompresseddata.h"

#include <algorithm>  // std::min
#include <cstdint>    // SIZE_MAX
#include <cstring>    // std::memcpy, std::memset

#include "vrkframework/basic/kubo/raster/count32.h"
#include "vrkframework/basic/kubo/raster/runs/alternatingruns.h"
#include "vrkframework/basic/kubo/raster/runs/bytesink.h"
#include "vrkframework/basic/kubo/raster/runs/decodedbytes.h"
#include "vrkframework/basic/kubo/raster/runs/rowprefetch.h"
#include "vrkframework/basic/kubo/raster/runs/runcheckpoints.h"
#include "vrkframework/basic/kubo/raster/runs/wordscan.h"
#include "vrkframework/platform/exception.h"

namespace kora::kubo {
namespace {

constexpr char kSourcePath[] = "vrkframework/basic/kubo/raster/bitwiserlecompresseddata";

// Out of line, so that the cursor's steps stay small enough to inline into the window loop.
[[noreturn]] void ThrowIndexNotFound(const char* function, unsigned int line) {
    throw kora::DataException("Uncompressed index not found.", kSourcePath, function, line);
}

constexpr char kWindowDecode[] =
    "void __cdecl kora::kubo::BitwiseRLECompressedData::Decode(int,int,int,int,unsigned char *) "
    "const";

// Writes runs of bits into bytes, most significant bit first. A run costs one mark, at the
// bit where the value changes; a word of output is the running parity of its marks from the
// most significant bit on, flipped when the word starts set. Busy data, whose runs are a few
// bits long, then takes a handful of operations a run. Bits of one value only add to a
// count until the value changes: a long stretch goes out as one fill.
class BitWriter {
public:
    explicit BitWriter(unsigned char* out) : m_out(out) {}

    /// Appends `length` bits of `value`.
    void Put(std::uint64_t length, bool value) {
        if (value != m_value) {
            if (m_filled >= 64) {
                Spill();
            }
            m_marks ^= kFirstBit >> m_filled;
            m_value = value;
        }
        m_filled += length;
    }

    // The stream holds whole bytes, so nothing is left over.
    void Finish() {
        if (m_filled >= 64) {
            Spill();
        }
        Store(static_cast<std::size_t>(m_filled / 8));
    }

private:
    static constexpr std::uint64_t kFirstBit = std::uint64_t{1} << 63;

    // Writes the full word, then the whole words of the current value after it.
    void Spill() {
        Store(8);
        const auto bytes = static_cast<std::size_t>((m_filled - 64) / 64 * 8);
        std::memset(m_out, m_value ? 0xFF : 0, bytes);
        m_out += bytes;
        m_filled %= 64;
        m_marks = 0;
        m_startsSet = m_value;
    }

    void Store(std::size_t bytes) {
        std::uint64_t word = m_marks;
        for (unsigned int shift = 1; shift < 64; shift *= 2) {
            word ^= word >> shift;
        }
        word ^= m_startsSet ? ~std::uint64_t{0} : 0;
        const std::uint64_t ordered = detail::kLittleEndian ? detail::ByteSwap(word) : word;
        std::memcpy(m_out, &ordered, bytes);
        m_out += bytes;
    }

    unsigned char* m_out;
    std::uint64_t m_marks = 0;   ///< a bit set where the value changes, first bit highest
    std::uint64_t m_filled = 0;  ///< bits from the word's first on, past its end in a stretch
    bool m_startsSet = false;    ///< the value at the first bit of the word
    bool m_value = false;        ///< the value of the last bits put
};

using Cursor = detail::BitRunCursor;

// Rows whose last read end each object keeps, for a window that starts where the window to
// its left ended: rows a multiple of this apart share a slot.
constexpr std::size_t kRowEndSlots = 512;

// The read cursor at work. It moves a copy of the object's cursor, which the compiler keeps
// in registers (the members themselves would make a round trip through memory at every run,
// since the bytes written may alias them), and the window decoder stores it back at the end,
// also when a read fails.
class Reader {
public:
    Reader(const unsigned char* runs, std::size_t size, const detail::RunCheckpoints& checkpoints,
           const Cursor& cursor)
        : m_runs(runs),
          m_size(size),
          m_checkpoints(checkpoints),
          m_cursor(cursor),
          m_prefetch(runs, size, 1, checkpoints) {}

    /// The cursor at the first bit of a stream.
    static Cursor Start(const unsigned char* runs) { return Cursor{0, 0, runs[0], 0, false}; }

    const Cursor& Where() const { return m_cursor; }

    /// Takes up `end`, where an earlier read stopped, when it stands exactly at `bit` and
    /// a run starts after it: the seek from the cursor would then succeed (a cursor past
    /// the last run stands at the end of the stream, after the bit, and starts over) and
    /// end in the run that holds the bit or at the start of the next one, which read the
    /// same bits from there and leave the same cursor as `end` does.
    void ResumeAt(const Cursor& end, std::uint64_t bit) {
        if (Resumes(end, bit)) {
            m_cursor = end;
        }
    }

    /// Reads `byteCount` bytes from `byteOffset` on into `dst` and leaves the cursor where
    /// the read ended in `end`. `nextEnd` is where a read of the next row ended: when that
    /// row will take up from there at `nextBit`, it needs no seek and nothing is fetched
    /// ahead for it.
    void Read(std::uint64_t byteOffset, std::uint64_t byteCount, unsigned char* dst, Cursor& end,
              const Cursor& nextEnd, std::uint64_t nextBit) {
        // A cursor inside the stream that stands at the bit already stays: the seek would
        // move nothing.
        if (m_cursor.position != byteOffset * 8 || m_cursor.runIndex >= m_size) {
            Seek(byteOffset * 8);
        }
        if (Resumes(nextEnd, nextBit)) {
            m_prefetch.RowStarts(m_cursor.runIndex, nextEnd.runIndex);
        } else {
            m_prefetch.RowStarts(m_cursor.runIndex);
        }
        // The bits go out run by run. A run is entered only when a bit of it is read, so the
        // cursor ends in the run that holds the last bit read, as read bit by bit: the run
        // the cursor stands in is read on, then the runs after it that are read whole.
        BitWriter writer(dst);
        try {
            for (std::uint64_t left = byteCount * 8; left > 0;) {
                EnterUnreadRun();
                const std::uint32_t unread = m_cursor.runLength - m_cursor.consumed;
                // An empty run after a separator (never written by the encoder) still gives a
                // bit.
                const auto take = static_cast<std::uint32_t>(
                    unread == 0 ? 1 : std::min<std::uint64_t>(unread, left));
                m_cursor.consumed += take;
                m_cursor.position += take;
                left -= take;
                writer.Put(take, m_cursor.bitValue);
                ReadWholeRuns(left, writer);
            }
        } catch (...) {
            writer.Finish();  // the whole bytes read before the failure are delivered
            throw;
        }
        writer.Finish();
        m_prefetch.RowEnds(m_cursor.runIndex);
        // Field by field: copied whole, the cursor just stored back into the reader is read
        // in wide loads across its narrower stores, which cannot take their data from them.
        end.runIndex = m_cursor.runIndex;
        end.position = m_cursor.position;
        end.runLength = m_cursor.runLength;
        end.consumed = m_cursor.consumed;
        end.bitValue = m_cursor.bitValue;
    }

private:
    /// Whether a read at `bit` takes up `end` (see ResumeAt).
    bool Resumes(const Cursor& end, std::uint64_t bit) const {
        return end.position == bit && end.runIndex + 1 < m_size;
    }

    // Reads the runs after the cursor's run, which has been read to its end, one mark each,
    // as long as each lies in the stream and is read whole, and bits are left to read before
    // it: the steps of the read would enter each (also a separator, whose run after it then
    // gives the next bit) and read it to its end.
    void ReadWholeRuns(std::uint64_t& left, BitWriter& writer) {
        std::size_t run = m_cursor.runIndex;
        std::uint64_t position = m_cursor.position;
        bool value = m_cursor.bitValue;
        while (left > 0 && run + 1 < m_size && m_runs[run + 1] <= left) {
            // A separator and the run after it read whole leave the value as it was: one step
            // for both, as long stretches of one value are pairs of 255 and 0.
            if (m_runs[run + 1] == 0 && run + 2 < m_size && m_runs[run + 2] <= left) {
                const std::uint32_t joined = m_runs[run + 2];
                run += 2;
                writer.Put(joined, value);
                position += joined;
                left -= joined;
                continue;
            }
            const std::uint32_t length = m_runs[++run];
            value = !value;
            if (length != 0) {  // a separator: the bits around it join without a change
                writer.Put(length, value);
                position += length;
                left -= length;
            }
        }
        if (run != m_cursor.runIndex) {
            m_cursor = Cursor{run, position, m_runs[run], m_runs[run], value};
        }
    }

    void Jump() {
        m_cursor.position += m_cursor.runLength - m_cursor.consumed;
        ++m_cursor.runIndex;
        if (m_cursor.runIndex >= m_size) {
            ThrowIndexNotFound(
                "void __cdecl kora::kubo::BitwiseRLECompressedData::Jump(void) const", 343);
        }
        EnterRun(m_cursor.runIndex, m_cursor.position, !m_cursor.bitValue);
    }

    void EnterRun(std::size_t run, std::uint64_t position, bool value) {
        m_cursor.runIndex = run;
        m_cursor.position = position;
        m_cursor.runLength = m_runs[run];
        m_cursor.consumed = 0;
        m_cursor.bitValue = value;
    }

    // kRuns + 1 jumps at once while all of them stay below the bit and inside the stream: the
    // position grows by the rest of this run and the next kRuns runs.
    template <std::size_t kRuns, class Sum>
    void JumpBlocks(std::uint64_t bit, Sum sumOfRuns) {
        while (m_cursor.runIndex + kRuns + 1 < m_size) {
            const std::uint64_t next = m_cursor.position +
                                       (m_cursor.runLength - m_cursor.consumed) +
                                       sumOfRuns(m_runs + m_cursor.runIndex + 1);
            if (next >= bit) {
                break;
            }
            EnterRun(m_cursor.runIndex + kRuns + 1, next,
                     m_cursor.bitValue != ((kRuns + 1) % 2 == 1));
        }
    }

    void Seek(std::uint64_t bit) {
        if (bit < m_cursor.position) {
            m_cursor = Start(m_runs);
        }
        SkipToCheckpoint(bit);
        JumpBlocks<64>(bit, detail::SumOfBytes<64>);
        JumpBlocks<8>(bit, detail::SumOfEightBytes);
        while (m_cursor.position < bit && m_cursor.runIndex < m_size) {
            Jump();
        }
        // Reached only when an earlier failed jump left the cursor past the last run.
        if (m_cursor.runIndex >= m_size) {
            ThrowIndexNotFound(
                "void __cdecl kora::kubo::BitwiseRLECompressedData::Seek(unsigned long) const",
                318);
        }
        if (m_cursor.position == bit) {
            return;
        }
        // The last jump passed the bit: step back into the run that holds it.
        --m_cursor.runIndex;
        m_cursor.runLength = m_runs[m_cursor.runIndex];
        m_cursor.consumed =
            static_cast<std::uint32_t>(m_cursor.runLength - (m_cursor.position - bit));
        m_cursor.position = bit;
        m_cursor.bitValue = !m_cursor.bitValue;
    }

    // The cursor stands where the jumps would take it: at the start of the last indexed run
    // that starts before the bit, when that run lies ahead. Run k holds bits of value k mod 2.
    void SkipToCheckpoint(std::uint64_t bit) {
        if (bit == 0) {
            return;
        }
        const auto checkpoint =
            m_checkpoints.LastWithin(bit - 1, m_cursor.runIndex, m_prefetch.NextRow());
        if (checkpoint.run > m_cursor.runIndex) {
            EnterRun(checkpoint.run, checkpoint.total, detail::RunValue(checkpoint.run));
        }
    }

    void EnterUnreadRun() {
        if (m_cursor.consumed >= m_cursor.runLength) {
            Jump();
            if (m_cursor.runLength == 0) {  // a separator: the value goes on in the run after it
                Jump();
            }
        }
    }

    const unsigned char* m_runs;
    std::size_t m_size;
    const detail::RunCheckpoints& m_checkpoints;
    Cursor m_cursor;
    detail::RowPrefetch m_prefetch;
};

}  // namespace

BitwiseRLECompressedData::BitwiseRLECompressedData(unsigned char* buffer, RasterInfo& info)
    : m_size(0), m_info(info), m_cursor{} {
    if (buffer == nullptr) {
        throw kora::DataException("pBuffer is NULL, cannot compress NULL buffer", kSourcePath,
                                  "__cdecl kora::kubo::BitwiseRLECompressedData::"
                                  "BitwiseRLECompressedData(unsigned char *,class "
                                  "kora::kubo::RasterInfo &)",
                                  25);
    }
    Compress(buffer, GetBufferSizeBytes() * 8);
    m_cursor = Reader::Start(m_buffer.get());
}

BitwiseRLECompressedData::BitwiseRLECompressedData(const BitwiseRLECompressedData& other) = default;
BitwiseRLECompressedData& BitwiseRLECompressedData::operator=(
    const BitwiseRLECompressedData& other) = default;
// Moving copies: the source stays usable, and the shared data is not duplicated.
BitwiseRLECompressedData::BitwiseRLECompressedData(BitwiseRLECompressedData&& other) noexcept
    // NOLINTNEXTLINE(performance-move-constructor-init)
    : BitwiseRLECompressedData(static_cast<const BitwiseRLECompressedData&>(other)) {}
BitwiseRLECompressedData& BitwiseRLECompressedData::operator=(
    BitwiseRLECompressedData&& other) noexcept {
    return *this = static_cast<const BitwiseRLECompressedData&>(other);
}
BitwiseRLECompressedData::~BitwiseRLECompressedData() = default;

unsigned int BitwiseRLECompressedData::GetCompressedSize() const {
    return detail::Count32(
        m_size, "A compressed size", kSourcePath,
        "unsigned int __cdecl kora::kubo::BitwiseRLECompressedData::GetCompressedSize(void) const");
}

void BitwiseRLECompressedData::Compress(unsigned char* buffer, std::uint64_t bitCount) {
    // Sized for smooth data at first; noise grows it.
    detail::ByteSink sink(bitCount / 128 + 16);
    detail::AppendAlternatingRuns(
        bitCount,
        [&](std::uint64_t position, bool value) {
            return detail::FindBitChange(buffer, position, bitCount, value);
        },
        sink);
    m_size = sink.Size();
    m_buffer = sink.Release();
    m_checkpoints = std::make_shared<const detail::RunCheckpoints>(m_buffer.get(), m_size, 1);
}

std::uint64_t BitwiseRLECompressedData::GetLineSize() const {
    return static_cast<std::uint64_t>((m_info.dataType.bits + 7u) / 8u) * m_info.channels *
           m_info.width;
}

std::uint64_t BitwiseRLECompressedData::GetBufferSizeBytes() const {
    return GetLineSize() * m_info.height;
}

unsigned char* BitwiseRLECompressedData::Decode() const {
    return detail::NewDecoded(GetBufferSizeBytes(), [this](unsigned char* out) { Decode(out); });
}

unsigned char* BitwiseRLECompressedData::Decode(int x, int y, int w, int h) const {
    const auto size = GetBufferSizeBytes();
    return detail::NewDecoded(size,
                              [&](unsigned char* out) { DecodeWindow(x, y, w, h, out, size); });
}

void BitwiseRLECompressedData::Decode(unsigned char* out) const {
    if (out == nullptr) {
        throw kora::DataException(
            "pBuffer is NULL, cannot Decode in NULL buffer", kSourcePath,
            "void __cdecl kora::kubo::BitwiseRLECompressedData::Decode(unsigned char *) const",
            128);
    }
    const unsigned char* runs = m_buffer.get();
    BitWriter writer(out);
    for (std::size_t run = 0; run < m_size;) {
        const bool value = detail::RunValue(run);
        writer.Put(detail::NextStretch(runs, m_size, run), value);
    }
    writer.Finish();
}

void BitwiseRLECompressedData::Decode(int x, int y, int w, int h, unsigned char* out) const {
    DecodeWindow(x, y, w, h, out, SIZE_MAX);
}

void BitwiseRLECompressedData::DecodeWindow(int x, int y, int w, int h, unsigned char* out,
                                            std::size_t capacity) const {
    // Sums in 64 bits, so that no sum wraps into the raster.
    const long long columns = m_info.width;
    const long long rows = m_info.height;
    if (!(y < rows && static_cast<long long>(y) + h <= rows && x < columns &&
          static_cast<long long>(x) + w <= columns)) {
        throw kora::OutOfBoundsException({x, y, w, w},
                                         "Window is not in include in this compressed raster",
                                         kSourcePath, kWindowDecode, 190);
    }
    if (out == nullptr) {
        throw kora::DataException("pBuffer is NULL, cannot compress NULL buffer", kSourcePath,
                                  kWindowDecode, 196);
    }
    // A negative width reads nothing; a negative x or y wraps the offset as unsigned.
    const std::size_t rowBytes = w > 0 ? static_cast<std::size_t>(w) : 0;
    const std::size_t spacing =
        rowBytes * ((m_info.dataType.bits + 7u) / 8u) * std::size_t{m_info.channels};
    const std::uint64_t lineSize = GetLineSize();
    Reader reader(m_buffer.get(), m_size, *m_checkpoints, m_cursor);
    // Windows side by side: where a row of the window to the left ended, this one starts.
    m_rowEnds.resize(kRowEndSlots, Cursor{0, UINT64_MAX, 0, 0, false});
    try {
        std::size_t o = 0;
        for (long long row = y; row < static_cast<long long>(y) + h && o < capacity;
             ++row, o += spacing) {
            const std::uint64_t offset =
                static_cast<std::uint64_t>(row) * lineSize + static_cast<std::uint64_t>(x);
            Cursor& rowEnd = m_rowEnds[static_cast<std::uint64_t>(row) % kRowEndSlots];
            reader.ResumeAt(rowEnd, offset * 8);
            reader.Read(offset, static_cast<std::uint64_t>(std::min(rowBytes, capacity - o)),
                        out + o, rowEnd,
                        m_rowEnds[static_cast<std::uint64_t>(row + 1) % kRowEndSlots],
                        (offset + lineSize) * 8);
        }
    } catch (...) {
        m_cursor = reader.Where();
        throw;
    }
    m_cursor = reader.Where();
}

}  // namespace kora::kubo
