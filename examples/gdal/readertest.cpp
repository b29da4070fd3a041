// Checks GdalRasterReader on a small tiled GeoTIFF that it writes first: description, block
// size, no-data value, a window read into a raster with margins, and the error for a file
// that is not there.
#include <gdal.h>

#include <cstdint>
#include <cstdio>
#include <stdexcept>
#include <string>
#include <vector>

#include "gdalrasterreader.h"

using namespace kora::kubo;

namespace {

constexpr int kWidth = 70;
constexpr int kHeight = 45;
constexpr int kBands = 2;

std::int16_t Sample(int x, int y, int band) {
    return static_cast<std::int16_t>(x * 100 - y + band);
}

void WriteFile(const std::string& path) {
    GDALAllRegister();
    const char* options[] = {"TILED=YES", "BLOCKXSIZE=32", "BLOCKYSIZE=16", "COMPRESS=DEFLATE",
                             nullptr};
    GDALDatasetH dataset = GDALCreate(GDALGetDriverByName("GTiff"), path.c_str(), kWidth, kHeight,
                                      kBands, GDT_Int16, const_cast<char**>(options));
    std::vector<std::int16_t> samples(kWidth * kHeight * kBands);
    for (int y = 0; y < kHeight; ++y) {
        for (int x = 0; x < kWidth; ++x) {
            for (int band = 0; band < kBands; ++band) {
                samples[static_cast<std::size_t>((y * kWidth + x) * kBands + band)] =
                    Sample(x, y, band);
            }
        }
    }
    GDALSetRasterNoDataValue(GDALGetRasterBand(dataset, 1), -9999);
    const CPLErr status = GDALDatasetRasterIOEx(
        dataset, GF_Write, 0, 0, kWidth, kHeight, samples.data(), kWidth, kHeight, GDT_Int16,
        kBands, nullptr, 2 * kBands, 2 * kBands * kWidth, 2, nullptr);
    GDALClose(dataset);
    if (status != CE_None) {
        throw std::runtime_error("could not write " + path);
    }
}

int failures = 0;

void Check(bool condition, const char* what) {
    if (!condition) {
        std::fprintf(stderr, "failed: %s\n", what);
        ++failures;
    }
}

void CheckReader(const std::string& path) {
    const GdalRasterReader reader(path);
    const RasterInfo info(reader);  // the library describes a raster from any reader
    Check(info.width == kWidth && info.height == kHeight && info.channels == kBands,
          "size and bands");
    Check(info.dataType == DataType::Type16S, "sample type");
    Check(reader.GetBlockSize() == std::make_pair(32u, 16u), "block size");
    Check(reader.GetNoData() == -9999.0, "no-data value");

    // A window that crosses block edges, into a raster with margins.
    const RasterWindow window(20, 10, 30, 12);
    Raster raster(RasterInfo(30, 12, kBands, DataType::Type16S), RasterContext(2, 1, 0, 0));
    reader.Read(window, raster);
    bool same = true;
    for (int y = 0; y < 12; ++y) {
        for (int x = 0; x < 30; ++x) {
            const auto* pixel = reinterpret_cast<const std::int16_t*>(raster.data) +
                                ((y + 1) * static_cast<int>(raster.lineStride) + x + 2) * kBands;
            same = same && pixel[0] == Sample(x + 20, y + 10, 0) &&
                   pixel[1] == Sample(x + 20, y + 10, 1);
        }
    }
    Check(same, "window samples");

    try {
        const GdalRasterReader missing(path + ".missing");
        Check(false, "a missing file throws");
    } catch (const std::runtime_error&) {
    }
}

}  // namespace

int main(int argc, char** argv) {
    const std::string path = std::string(argc > 1 ? argv[1] : ".") + "/gdalreader-test.tif";
    WriteFile(path);
    CheckReader(path);
    std::remove(path.c_str());
    GDALDestroyDriverManager();  // leaves nothing for leak checkers to report
    return failures == 0 ? 0 : 1;
}
