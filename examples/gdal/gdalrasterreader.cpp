// GdalRasterReader: GDAL's C interface behind the library's IRasterReader.
#include "gdalrasterreader.h"

#include <cpl_error.h>
#include <gdal.h>

#include <cstdint>
#include <stdexcept>

namespace {

using kora::kubo::DataType;

// GDAL's sample type of each library type GDAL also has (it has one for every predefined
// type but 1U and 8S).
DataType LibraryType(GDALDataType type) {
    switch (type) {
        case GDT_Byte:
            return DataType::Type8U;
        case GDT_UInt16:
            return DataType::Type16U;
        case GDT_Int16:
            return DataType::Type16S;
        case GDT_UInt32:
            return DataType::Type32U;
        case GDT_Int32:
            return DataType::Type32S;
        case GDT_UInt64:
            return DataType::Type64U;
        case GDT_Int64:
            return DataType::Type64S;
        case GDT_Float32:
            return DataType::Type32R;
        case GDT_Float64:
            return DataType::Type64R;
        case GDT_CInt16:
            return DataType::TypeC16S;
        case GDT_CInt32:
            return DataType::TypeC32S;
        case GDT_CFloat32:
            return DataType::TypeC32R;
        case GDT_CFloat64:
            return DataType::TypeC64R;
        default:
            throw std::runtime_error(std::string("GDAL's sample type ") +
                                     GDALGetDataTypeName(type) + " has no library type");
    }
}

}  // namespace

GdalRasterReader::GdalRasterReader(const std::string& path) {
    GDALAllRegister();
    m_dataset = GDALOpen(path.c_str(), GA_ReadOnly);
    if (m_dataset == nullptr) {
        throw std::runtime_error(path + ": GDAL cannot open it as a raster");
    }
    const int bands = GDALGetRasterCount(m_dataset);
    if (bands == 0) {
        GDALClose(m_dataset);
        throw std::runtime_error(path + ": no raster bands");
    }
    const GDALDataType type = GDALGetRasterDataType(GDALGetRasterBand(m_dataset, 1));
    try {
        for (int band = 2; band <= bands; ++band) {
            if (GDALGetRasterDataType(GDALGetRasterBand(m_dataset, band)) != type) {
                throw std::runtime_error(path + ": bands of different sample types");
            }
        }
        m_type = LibraryType(type);
    } catch (...) {
        GDALClose(m_dataset);
        throw;
    }
    m_gdalType = type;
}

GdalRasterReader::~GdalRasterReader() { GDALClose(m_dataset); }

unsigned int GdalRasterReader::GetWidth() const {
    return static_cast<unsigned int>(GDALGetRasterXSize(m_dataset));
}

unsigned int GdalRasterReader::GetHeight() const {
    return static_cast<unsigned int>(GDALGetRasterYSize(m_dataset));
}

unsigned int GdalRasterReader::GetChannelCount() const {
    return static_cast<unsigned int>(GDALGetRasterCount(m_dataset));
}

const kora::kubo::DataType& GdalRasterReader::GetDataType() const { return m_type; }

std::pair<unsigned int, unsigned int> GdalRasterReader::GetBlockSize() const {
    int columns = 0;
    int rows = 0;
    GDALGetBlockSize(GDALGetRasterBand(m_dataset, 1), &columns, &rows);
    return {static_cast<unsigned int>(columns), static_cast<unsigned int>(rows)};
}

std::optional<double> GdalRasterReader::GetNoData() const {
    int present = 0;
    const double value = GDALGetRasterNoDataValue(GDALGetRasterBand(m_dataset, 1), &present);
    return present ? std::optional<double>(value) : std::nullopt;
}

void GdalRasterReader::Read(const kora::kubo::RasterWindow& window,
                            kora::kubo::Raster& raster) const {
    if (raster.width != window.GetXSize() || raster.height != window.GetYSize() ||
        raster.channels != GetChannelCount() || raster.dataType != m_type) {
        throw std::runtime_error("the raster does not fit the window and the file's samples");
    }
    // GDAL writes each pixel's bands one after another and each line at the raster's stride,
    // straight into the image proper.
    const int bands = static_cast<int>(raster.channels);
    const auto sampleBytes =
        static_cast<GSpacing>(GDALGetDataTypeSizeBytes(static_cast<GDALDataType>(m_gdalType)));
    const GSpacing pixel = sampleBytes * bands;
    const GSpacing line = pixel * raster.lineStride;
    unsigned char* first =
        raster.data +
        static_cast<std::uint64_t>(raster.yMargin) * static_cast<std::uint64_t>(line) +
        static_cast<std::uint64_t>(raster.xMargin * pixel);
    const CPLErr status = GDALDatasetRasterIOEx(
        m_dataset, GF_Read, static_cast<int>(window.GetXOffset()),
        static_cast<int>(window.GetYOffset()), static_cast<int>(window.GetXSize()),
        static_cast<int>(window.GetYSize()), first, static_cast<int>(window.GetXSize()),
        static_cast<int>(window.GetYSize()), static_cast<GDALDataType>(m_gdalType), bands, nullptr,
        pixel, line, sampleBytes, nullptr);
    if (status != CE_None) {
        throw std::runtime_error(std::string("GDAL failed to read: ") + CPLGetLastErrorMsg());
    }
}
