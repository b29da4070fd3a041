// kubo-demo: the library's typical flows on a synthetic scene, with a one-line report per
// step and the pictures it made written as PGM/PPM files.
//
//   kubo-demo [size] [output-folder]      defaults: 2048 demo-out
#include <vrkframework/basic/kubo/kubo.h>

#include <algorithm>
#include <array>
#include <bitset>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include "imagefile.h"
#include "report.h"
#include "scene.h"

namespace {

using kora::kubo::DataType;
using kora::kubo::Raster;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;

constexpr std::uint32_t kSeed = 20261121;

struct Options {
    unsigned int size = 2048;
    std::filesystem::path output = "demo-out";
};

std::size_t PixelCount(const Raster& raster) { return std::size_t{raster.width} * raster.height; }

std::uint16_t* Samples16(Raster& raster) { return reinterpret_cast<std::uint16_t*>(raster.data); }

// The scene's heights arrive as a 12-bit packed stream, as sensors deliver them, and are
// unpacked to 16U samples through the converter the factory picks for the descriptors.
Raster UnpackTerrain(const demo::Terrain& terrain) {
    const DataType packed12(12, false, false, 12, 0, false);
    const auto count = static_cast<unsigned int>(terrain.heights.size());
    const kora::kubo::PromoteFactory factory;

    std::vector<unsigned char> stream((std::size_t{count} * 12 + 7) / 8);
    std::unique_ptr<typeconv::IPromote> pack(factory.Create(DataType::Type16U, packed12));
    pack->Promote(terrain.heights.data(), stream.data(), count);

    Raster image(RasterInfo(terrain.width, terrain.height, 1, DataType::Type16U), RasterContext());
    std::memset(image.data, 0, image.byteSize);  // time the conversion, not first page touches
    std::unique_ptr<typeconv::IPromote> unpack(factory.Create(packed12, DataType::Type16U));
    const demo::Stopwatch clock;
    unpack->Promote(stream.data(), image.data, count);
    const double seconds = clock.Seconds();

    const bool exact = std::memcmp(image.data, terrain.heights.data(), image.byteSize) == 0;
    demo::Line(
        "unpack 12-bit", "%ux%u: %.1f MiB packed -> %.1f MiB 16U, %.0f MB/s, round trip %s",
        terrain.width, terrain.height, demo::Mebibytes(static_cast<double>(stream.size())),
        demo::Mebibytes(static_cast<double>(image.byteSize)),
        demo::MegabytesPerSecond(static_cast<double>(stream.size() + image.byteSize), seconds),
        exact ? "exact" : "DIFFERS");
    return image;
}

// One bit per pixel, 1 where the height is not the no-data value.
std::unique_ptr<kora::kubo::Mask> BuildValidityMask(const Raster& image) {
    const kora::kubo::MaskDecisionBuilder builder(image, demo::kNoData);
    const demo::Stopwatch clock;
    std::unique_ptr<kora::kubo::Mask> mask(builder.BuildMask(image));
    const double seconds = clock.Seconds();

    std::size_t valid = 0;
    for (unsigned int i = 0; i < mask->GetByteCount(); ++i) {
        valid += std::bitset<8>(mask->GetBits()[i]).count();
    }
    demo::Line("mask", "no-data %u: %.1f%% valid, %u mask bytes, %.0f Mpixel/s", demo::kNoData,
               100.0 * static_cast<double>(valid) / static_cast<double>(mask->GetBitCount()),
               mask->GetByteCount(), static_cast<double>(mask->GetBitCount()) / seconds / 1e6);
    return mask;
}

// The mask held in the two compressed forms made for masks, then a window decoded back.
void CompressMask(const kora::kubo::Mask& mask, unsigned int width, unsigned int height) {
    Raster flags(RasterInfo(width, height, 1, DataType::Type8U), RasterContext());
    for (unsigned int i = 0; i < mask.GetBitCount(); ++i) {
        flags.data[i] = mask.GetBit(i) ? 1 : 0;
    }

    const demo::Stopwatch lineClock;
    const kora::kubo::LineRLECompressedBitMask lines(flags);
    const double lineSeconds = lineClock.Seconds();
    std::size_t lineBytes = 0;
    for (unsigned long row = 0; row < height; ++row) {
        lineBytes += lines.GetCompressedRowSize(row);
    }

    std::vector<unsigned char> packedBits(mask.GetBits(), mask.GetBits() + mask.GetByteCount());
    RasterInfo bitsInfo(mask.GetByteCount(), 1, 1, DataType::Type8U);
    const kora::kubo::BitwiseRLECompressedData bitwise(packedBits.data(), bitsInfo);

    const double maskBytes = mask.GetByteCount();
    demo::Line("compress",
               "line RLE %.0f KiB (%.1fx smaller than the bit mask, %.0f MB/s in), "
               "bitwise RLE %.0f KiB (%.1fx)",
               static_cast<double>(lineBytes) / 1024.0, maskBytes / static_cast<double>(lineBytes),
               demo::MegabytesPerSecond(static_cast<double>(flags.byteSize), lineSeconds),
               bitwise.GetCompressedSize() / 1024.0, maskBytes / bitwise.GetCompressedSize());

    // A window of the line mask against the flags it came from, and a byte range of the
    // bitwise form against the packed bits.
    const unsigned int side = std::min(256u, std::min(width, height) / 2);
    const unsigned int x0 = width / 3;
    const unsigned int y0 = height / 3;
    std::vector<unsigned char> window(std::size_t{side} * side);
    lines.Decode(static_cast<int>(x0), static_cast<int>(y0), static_cast<int>(side),
                 static_cast<int>(side), window.data());
    bool same = true;
    for (unsigned int y = 0; y < side; ++y) {
        same = same && std::memcmp(&window[std::size_t{y} * side],
                                   &flags.data[std::size_t{y0 + y} * width + x0], side) == 0;
    }
    const unsigned int rangeStart = mask.GetByteCount() / 2;
    std::vector<unsigned char> range(side);
    bitwise.Decode(static_cast<int>(rangeStart), 0, static_cast<int>(side), 1, range.data());
    same = same && std::memcmp(range.data(), &packedBits[rangeStart], side) == 0;
    demo::Line("decode window", "%ux%u at (%u, %u) and %u mask bytes decoded back: %s", side, side,
               x0, y0, side, same ? "identical" : "DIFFERENT");
}

// 3 x 3 mean of the valid neighbours, tile by tile, reading the mirrored margins at the
// image edges; no-data pixels stay no-data.
Raster Smooth(Raster& image) {
    const unsigned int w = image.width;
    const unsigned int h = image.height;
    Raster framed(RasterInfo(w, h, 1, DataType::Type16U), RasterContext(1, 1, 0, 0));
    for (unsigned int y = 0; y < h; ++y) {
        std::memcpy(framed.data + ((std::size_t{y} + 1) * framed.lineStride + 1) * 2,
                    image.data + std::size_t{y} * w * 2, std::size_t{w} * 2);
    }
    const demo::Stopwatch clock;
    FillRasterMargins(&framed, MARGIN_MIRROR, MARGIN_ALL);

    Raster smoothed(RasterInfo(w, h, 1, DataType::Type16U), RasterContext());
    const std::uint16_t* in = Samples16(framed);
    std::uint16_t* out = Samples16(smoothed);
    const std::size_t stride = framed.lineStride;
    kora::kubo::TileIterator tiles(w, h);
    tiles.SetChunkSize(256u, 256u);
    unsigned int tileCount = 0;
    for (kora::kubo::Tile tile = tiles.GetFirstTile(); tile.xSize != 0;
         tile = tiles.GetNextTile(), ++tileCount) {
        for (unsigned int y = tile.yOffset; y < tile.yOffset + tile.ySize; ++y) {
            for (unsigned int x = tile.xOffset; x < tile.xOffset + tile.xSize; ++x) {
                const std::size_t centre = (std::size_t{y} + 1) * stride + x + 1;
                unsigned int sum = 0;
                unsigned int valid = 0;
                for (const std::size_t row : {centre - stride, centre, centre + stride}) {
                    for (const std::size_t at : {row - 1, row, row + 1}) {
                        sum += in[at];
                        valid += in[at] != demo::kNoData ? 1u : 0u;
                    }
                }
                out[std::size_t{y} * w + x] =
                    in[centre] == demo::kNoData
                        ? demo::kNoData
                        : static_cast<std::uint16_t>((sum + valid / 2) / valid);
            }
        }
    }
    const double seconds = clock.Seconds();
    demo::Line("smooth 3x3", "margins mirrored, %u tiles of 256x256 walked, %.0f MB/s", tileCount,
               demo::MegabytesPerSecond(2.0 * static_cast<double>(image.byteSize), seconds));
    return smoothed;
}

// Height percentiles of the valid pixels.
std::array<double, 3> Percentiles(const std::uint16_t* heights, std::size_t count) {
    std::vector<std::uint16_t> valid;
    valid.reserve(count);
    std::copy_if(heights, heights + count, std::back_inserter(valid),
                 [](std::uint16_t v) { return v != demo::kNoData; });
    std::array<double, 3> result{};
    const double fractions[] = {0.02, 0.5, 0.98};
    for (std::size_t i = 0; i < 3; ++i) {
        const auto at = static_cast<std::size_t>(fractions[i] * static_cast<double>(valid.size()));
        std::nth_element(valid.begin(), valid.begin() + static_cast<std::ptrdiff_t>(at),
                         valid.end());
        result[i] = valid[at];
    }
    return result;
}

// 16U heights stretched to 8 bits through a breakpoint LUT, coloured through a
// hypsometric PCT and lit by a simple hillshade; no-data is black.
std::vector<unsigned char> ColourScene(Raster& heights) {
    const unsigned int w = heights.width;
    const unsigned int h = heights.height;
    const std::uint16_t* z = Samples16(heights);
    const auto p = Percentiles(z, PixelCount(heights));
    const kora::kubo::LUT stretch({{p[0], 0.0}, {p[1], 110.0}, {p[2], 255.0}});

    using Colour = kora::kubo::RGBTuple<unsigned char>;
    const kora::kubo::PCT palette({{0.0, Colour{40, 90, 50}},
                                   {70.0, Colour{90, 140, 60}},
                                   {130.0, Colour{200, 180, 110}},
                                   {190.0, Colour{150, 110, 80}},
                                   {235.0, Colour{230, 225, 220}},
                                   {255.0, Colour{255, 255, 255}}});

    std::vector<unsigned char> rgb(std::size_t{w} * h * 3, 0);
    const demo::Stopwatch clock;
    for (unsigned int y = 0; y < h; ++y) {
        for (unsigned int x = 0; x < w; ++x) {
            const std::size_t i = std::size_t{y} * w + x;
            if (z[i] == demo::kNoData) {
                continue;
            }
            const double level = stretch.GetValue(z[i]);
            const Colour colour = palette.GetValue(std::floor(level));
            // Light from the north-west: brighter where the ground faces it.
            const double here = z[i];
            const double dx = z[std::min(i + 1, i - x + w - 1)] - here;
            const double dy = y + 1 < h ? z[i + w] - here : 0.0;
            const double shade = std::clamp(0.8 - (dx + dy) / 60.0, 0.35, 1.15);
            rgb[3 * i] = static_cast<unsigned char>(std::min(255.0, colour.r * shade));
            rgb[3 * i + 1] = static_cast<unsigned char>(std::min(255.0, colour.g * shade));
            rgb[3 * i + 2] = static_cast<unsigned char>(std::min(255.0, colour.b * shade));
        }
    }
    const double seconds = clock.Seconds();
    demo::Line("stretch+colour",
               "LUT %.0f/%.0f/%.0f -> 0/110/255, %u-colour PCT, hillshade: %.1f ns/pixel", p[0],
               p[1], p[2], palette.GetEntryCount(),
               seconds * 1e9 / static_cast<double>(PixelCount(heights)));
    return rgb;
}

// Amplitude and phase of a speckled complex scene; the amplitude is shown in decibels.
std::vector<unsigned char> InterpretRadar(const demo::Terrain& terrain) {
    const demo::ComplexScene scene = demo::MakeRadarScene(terrain, kSeed);
    Raster radar(RasterInfo(scene.width, scene.height, 1, DataType::TypeC16S), RasterContext());
    std::memcpy(radar.data, scene.samples.data(), radar.byteSize);

    const kora::kubo::ComplexInterpretation interpretation;
    const demo::Stopwatch clock;
    std::unique_ptr<Raster> amplitude(
        interpretation.InterpretRaster(&radar, kora::core::INTERPRETATION_AMPLITUDE));
    const double seconds = clock.Seconds();
    std::unique_ptr<Raster> phase(
        interpretation.InterpretRaster(&radar, kora::core::INTERPRETATION_PHASE));

    const std::size_t count = PixelCount(radar);
    const auto* a = reinterpret_cast<const float*>(amplitude->data);
    const auto* phi = reinterpret_cast<const float*>(phase->data);
    double phaseSum = 0.0;
    for (std::size_t i = 0; i < count; ++i) {
        phaseSum += static_cast<double>(std::fabs(phi[i]));
    }
    // Decibels from 20 dB under the brightest percentile up to it.
    std::vector<float> decibels(count);
    for (std::size_t i = 0; i < count; ++i) {
        decibels[i] = 20.0f * std::log10(std::max(a[i], 1.0f));
    }
    std::vector<float> sorted(decibels);
    const auto top = static_cast<std::ptrdiff_t>(0.99 * static_cast<double>(count));
    std::nth_element(sorted.begin(), sorted.begin() + top, sorted.end());
    const auto high = static_cast<double>(sorted[static_cast<std::size_t>(top)]);
    const kora::kubo::LUT display({{high - 20.0, 0.0}, {high, 255.0}});
    std::vector<unsigned char> grey(count);
    for (std::size_t i = 0; i < count; ++i) {
        grey[i] = static_cast<unsigned char>(display.GetValue(static_cast<double>(decibels[i])));
    }
    demo::Line("radar C16S",
               "amplitude %.2f ns/pixel into 32R, mean |phase| %.2f rad (pi/2 for "
               "uniform phase)",
               seconds * 1e9 / static_cast<double>(count), phaseSum / static_cast<double>(count));
    return grey;
}

// A three-dimensional reference system for the control points.
class ProjectedCRS : public kora::ogc::cs::ICRS {
public:
    unsigned int GetDimension() const override { return 3; }
    ICRS* Clone() const override { return new ProjectedCRS(*this); }
};

void RecordControlPoints(unsigned int width, unsigned int height) {
    kora::kubo::ControlPointContainer container;
    container.SetCRS(ProjectedCRS());
    container.SetDescription("Corner and centre points of the synthetic scene");
    container.GetKVPMetadata()["Sensor"] = "synthetic";
    container.GetKVPMetadata()["SENSOR"] = "synthetic, 12-bit";  // same key, any case

    // Image corners and centre tied to ground coordinates 10 m per pixel from an origin.
    const double columns[] = {0.0, width - 1.0, 0.0, width - 1.0, width / 2.0};
    const double rows[] = {0.0, 0.0, height - 1.0, height - 1.0, height / 2.0};
    for (unsigned int id = 0; id < 5; ++id) {
        kora::kubo::ControlPoint point(id + 1);
        point.SetName("GCP" + std::to_string(id + 1));
        kora::kubo::GroundLocation ground;
        ground.SetCoords(500000.0 + 10.0 * columns[id], 4649000.0 - 10.0 * rows[id], 1200.0);
        point.SetGroundLocation(ground);
        kora::kubo::ImageLocation image;
        image.SetCoords(columns[id], rows[id]);
        point.GetImageLocations().push_back(image);
        point.SetUsed(id != 4);
        container.GetControlPoints().push_back(point);
    }
    container.GetHistory().emplace_back(1, "Points measured on the synthetic scene");
    container.GetHistory().emplace_back(2, "Centre point kept as a check point");

    const kora::kubo::ControlPointContainer copy(container);  // copies start a new history
    demo::Line("control points",
               "%zu points, %zu metadata key, CRS of %u dimensions, history "
               "%zu events (the copy starts with %zu)",
               container.GetControlPoints().size(), container.GetKVPMetadata().size(),
               container.GetCRS()->GetDimension(), container.GetHistory().size(),
               copy.GetHistory().size());
}

// The scene converted to other sample types, each through the factory's converter.
void ConvertScene(Raster& image) {
    const kora::kubo::PromoteFactory factory;
    const auto count = static_cast<unsigned int>(PixelCount(image));
    const DataType targets[] = {DataType::Type8U, DataType::Type32S, DataType::Type32R,
                                DataType::Type64R, DataType::TypeC32R};
    const char* labels[] = {"8U", "32S", "32R", "64R", "C32R"};
    std::string line;
    for (std::size_t t = 0; t < 5; ++t) {
        Raster converted(RasterInfo(image.width, image.height, 1, targets[t]), RasterContext());
        std::memset(converted.data, 0, converted.byteSize);
        std::unique_ptr<typeconv::IPromote> convert(factory.Create(DataType::Type16U, targets[t]));
        const demo::Stopwatch clock;
        convert->Promote(image.data, converted.data, count);
        const double rate = demo::MegabytesPerSecond(
            static_cast<double>(image.byteSize + converted.byteSize), clock.Seconds());
        line += std::string(t == 0 ? "" : ", ") + labels[t] + " " +
                std::to_string(static_cast<long>(rate)) + " MB/s";
    }
    demo::Line("convert 16U", "%s (bytes in + out per second)", line.c_str());
}

bool ParseOptions(int argc, char** argv, Options& options) {
    if (argc > 1) {
        const long size = std::strtol(argv[1], nullptr, 10);
        if (size < 64 || size > 16384) {
            std::fprintf(stderr, "usage: %s [size 64..16384] [output-folder]\n", argv[0]);
            return false;
        }
        options.size = static_cast<unsigned int>(size);
    }
    if (argc > 2) {
        options.output = argv[2];
    }
    return true;
}

}  // namespace

int main(int argc, char** argv) {
    Options options;
    if (!ParseOptions(argc, argv, options)) {
        return 2;
    }
    std::filesystem::create_directories(options.output);
    const unsigned int n = options.size;
    std::printf("kubo demo: a %ux%u synthetic scene (seed %u)\n", n, n, kSeed);

    const demo::Stopwatch total;
    const demo::Terrain terrain = demo::MakeTerrain(n, n, kSeed);
    Raster image = UnpackTerrain(terrain);
    const auto mask = BuildValidityMask(image);
    CompressMask(*mask, n, n);
    Raster smoothed = Smooth(image);
    const std::vector<unsigned char> colours = ColourScene(smoothed);
    const std::vector<unsigned char> amplitude = InterpretRadar(terrain);
    RecordControlPoints(n, n);
    ConvertScene(image);

    std::vector<unsigned char> maskImage(mask->GetBitCount());
    for (unsigned int i = 0; i < mask->GetBitCount(); ++i) {
        maskImage[i] = mask->GetBit(i) ? 255 : 0;
    }
    const auto path = [&](const char* name) { return (options.output / name).string(); };
    const bool written = demo::WritePpm(path("scene.ppm"), n, n, colours.data()) &&
                         demo::WritePgm(path("mask.pgm"), n, n, maskImage.data()) &&
                         demo::WritePgm(path("amplitude.pgm"), n, n, amplitude.data());
    if (!written) {
        std::fprintf(stderr, "could not write the images into %s\n", options.output.c_str());
        return 1;
    }
    std::printf("wrote %s, %s and %s in %.1f s\n", path("scene.ppm").c_str(),
                path("mask.pgm").c_str(), path("amplitude.pgm").c_str(), total.Seconds());
    return 0;
}
