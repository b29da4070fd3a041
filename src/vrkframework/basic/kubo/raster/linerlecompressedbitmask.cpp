// Row-by-row run compression of a two-valued mask, and its row, partial-row, whole and
// window decoders.
#include "vrkframework/basic/kubo/raster/linerlecompressedbitmask.h"

#include <algorithm>  // std::min
#include <climits>    // ULONG_MAX
#include <cstdint>    // std::uint64_t
#include <cstring>    // std::memcpy
#include <utility>    // std::move, std::pair
#include <vector>

#include "vrkframework/basic/kubo/raster/alternatingruns.h"
#include "vrkframework/basic/kubo/raster/bytesink.h"
#include "vrkframework/basic/kubo/raster/decodedbytes.h"
#include "vrkframework/basic/kubo/raster/wordscan.h"
#include "vrkframework/platform/exception.h"

namespace kora::kubo {
namespace {

constexpr char kSourcePath[] = "vrkframework/basic/kubo/raster/linerlecompressedbitmask";
constexpr char kNullOutput[] = "pBuffer is NULL, cannot Decode in NULL buffer";

// Writes pixels start to start + count - 1 of a row, one byte (0 or 1) each. Calls stay
// inside this file, so that they are direct.
void DecodeRuns(const unsigned char* runs, std::size_t runCount, unsigned long start,
                unsigned long count, unsigned char* out) {
    std::size_t run = 0;
    unsigned long written = 0;
    if (start != 0) {
        std::uint64_t sum = 0;
        // Eight runs at once while they all end before the start.
        while (runCount - run >= 8 && sum + detail::SumOfEightBytes(runs + run) < start) {
            sum += detail::SumOfEightBytes(runs + run);
            run += 8;
        }
        // The start lies within the next eight runs, or past the row.
        while (sum < start && runCount - run >= 4) {
            std::uint64_t added = 0;
            run += detail::AddBytesUntil(runs + run, start - sum, added);
            sum += added;
        }
        while (sum < start && run < runCount) {
            sum += runs[run++];
        }
        if (sum < start) {
            throw kora::DataException(
                "Uncompressed index not found.", kSourcePath,
                "void __cdecl kora::kubo::LineRLECompressedBitMask::DecodePartialRow(unsigned "
                "long,unsigned long,unsigned long,unsigned char *) const",
                327);
        }
        // Pixel `start` lies in the last run added; the rest of that run comes first.
        written = static_cast<unsigned long>(std::min<std::uint64_t>(sum - start, count));
        detail::FillBytes(out, detail::RunValue(run - 1), written);
    }
    while (written < count && run < runCount) {
        const bool value = detail::RunValue(run);
        const auto length = static_cast<unsigned long>(std::min<std::uint64_t>(
            detail::NextStretch(runs, runCount, run, count - written), count - written));
        detail::FillBytes(out + written, value, length);
        written += length;
    }
    detail::FillBytes(out + written, 0, count - written);  // past the runs: clear
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

}  // namespace

/// Where each row's runs are (null while the row is empty) and how many there are.
struct LineRLECompressedBitMask::RowTable {
    explicit RowTable(unsigned int height)
        : starts(height, nullptr), sizes(height, 0u), owned(height) {}

    /// The runs of `row` and their number: none for a row not stored yet or past the last.
    std::pair<const unsigned char*, std::size_t> Runs(unsigned long row) const {
        if (row >= starts.size()) {
            return {nullptr, 0};
        }
        return {starts[row], sizes[row]};
    }

    std::vector<const unsigned char*> starts;
    std::vector<unsigned int> sizes;
    /// The rows compressed from a raster, back to back, so that rows decoded one after
    /// the other share cache lines; a row replaced later just stops pointing here.
    detail::EncodedBytes block;
    /// Rows stored by CompressRow, each in a buffer of its own.
    std::vector<std::unique_ptr<unsigned char[]>> owned;
};

LineRLECompressedBitMask::LineRLECompressedBitMask(unsigned int maskWidth, unsigned int maskHeight)
    : m_rows(std::make_shared<RowTable>(maskHeight)),
      m_info(maskWidth, maskHeight, 1, DataType::Type1U) {}

LineRLECompressedBitMask::LineRLECompressedBitMask(Raster& raster)
    : LineRLECompressedBitMask(raster.width, raster.height) {
    // Rasters place a pixel at its bit offset divided by 8.
    const std::uint64_t pixelBits = std::uint64_t{raster.channels} * raster.dataType.bits *
                                    (raster.dataType.isComplex ? 2u : 1u);
    detail::ByteSink sink(std::size_t{raster.height} * 16 + 16);  // grows for busy masks
    std::vector<std::size_t> ends(raster.height);
    for (unsigned int row = 0; row < raster.height; ++row) {
        const std::uint64_t pixel =
            (std::uint64_t{raster.yMargin} + row) * raster.lineStride + raster.xMargin;
        AppendRowRuns(raster.data + pixel * pixelBits / 8, GetRowSize(), sink);
        ends[row] = sink.Size();
    }
    // The block has its final address only now.
    RowTable& table = *m_rows;
    table.block = sink.Release();
    std::size_t begin = 0;
    for (unsigned int row = 0; row < raster.height; ++row) {
        table.starts[row] = table.block.get() + begin;
        table.sizes[row] = static_cast<unsigned int>(ends[row] - begin);
        begin = ends[row];
    }
}

LineRLECompressedBitMask::LineRLECompressedBitMask(const LineRLECompressedBitMask& other) = default;
LineRLECompressedBitMask& LineRLECompressedBitMask::operator=(
    const LineRLECompressedBitMask& other) = default;
LineRLECompressedBitMask::LineRLECompressedBitMask(LineRLECompressedBitMask&& other) noexcept
    : LineRLECompressedBitMask(static_cast<const LineRLECompressedBitMask&>(other)) {}
LineRLECompressedBitMask& LineRLECompressedBitMask::operator=(
    LineRLECompressedBitMask&& other) noexcept {
    return *this = static_cast<const LineRLECompressedBitMask&>(other);
}
LineRLECompressedBitMask::~LineRLECompressedBitMask() = default;

unsigned long LineRLECompressedBitMask::GetBytesPerPixel() const {
    return (m_info.dataType.bits + 7u) / 8u;
}

unsigned long LineRLECompressedBitMask::GetRowSize() const {
    return GetBytesPerPixel() * m_info.channels * m_info.width;
}

unsigned long LineRLECompressedBitMask::GetBufferSize() const {
    return GetRowSize() * m_info.height;
}

const unsigned char* LineRLECompressedBitMask::GetCompressedRow(unsigned long row) const {
    return m_rows->Runs(row).first;
}

unsigned int LineRLECompressedBitMask::GetCompressedRowSize(unsigned long row) const {
    return static_cast<unsigned int>(m_rows->Runs(row).second);
}

std::unique_ptr<unsigned char[]> LineRLECompressedBitMask::Compress(unsigned char* data,
                                                                    unsigned long count,
                                                                    unsigned long& size) {
    detail::ByteSink sink(count + 1);  // the most a row can take
    AppendRowRuns(data, count, sink);
    size = static_cast<unsigned long>(sink.Size());
    std::unique_ptr<unsigned char[]> runs(new unsigned char[size]);
    std::memcpy(runs.get(), sink.Data(), size);
    return runs;
}

void LineRLECompressedBitMask::CompressRow(unsigned char* data, unsigned long row) {
    if (row >= m_info.height) {
        return;
    }
    unsigned long size = 0;
    std::unique_ptr<unsigned char[]> runs = Compress(data, GetRowSize(), size);
    m_rows->starts[row] = runs.get();
    m_rows->sizes[row] = static_cast<unsigned int>(size);
    m_rows->owned[row] = std::move(runs);  // releases the buffer the row had, if any
}

unsigned char* LineRLECompressedBitMask::DecodeRow(unsigned long row) const {
    return detail::NewDecoded(GetRowSize(), [&](unsigned char* out) { DecodeRow(row, out); });
}

void LineRLECompressedBitMask::DecodeRow(unsigned long row, unsigned char* out) const {
    DecodePartialRow(row, 0, GetRowSize(), out);
}

void LineRLECompressedBitMask::DecodePartialRow(unsigned long row, unsigned long start,
                                                unsigned long count, unsigned char* out) const {
    const auto runs = m_rows->Runs(row);
    DecodeRuns(runs.first, runs.second, start, count, out);
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
        const auto runs = m_rows->Runs(row);
        DecodeRuns(runs.first, runs.second, 0, m_info.width, out + row * rowSize);
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
                                            unsigned long capacity) const {
    const unsigned long count = w > 0 ? static_cast<unsigned long>(w) : 0;
    if (count == 0 && x == 0) {
        return;  // nothing to write and no start to look for, however many rows
    }
    // A negative x wraps to a start past every row, a negative row to an index past the
    // last one; the sum is 64-bit so that it cannot wrap.
    const unsigned long spacing = count * GetBytesPerPixel();
    unsigned long o = 0;
    for (long long row = y; row < static_cast<long long>(y) + h && o < capacity;
         ++row, o += spacing) {
        const auto runs = m_rows->Runs(static_cast<unsigned long>(row));
        DecodeRuns(runs.first, runs.second, static_cast<unsigned long>(x),
                   std::min(count, capacity - o), out + o);
    }
}

}  // namespace kora::kubo
