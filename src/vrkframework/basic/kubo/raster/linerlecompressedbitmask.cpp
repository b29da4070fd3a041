// Row-by-row run compression of a two-valued mask, and its row, partial-row, whole and
// window decoders.
#include "vrkframework/basic/kubo/raster/linerlecompressedbitmask.h"

#include <algorithm>  // std::min
#include <climits>    // ULONG_MAX
#include <cstdint>    // std::uint64_t
#include <cstring>    // std::memcpy
#include <utility>    // std::move
#include <vector>

#include "vrkframework/basic/core/kernels/prefetch.h"
#include "vrkframework/basic/kubo/raster/bufferextent.h"
#include "vrkframework/basic/kubo/raster/count32.h"
#include "vrkframework/basic/kubo/raster/runs/alternatingruns.h"
#include "vrkframework/basic/kubo/raster/runs/bytesink.h"
#include "vrkframework/basic/kubo/raster/runs/decodedbytes.h"
#include "vrkframework/basic/kubo/raster/runs/runcheckpoints.h"
#include "vrkframework/basic/kubo/raster/runs/wordscan.h"
#include "vrkframework/platform/exception.h"

namespace kora::kubo {
namespace {

constexpr char kSourcePath[] = "vrkframework/basic/kubo/raster/linerlecompressedbitmask";
constexpr char kNullOutput[] = "pBuffer is NULL, cannot Decode in NULL buffer";

[[noreturn]] void ThrowStartNotFound() {
    throw kora::DataException(
        "Uncompressed index not found.", kSourcePath,
        "void __cdecl kora::kubo::LineRLECompressedBitMask::DecodePartialRow(unsigned "
        "long,unsigned long,unsigned long,unsigned char *) const",
        327);
}

/// Where a pixel lies in a row: `next` is the run after the one that holds it and `end`
/// the pixel where that run ends.
struct RunEnd {
    std::size_t next;
    std::uint64_t end;
};

/// The runs of one row, and the totals of its checkpoints (none for a short row).
struct RowRuns {
    const unsigned char* runs = nullptr;
    std::size_t size = 0;
    const std::uint64_t* totals = nullptr;
    std::size_t totalCount = 0;
};

/// Rows of this many runs and more keep checkpoints, one per detail::kStreamBytesPerCheckpoint
/// runs: at least one, and 8 bytes per KiB of runs (0.78 %).
constexpr std::size_t kIndexedRowRuns = 2 * detail::kStreamBytesPerCheckpoint;

/// Decodes of at most this many pixels fill their output whole first. Whole rows of 4096
/// decoded slower that way than with a fill per run: longer fills take another path.
constexpr std::uint64_t kPrefilledBytes = 2048;

/// At most this many bytes of a row's runs, and of its checkpoints, are asked for ahead.
constexpr std::size_t kPrefetchBytes = 2048;

constexpr std::size_t CheckpointCount(std::size_t runCount) {
    return runCount >= kIndexedRowRuns ? (runCount - 1) / detail::kStreamBytesPerCheckpoint : 0;
}

// The run that holds pixel `start` among the eight from `run`, whose ends reach it from `sum`:
// found at once rather than run by run, whose last step is a branch the processor cannot
// foresee. The runs' running ends lie in 16-bit lanes of two words (four runs each; at most
// 2040, so no lane carries into the next), and the lanes that end before the start are
// counted in one subtraction: a lane keeps its top bit where its end is at most the pixel
// before the start.
inline RunEnd FindPixelWithinEight(const unsigned char* runs, std::size_t run, std::uint64_t sum,
                                   std::uint64_t start) {
    constexpr std::uint64_t kLanes = 0x0001000100010001ull;
    constexpr std::uint64_t kTops = kLanes << 15;
    const auto lanesOfFour = [](std::uint64_t four) {
        four = (four | four << 16) & 0x0000FFFF0000FFFFull;
        return (four | four << 8) & 0x00FF00FF00FF00FFull;
    };
    const std::uint64_t word = detail::LoadLowFirst(runs + run);
    const std::uint64_t low = lanesOfFour(word & 0xFFFFFFFFu) * kLanes;
    const std::uint64_t high = lanesOfFour(word >> 32) * kLanes + (low >> 48) * kLanes;
    const std::uint64_t lastBefore = (start - 1 - sum) * kLanes | kTops;
    const auto endingBefore = [lastBefore](std::uint64_t ends) {
        return static_cast<unsigned int>((((lastBefore - ends) & kTops) >> 15) * kLanes >> 48);
    };
    const unsigned int before = endingBefore(low) + endingBefore(high);
    const std::uint64_t ends = before < 4 ? low : high;
    return {run + before + 1, sum + (ends >> (before % 4 * 16) & 0xFFFF)};
}

// The run that holds pixel `start` (> 0): the first whose end reaches it. The walk starts at
// the last checkpoint that ends before the start, where the sum is what the walk from the
// first run would have there.
inline RunEnd FindPixel(const RowRuns& row, std::uint64_t start) {
    const unsigned char* runs = row.runs;
    const std::size_t runCount = row.size;
    std::size_t run = 0;
    std::uint64_t sum = 0;
    if (row.totalCount != 0) {
        const detail::Checkpoint near = detail::LastCheckpointWithin(
            row.totals, row.totalCount, detail::kStreamBytesPerCheckpoint, start - 1);
        run = near.run;
        sum = near.total;
    }
    // Eight runs at once while they all end before the start; once they do not, the
    // start lies within them.
    for (; runCount - run >= 8; run += 8) {
        const std::uint64_t eight = detail::SumOfEightBytes(runs + run);
        if (sum + eight >= start) {
            return FindPixelWithinEight(runs, run, sum, start);
        }
        sum += eight;
    }
    while (sum < start && run < runCount) {
        sum += runs[run++];
    }
    if (sum < start) {
        ThrowStartNotFound();
    }
    return {run, sum};
}

/// The runs a decode read: from the one that holds its first pixel to the one after its last.
struct RunsRead {
    std::size_t first;
    std::size_t end;
};

// Writes pixels start to start + count - 1 of a row, one byte (0 or 1) each. Calls stay
// inside this file, so that they are direct.
inline RunsRead DecodeRuns(const RowRuns& row, std::uint64_t start, std::uint64_t count,
                           unsigned char* out) {
    const unsigned char* runs = row.runs;
    const std::size_t runCount = row.size;
    std::size_t run = 0;
    std::uint64_t length = 0;  // pixels of the current value from `out` on
    bool value = false;
    if (start != 0) {
        const RunEnd found = FindPixel(row, start);
        run = found.next;
        length = found.end - start;  // the rest of the run that holds the start
        value = detail::RunValue(run - 1);
    } else if (runCount != 0) {
        length = runs[run++];
    }
    const std::size_t first = run == 0 ? 0 : run - 1;
    std::uint64_t left = count;
    // A short stretch is first filled whole with the value at its start, in one fill whose
    // length repeats from row to row, so that its branches are foreseen; then only the runs
    // of the other value are written, where each run would otherwise be a fill of a length
    // the processor cannot foresee.
    const bool prefilled = count <= kPrefilledBytes;
    if (prefilled) {
        detail::FillBytes(out, value, static_cast<std::size_t>(count));
    }
    const bool filledWith = value;
    const auto fill = [&](bool with, std::uint64_t bytes) {
        if (!prefilled || with != filledWith) {
            detail::FillBytes(out, with, static_cast<std::size_t>(bytes));
        }
    };
    for (;;) {
        // A 0 run after a run of 255 continues the value.
        while (length < left && run + 1 < runCount && runs[run] == 0) {
            length += runs[run + 1];
            run += 2;
        }
        if (length >= left) {
            fill(value, left);
            return {first, run};
        }
        fill(value, length);
        out += length;
        left -= length;
        if (run >= runCount) {
            fill(false, left);  // past the runs: clear
            return {first, run};
        }
        value = detail::RunValue(run);
        length = runs[run++];
    }
}

// Appends the runs of `count` mask bytes (zero clear, anything else set).
void AppendRowRuns(const unsigned char* data, std::size_t count, detail::ByteSink& sink) {
    detail::AppendAlternatingRuns(
        count,
        [&](std::uint64_t position, bool set) {
            const auto begin = static_cast<std::size_t>(position);
            return set ? detail::FindZeroByte(data, begin, count)
                       : detail::FindByteChange(data, begin, count, 0);
        },
        sink);
}

// Throws unless the buffer holds the width bytes read from the first byte of each row's
// first visible pixel: a raster without a buffer, without channels or with samples of 0
// bits (every row starts at the first byte) cannot give a row of width mask bytes.
void CheckRowsReadable(const Raster& raster) {
    if (raster.width == 0 || raster.height == 0) {
        return;
    }
    const std::uint64_t lastRow = detail::PixelByte(
        raster, raster.xMargin, std::uint64_t{raster.yMargin} + raster.height - 1);
    if (detail::SaturatingSum(lastRow, raster.width) > detail::BufferBytes(raster)) {
        throw kora::DataException(
            "The raster buffer does not hold one byte per pixel of every row to compress",
            kSourcePath,
            "__cdecl kora::kubo::LineRLECompressedBitMask::LineRLECompressedBitMask(class "
            "kora::kubo::Raster &)",
            0);
    }
}

}  // namespace

/// Where each row's runs are (null while the row is empty), how many there are, and
/// checkpoints into the long rows, so that a window far to the right starts its walk near its
/// first pixel.
struct LineRLECompressedBitMask::RowTable {
    struct Row {
        const unsigned char* runs = nullptr;
        std::size_t size = 0;
        std::size_t firstTotal = 0;  ///< where the row's checkpoint totals start in `totals`
    };

    explicit RowTable(unsigned int height) : rows(height), owned(height) {}

    /// The runs of `row`: none for a row not stored yet or past the last.
    RowRuns Runs(unsigned long row) const {
        if (row >= rows.size()) {
            return {};
        }
        const Row& stored = rows[row];
        return {stored.runs, stored.size, totals.data() + stored.firstTotal,
                CheckpointCount(stored.size)};
    }

    /// Makes `row` the `size` runs at `runs`, with checkpoints when it is long enough. The
    /// totals of a row replaced later stay behind, unused.
    void Store(std::size_t row, const unsigned char* runs, std::size_t size) {
        rows[row] = {runs, size, totals.size()};
        if (CheckpointCount(size) != 0) {
            detail::AppendCheckpointTotals(runs, size, 1, detail::kStreamBytesPerCheckpoint,
                                           totals);
        }
    }

    std::vector<Row> rows;
    /// The rows compressed from a raster, back to back, so that rows decoded one after
    /// the other share cache lines; a row replaced later just stops pointing here.
    detail::EncodedBytes block;
    /// Rows stored by CompressRow, each in a buffer of its own.
    std::vector<std::unique_ptr<unsigned char[]>> owned;
    /// The checkpoint totals of the long rows, back to back.
    std::vector<std::uint64_t> totals;
};

LineRLECompressedBitMask::LineRLECompressedBitMask(unsigned int maskWidth, unsigned int maskHeight)
    : m_rows(std::make_shared<RowTable>(maskHeight)),
      m_info(maskWidth, maskHeight, 1, DataType::Type1U) {}

LineRLECompressedBitMask::LineRLECompressedBitMask(Raster& raster)
    : LineRLECompressedBitMask(raster.width, raster.height) {
    CheckRowsReadable(raster);
    detail::ByteSink sink(std::size_t{raster.height} * 16 + 16);  // grows for busy masks
    std::vector<std::size_t> ends(raster.height);
    for (unsigned int row = 0; row < raster.height; ++row) {
        // An empty row reads nothing, so it needs no address (and a null buffer gets none).
        const unsigned char* data =
            GetRowSize() == 0
                ? raster.data
                : raster.data + detail::PixelByte(raster, raster.xMargin,
                                                  std::uint64_t{raster.yMargin} + row);
        AppendRowRuns(data, GetRowSize(), sink);
        ends[row] = sink.Size();
    }
    // The block has its final address only now.
    RowTable& table = *m_rows;
    table.block = sink.Release();
    std::size_t begin = 0;
    for (unsigned int row = 0; row < raster.height; ++row) {
        table.Store(row, table.block.get() + begin, ends[row] - begin);
        begin = ends[row];
    }
}

LineRLECompressedBitMask::LineRLECompressedBitMask(const LineRLECompressedBitMask& other) = default;
LineRLECompressedBitMask& LineRLECompressedBitMask::operator=(
    const LineRLECompressedBitMask& other) = default;
// Moving copies: the source stays usable, and the shared data is not duplicated.
LineRLECompressedBitMask::LineRLECompressedBitMask(LineRLECompressedBitMask&& other) noexcept
    // NOLINTNEXTLINE(performance-move-constructor-init)
    : LineRLECompressedBitMask(static_cast<const LineRLECompressedBitMask&>(other)) {}
LineRLECompressedBitMask& LineRLECompressedBitMask::operator=(
    LineRLECompressedBitMask&& other) noexcept {
    return *this = static_cast<const LineRLECompressedBitMask&>(other);
}
LineRLECompressedBitMask::~LineRLECompressedBitMask() = default;

std::uint64_t LineRLECompressedBitMask::GetBytesPerPixel() const {
    return (m_info.dataType.bits + 7u) / 8u;
}

std::uint64_t LineRLECompressedBitMask::GetRowSize() const {
    return GetBytesPerPixel() * m_info.channels * m_info.width;
}

std::uint64_t LineRLECompressedBitMask::GetBufferSize() const {
    return GetRowSize() * m_info.height;
}

const unsigned char* LineRLECompressedBitMask::GetCompressedRow(unsigned long row) const {
    return m_rows->Runs(row).runs;
}

unsigned int LineRLECompressedBitMask::GetCompressedRowSize(unsigned long row) const {
    return detail::Count32(m_rows->Runs(row).size, "A compressed row size", kSourcePath,
                           "unsigned int __cdecl kora::kubo::LineRLECompressedBitMask::"
                           "GetCompressedRowSize(unsigned long) const");
}

std::unique_ptr<unsigned char[]> LineRLECompressedBitMask::Compress(unsigned char* data,
                                                                    std::uint64_t count,
                                                                    std::uint64_t& size) {
    detail::ByteSink sink(count + 1);  // the most a row can take
    AppendRowRuns(data, count, sink);
    size = static_cast<std::uint64_t>(sink.Size());
    std::unique_ptr<unsigned char[]> runs(new unsigned char[size]);
    std::memcpy(runs.get(), sink.Data(), size);
    return runs;
}

void LineRLECompressedBitMask::CompressRow(unsigned char* data, unsigned long row) {
    if (row >= m_info.height) {
        return;
    }
    if (data == nullptr && GetRowSize() != 0) {
        throw kora::DataException("pBuffer is NULL, cannot compress NULL buffer", kSourcePath,
                                  "void __cdecl kora::kubo::LineRLECompressedBitMask::CompressRow("
                                  "unsigned char *,unsigned long)",
                                  0);
    }
    std::uint64_t size = 0;
    std::unique_ptr<unsigned char[]> runs = Compress(data, GetRowSize(), size);
    m_rows->Store(row, runs.get(), static_cast<std::size_t>(size));
    m_rows->owned[row] = std::move(runs);  // releases the buffer the row had, if any
}

unsigned char* LineRLECompressedBitMask::DecodeRow(unsigned long row) const {
    return detail::NewDecoded(GetRowSize(), [&](unsigned char* out) { DecodeRow(row, out); });
}

void LineRLECompressedBitMask::DecodeRow(unsigned long row, unsigned char* out) const {
    if (out == nullptr && GetRowSize() != 0) {
        throw kora::DataException(kNullOutput, kSourcePath,
                                  "void __cdecl kora::kubo::LineRLECompressedBitMask::DecodeRow("
                                  "unsigned long,unsigned char *) const",
                                  0);
    }
    DecodePartialRow(row, 0, GetRowSize(), out);
}

void LineRLECompressedBitMask::DecodePartialRow(unsigned long row, std::uint64_t start,
                                                std::uint64_t count, unsigned char* out) const {
    DecodeRuns(m_rows->Runs(row), start, count, out);
}

unsigned char* LineRLECompressedBitMask::Decode() const {
    return detail::NewDecoded(GetBufferSize(), [this](unsigned char* out) { Decode(out); });
}

unsigned char* LineRLECompressedBitMask::Decode(int x, int y, int w, int h) const {
    const auto size = GetBufferSize();
    return detail::NewDecoded(size,
                              [&](unsigned char* out) { DecodeWindow(x, y, w, h, out, size); });
}

void LineRLECompressedBitMask::Decode(unsigned char* out) const {
    if (out == nullptr) {
        throw kora::DataException(
            kNullOutput, kSourcePath,
            "void __cdecl kora::kubo::LineRLECompressedBitMask::Decode(unsigned char *) const",
            177);
    }
    const unsigned long rowSize = GetRowSize();
    for (unsigned int row = 0; row < m_info.height; ++row) {
        DecodeRuns(m_rows->Runs(row), 0, m_info.width, out + row * rowSize);
    }
}

void LineRLECompressedBitMask::Decode(int x, int y, int w, int h, unsigned char* out) const {
    if (out == nullptr) {
        throw kora::DataException(kNullOutput, kSourcePath,
                                  "void __cdecl kora::kubo::LineRLECompressedBitMask::Decode(int,"
                                  "int,int,int,unsigned char *) const",
                                  210);
    }
    DecodeWindow(x, y, w, h, out, ULONG_MAX);
}

void LineRLECompressedBitMask::DecodeWindow(int x, int y, int w, int h, unsigned char* out,
                                            std::uint64_t capacity) const {
    const std::uint64_t count = w > 0 ? static_cast<std::uint64_t>(w) : 0;
    if (count == 0 && x == 0) {
        return;  // nothing to write and no start to look for, however many rows
    }
    // A negative x wraps to a start past every row, a negative row to an index past the
    // last one; the sum is 64-bit so that it cannot wrap.
    const std::uint64_t spacing = count * GetBytesPerPixel();
    const RowTable& table = *m_rows;
    // The rows of a window lie apart in memory, each in lines no row before it touched; in
    // rows long enough to keep checkpoints, the next row's window usually starts at about
    // the same run as this row's and reads about as many, so those runs and the next row's
    // checkpoints are asked for while this row decodes. Shorter rows are read from their
    // start, whose lines the hardware fetches on its own.
    RunsRead last{0, 0};
    std::uint64_t o = 0;
    for (long long row = y; row < static_cast<long long>(y) + h && o < capacity;
         ++row, o += spacing) {
        const RowRuns next = table.Runs(static_cast<std::uint64_t>(row) + 1);
        if (next.totalCount != 0 && last.first < next.size) {
            detail::PrefetchForReading(
                next.runs + last.first,
                std::min({last.end - last.first + 1, next.size - last.first, kPrefetchBytes}));
            detail::PrefetchForReading(
                next.totals, std::min(next.totalCount * sizeof *next.totals, kPrefetchBytes));
        }
        last = DecodeRuns(table.Runs(static_cast<std::uint64_t>(row)),
                          static_cast<std::uint64_t>(x), std::min(count, capacity - o), out + o);
    }
}

}  // namespace kora::kubo
