// kubo-gdal-pipeline <file> <low> <high>: the scale-out example's mask and convert work on one
// thread, by bands of the file's block rows, timing GDAL's reads and the library's work
// apart. Per band: the validity mask from the file's no-data value, and the heights
// stretched to 8 bits (no data 0, low..high onto 1..255) through a LUT and the 64R to 8U
// converter.
#include <gdal.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <vector>

#include "gdalrasterreader.h"

using namespace kora::kubo;
using Clock = std::chrono::steady_clock;

namespace {

double Seconds(Clock::time_point since) {
    return std::chrono::duration<double>(Clock::now() - since).count();
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 4) {
        std::fprintf(stderr, "usage: %s <file> <low> <high>\n", argv[0]);
        return 2;
    }
    // Each block is read once: a small block cache (GDAL keeps 5 % of the memory by default)
    // saves filling it with blocks never read again, which took three times the reads here.
    GDALSetCacheMax64(64 << 20);
    const GdalRasterReader reader(argv[1]);
    const double noData = reader.GetNoData().value_or(0.0);
    const LUT stretch({{noData, 0.0}, {std::atof(argv[2]), 1.0}, {std::atof(argv[3]), 255.0}});
    const MaskDecisionBuilder builder(noData, BkgdAllChans);
    const std::unique_ptr<typeconv::IPromote> toBytes(
        PromoteFactory().Create(DataType::Type64R, DataType::Type8U));

    const unsigned int width = reader.GetWidth();
    const unsigned int bandRows = reader.GetBlockSize().second;
    double readTime = 0;
    double workTime = 0;
    unsigned long long checksum = 0;
    std::vector<double> stretched;
    std::vector<unsigned char> bytes;
    for (unsigned int top = 0; top < reader.GetHeight(); top += bandRows) {
        const unsigned int rows = std::min(bandRows, reader.GetHeight() - top);
        const Clock::time_point readStart = Clock::now();
        Raster band(RasterInfo(width, rows, reader.GetChannelCount(), reader.GetDataType()),
                    RasterContext());
        reader.Read(RasterWindow(0, top, width, rows), band);
        readTime += Seconds(readStart);

        const Clock::time_point workStart = Clock::now();
        const std::unique_ptr<Mask> mask(builder.BuildMask(band));
        const std::size_t count = static_cast<std::size_t>(width) * rows;
        stretched.resize(count);
        bytes.resize(count);
        const auto* heights = reinterpret_cast<const unsigned short*>(band.data);
        for (std::size_t i = 0; i < count; ++i) {
            stretched[i] = stretch.GetValue(heights[i]);
        }
        toBytes->Promote(stretched.data(), bytes.data(), static_cast<unsigned int>(count));
        checksum += bytes[count / 2] + (mask->GetBit(0) ? 1u : 0u);  // the work is used
        workTime += Seconds(workStart);
    }
    const double pixels = static_cast<double>(width) * reader.GetHeight();
    std::printf("read %.2f s, mask + convert %.2f s, together %.1f Mpixel/s (%llu)\n", readTime,
                workTime, pixels / (readTime + workTime) / 1e6, checksum);
    return 0;
}
