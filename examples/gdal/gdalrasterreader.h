// A raster file read through GDAL, seen by the library as an IRasterReader.
#ifndef KUBO_EXAMPLES_GDAL_GDALRASTERREADER_H
#define KUBO_EXAMPLES_GDAL_GDALRASTERREADER_H

#include <optional>
#include <string>

#include "vrkframework/basic/kubo/kubo.h"

/// Opens a raster file with GDAL and reads windows of it, every band pixel-interleaved, into
/// the library's rasters. One reader is used by one thread at a time (GDAL's handles are not
/// shared between threads); open one per thread to read in parallel.
class GdalRasterReader : public kora::datasources::IRasterReader {
public:
    /// @throws std::runtime_error for a file GDAL cannot open, with no bands, or whose bands
    ///   differ in type or have a type the library lacks.
    explicit GdalRasterReader(const std::string& path);
    ~GdalRasterReader() override;
    GdalRasterReader(const GdalRasterReader&) = delete;
    GdalRasterReader& operator=(const GdalRasterReader&) = delete;
    GdalRasterReader(GdalRasterReader&&) = delete;
    GdalRasterReader& operator=(GdalRasterReader&&) = delete;

    unsigned int GetWidth() const override;
    unsigned int GetHeight() const override;
    unsigned int GetChannelCount() const override;
    const kora::kubo::DataType& GetDataType() const override;

    /// The file's own block (columns, rows): windows made of whole blocks read fastest.
    std::pair<unsigned int, unsigned int> GetBlockSize() const;
    /// The first band's no-data value, when the file gives one.
    std::optional<double> GetNoData() const;
    /// Reads the window into the image proper of `raster`, which must have the window's size,
    /// the reader's channels and sample type; its margins are left alone.
    /// @throws std::runtime_error when GDAL fails to read or the raster does not fit.
    void Read(const kora::kubo::RasterWindow& window, kora::kubo::Raster& raster) const;

private:
    void* m_dataset = nullptr;  // GDALDatasetH
    kora::kubo::DataType m_type;
    int m_gdalType = 0;  // GDALDataType
};

#endif  // KUBO_EXAMPLES_GDAL_GDALRASTERREADER_H
