// A two-valued mask compressed row by row, so that rows can be decoded, replaced or read
// in part on their own.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_LINERLECOMPRESSEDBITMASK_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_LINERLECOMPRESSEDBITMASK_H

#include <memory>  // std::shared_ptr, std::unique_ptr

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/raster/datatype.h"
#include "vrkframework/basic/kubo/raster/icompresseddata.h"
#include "vrkframework/basic/kubo/raster/raster.h"
#include "vrkframework/basic/kubo/raster/rasterinfo.h"

namespace kora::kubo {

/// A mask of one byte per pixel, zero (clear) or not (set), stored as one run stream per
/// row: run lengths of one byte each, alternately clear and set starting with clear, a
/// leading 0 when the row starts set and a 0 after a run of 255 whose value goes on. A
/// row of width 0 is the single run 0. Decoded pixels are exactly 0 or 1.
///
/// The description is the mask's width and height, one channel and the 1-bit type; the
/// inherited RasterInfo part stays zero, except that copies take it from their source.
///
/// Copies share the row table: a row replaced through one copy is seen by all of them,
/// and the last holder releases the rows. Moving copies, so the source stays usable.
/// A row that holds no runs (not stored yet, or an index past the last row) reads as
/// clear pixels; pixels asked for past the end of a row's runs read as clear too.
class KUBO_API LineRLECompressedBitMask : public ICompressedData {
public:
    /// Compresses the visible area of `raster`: row r is read from the address of its
    /// visible pixel (0, r), one byte per pixel.
    /// @throws kora::DataException "The raster buffer does not hold one byte per pixel of
    ///   every row to compress" when the raster has no buffer, or too few bytes to read
    ///   every visible row from; nothing is read then.
    explicit LineRLECompressedBitMask(Raster& raster);
    /// A mask of `width` x `height` whose rows are still empty; fill them with CompressRow.
    LineRLECompressedBitMask(unsigned int width, unsigned int height);

    /// @name Copying
    ///@{

    /// Copies share the row table: a row replaced through one copy is seen by all. The last
    /// holder releases the rows; a copy takes the source's description. Moving copies, so
    /// the source stays usable.
    LineRLECompressedBitMask(const LineRLECompressedBitMask& other);
    LineRLECompressedBitMask& operator=(const LineRLECompressedBitMask& other);
    LineRLECompressedBitMask(LineRLECompressedBitMask&& other) noexcept;
    LineRLECompressedBitMask& operator=(LineRLECompressedBitMask&& other) noexcept;
    ///@}

    ~LineRLECompressedBitMask() override;

    unsigned int GetWidth() const { return m_info.width; }           ///< pixels per row
    unsigned int GetHeight() const { return m_info.height; }         ///< number of rows
    unsigned int GetChansCount() const { return m_info.channels; }   ///< 1
    const DataType& GetDataType() const { return m_info.dataType; }  ///< DataType::Type1U
    /// (bits + 7) / 8 of the 1-bit type: 1.
    std::uint64_t GetBytesPerPixel() const;
    /// Bytes of one decoded row: bytes-per-pixel x channels x width.
    std::uint64_t GetRowSize() const;
    /// Bytes of the decoded mask: bytes-per-pixel x channels x height x width.
    std::uint64_t GetBufferSize() const;
    /// The runs of `row` (null while the row is empty); valid until the row is replaced
    /// and as long as one copy of this object lives.
    const unsigned char* GetCompressedRow(unsigned long row) const;
    /// Number of runs (bytes) of `row`; 0 while the row is empty.
    unsigned int GetCompressedRowSize(unsigned long row) const;

    /// Compresses GetRowSize() bytes of `data` into row `row`, releasing the runs it held.
    /// A row index past the last row stores nothing.
    void CompressRow(unsigned char* data, unsigned long row);
    /// A new buffer of GetRowSize() bytes holding the decoded row; the caller frees it
    /// with `delete[]`.
    unsigned char* DecodeRow(unsigned long row) const;
    /// Decodes the whole row into `out` (GetRowSize() bytes).
    void DecodeRow(unsigned long row, unsigned char* out) const;

    /// A new buffer of GetBufferSize() bytes holding the whole mask.
    unsigned char* Decode() const override;
    /// A new buffer of GetBufferSize() bytes holding the window decoded as by
    /// Decode(x, y, w, h, out); writing stops at the end of the buffer.
    unsigned char* Decode(int x, int y, int w, int h) const override;
    /// Decodes pixels x to x + w - 1 of rows y to y + h - 1 into `out` (w x h bytes, rows
    /// packed). The window is not checked; a negative width writes nothing.
    /// @throws kora::DataException when `out` is null, or when x lies beyond the end of a
    ///   row's runs (a negative x counts as such) ("Uncompressed index not found.").
    void Decode(int x, int y, int w, int h, unsigned char* out) const override;
    /// Decodes every row into `out` (GetBufferSize() bytes).
    /// @throws kora::DataException when `out` is null.
    void Decode(unsigned char* out) const override;

private:
    struct RowTable;

    static std::unique_ptr<unsigned char[]> Compress(unsigned char* data, std::uint64_t count,
                                                     std::uint64_t& size);
    void DecodePartialRow(unsigned long row, std::uint64_t start, std::uint64_t count,
                          unsigned char* out) const;
    void DecodeWindow(int x, int y, int w, int h, unsigned char* out, std::uint64_t capacity) const;

    std::shared_ptr<RowTable> m_rows;
    RasterInfo m_info;
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_LINERLECOMPRESSEDBITMASK_H
