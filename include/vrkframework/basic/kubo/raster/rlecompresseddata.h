// A raster's bytes compressed as (count, value) pairs, decodable whole or by window.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_RLECOMPRESSEDDATA_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_RLECOMPRESSEDDATA_H

#include <cstddef>  // std::size_t
#include <memory>   // std::shared_ptr

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/raster/datatype.h"
#include "vrkframework/basic/kubo/raster/icompresseddata.h"
#include "vrkframework/basic/kubo/raster/rastercontext.h"
#include "vrkframework/basic/kubo/raster/rasterinfo.h"

namespace kora::kubo {
namespace detail {
class RunCheckpoints;
}

/// The raw bytes of a raster, margins included, as one stream of (count, value) byte
/// pairs: count 1 to 255 copies of value, in buffer order, with no header and no split
/// at rows. A byte that differs from its predecessor starts a new pair, so data without
/// repeats takes twice its size.
///
/// Sizes come from the description as compressed (see GetWidth); one sample takes
/// (bits + 7) / 8 bytes, whatever the complex flag says. The inherited RasterInfo part
/// stays zero, except that copies take it from their source.
///
/// Copies share the compressed bytes (they never change after construction) and an index
/// into them (9 bytes per KiB of pairs, made with them) from which a
/// window starts its walk near its first row; the last holder releases them. Moving copies as well,
/// so the source stays usable.
class KUBO_API RLECompressedData : public ICompressedData {
public:
    /// Compresses (width + 2 x xMargin) x (height + 2 x yMargin) x channels x
    /// ((bits + 7) / 8) bytes of `buffer`; the buffer is not kept. An empty raster gives
    /// an empty stream and reads nothing.
    /// @throws kora::DataException when `buffer` is null.
    RLECompressedData(unsigned char* buffer, RasterInfo& info, RasterContext& context);

    /// @name Copying
    ///@{

    /// Copies share the pairs; the last holder releases them. A copy takes the source's
    /// description. Moving copies, so the source stays usable.
    RLECompressedData(const RLECompressedData& other);
    RLECompressedData& operator=(const RLECompressedData& other);
    RLECompressedData(RLECompressedData&& other) noexcept;
    RLECompressedData& operator=(RLECompressedData&& other) noexcept;
    ///@}

    ~RLECompressedData() override;

    /// Width of the raster as compressed: margins included.
    unsigned int GetWidth() const { return m_info.width; }
    /// Height of the raster as compressed: margins included.
    unsigned int GetHeight() const { return m_info.height; }
    unsigned int GetChansCount() const { return m_info.channels; }   ///< samples per pixel
    const DataType& GetDataType() const { return m_info.dataType; }  ///< type of one sample
    /// The pairs; valid as long as one copy of this object lives.
    const unsigned char* GetCompressedData() const { return m_buffer.get(); }
    /// Bytes of pairs (always even).
    /// @throws kora::OutOfBoundsException when the count exceeds 32 bits.
    unsigned int GetCompressedSize() const;

    /// A new buffer of width x height x channels x bytes-per-sample bytes holding the
    /// whole raster.
    unsigned char* Decode() const override;
    /// A new buffer of the whole raster's size holding the window decoded as by
    /// Decode(x, y, w, h, out); writing stops at the end of the buffer.
    unsigned char* Decode(int x, int y, int w, int h) const override;
    /// Decodes `h` rows of `w` bytes each, starting at pixel column `x` of row `y`, into
    /// `out` (w x h bytes, rows packed). Each row seeks on a running total that grows by
    /// the count of every pair entered, not of the pair left, so rows after the first
    /// can come out shifted against a plain slice of the raster: that is the defined
    /// output. The window is not checked: past the end of the pairs the stream reads as
    /// empty pairs of value 0, and nothing outside the pairs is read.
    /// @throws kora::DataException when `out` is null.
    void Decode(int x, int y, int w, int h, unsigned char* out) const override;
    /// Expands every pair into `out`, which holds the whole raster.
    /// @throws kora::DataException when `out` is null.
    void Decode(unsigned char* out) const override;

private:
    std::size_t GetRasterSize() const;
    void DecodeWindow(int x, int y, int w, int h, unsigned char* out, std::size_t capacity) const;

    std::shared_ptr<unsigned char> m_buffer;
    RasterInfo m_info;
    std::size_t m_size;
    std::shared_ptr<const detail::RunCheckpoints> m_checkpoints;  ///< made with the stream
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_RLECOMPRESSEDDATA_H
