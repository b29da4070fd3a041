// A raster's bytes compressed as alternating runs of zero and one bits, decodable whole or
// by window through a seeking read cursor.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_BITWISERLECOMPRESSEDDATA_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_BITWISERLECOMPRESSEDDATA_H

#include <cstddef>  // std::size_t
#include <cstdint>  // std::uint32_t, std::uint64_t
#include <memory>   // std::shared_ptr
#include <vector>

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/raster/datatype.h"
#include "vrkframework/basic/kubo/raster/icompresseddata.h"
#include "vrkframework/basic/kubo/raster/rasterinfo.h"

namespace kora::kubo {
namespace detail {
class RunCheckpoints;

/// Where a bit-run stream's read cursor stands.
struct BitRunCursor {
    std::size_t runIndex;     ///< the current run
    std::uint64_t position;   ///< the next bit to read
    std::uint32_t runLength;  ///< length of the current run
    std::uint32_t consumed;   ///< bits of the current run already read
    bool bitValue;            ///< value of the current run's bits
};
}  // namespace detail

/// The raw bytes of a raster (no margins) read as a bit stream, most significant bit of
/// each byte first, and stored as run lengths of one byte each: run k counts bits of
/// value k mod 2. A run of 0 appears first when the stream starts with a one bit, and
/// after a run of 255 whose bits go on. An empty stream is the single run 0. It suits
/// masks and other data with long stretches of equal bits.
///
/// One sample takes (bits + 7) / 8 bytes, whatever the complex flag says. The inherited
/// RasterInfo part stays zero, except that copies take it from their source.
///
/// Copies share the runs (they never change after construction) and an index into them
/// (9 bytes per KiB of runs, made with them) from which the cursor skips
/// ahead to near the bit it seeks; the last holder releases them. Each object has its own read
/// cursor, which the window decoder moves although it is const, and remembers where the last read
/// of each row stopped (16 KiB, made on the first window decode), so that a window decoded beside
/// the last one starts each row there instead of seeking: one object must not be decoded by
/// window from two threads at once. Moving copies, so the source stays usable.
class KUBO_API BitwiseRLECompressedData : public ICompressedData {
public:
    /// Compresses width x height x channels x ((bits + 7) / 8) bytes of `buffer`; the
    /// buffer is not kept.
    /// @throws kora::DataException when `buffer` is null.
    BitwiseRLECompressedData(unsigned char* buffer, RasterInfo& info);

    /// @name Copying
    ///@{

    /// Copies share the runs; the last holder releases them. A copy takes the source's
    /// description and cursor position, and the two cursors move on apart. Moving copies,
    /// so the source stays usable.
    BitwiseRLECompressedData(const BitwiseRLECompressedData& other);
    BitwiseRLECompressedData& operator=(const BitwiseRLECompressedData& other);
    BitwiseRLECompressedData(BitwiseRLECompressedData&& other) noexcept;
    BitwiseRLECompressedData& operator=(BitwiseRLECompressedData&& other) noexcept;
    ///@}

    ~BitwiseRLECompressedData() override;

    unsigned int GetWidth() const { return m_info.width; }           ///< pixels per line
    unsigned int GetHeight() const { return m_info.height; }         ///< number of lines
    unsigned int GetChansCount() const { return m_info.channels; }   ///< samples per pixel
    const DataType& GetDataType() const { return m_info.dataType; }  ///< type of one sample
    /// The runs; valid as long as one copy of this object lives.
    const unsigned char* GetCompressedData() const { return m_buffer.get(); }
    /// Number of runs (bytes).
    /// @throws kora::OutOfBoundsException when the count exceeds 32 bits.
    unsigned int GetCompressedSize() const;

    /// A new buffer of the whole raster's size holding the whole raster.
    unsigned char* Decode() const override;
    /// A new buffer of the whole raster's size holding the window decoded as by
    /// Decode(x, y, w, h, out); writing stops at the end of the buffer.
    unsigned char* Decode(int x, int y, int w, int h) const override;
    /// For each row r from y to y + h - 1, reads the w bytes from byte x of row r into
    /// `out`, the rows w x bytes-per-sample x channels bytes apart: x and w count bytes
    /// where they are read and pixels where they are checked and placed, which agree for
    /// one channel of one byte. `out` must hold (h - 1) x that spacing + w bytes. The
    /// cursor stays where the last row ended, so a later window seeks on from there.
    /// @throws kora::OutOfBoundsException {x, y, w, w} unless y < height, y + h <=
    ///   height, x < width and x + w <= width (checked first; negative x or y pass).
    /// @throws kora::DataException when `out` is null, or when a row starts past the
    ///   start of the last run ("Uncompressed index not found."): the cursor seeks run by
    ///   run and cannot step back once it has jumped past the last one.
    void Decode(int x, int y, int w, int h, unsigned char* out) const override;
    /// Expands every run into `out`, which holds the whole raster; the cursor is not used.
    /// @throws kora::DataException when `out` is null.
    void Decode(unsigned char* out) const override;

private:
    void Compress(unsigned char* buffer, std::uint64_t bitCount);
    std::uint64_t GetLineSize() const;
    std::uint64_t GetBufferSizeBytes() const;
    void DecodeWindow(int x, int y, int w, int h, unsigned char* out, std::size_t capacity) const;

    std::shared_ptr<unsigned char> m_buffer;
    std::size_t m_size;
    RasterInfo m_info;
    std::shared_ptr<const detail::RunCheckpoints> m_checkpoints;  ///< made with the stream
    mutable detail::BitRunCursor m_cursor;
    /// Where the last read of each row (up to 512 rows, by row modulo 512) stopped, made on
    /// the first window decode: a window that starts there takes up that cursor instead of
    /// seeking.
    mutable std::vector<detail::BitRunCursor> m_rowEnds;
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_BITWISERLECOMPRESSEDDATA_H
