// Compression, whole decoding and 256 x 256 window decoding of the three compressed
// rasters on a 4096 x 4096 8U raster, mask-like (large blobs) and noisy, each against a
// memcpy of the raster's bytes; "ratio" is raw size over compressed size.
#include <benchmark/benchmark.h>

#include <cstddef>  // std::size_t
#include <random>
#include <string>
#include <vector>

#include "memcpyreference.h"
#include "vrkframework/basic/kubo/raster/bitwiserlecompresseddata.h"
#include "vrkframework/basic/kubo/raster/linerlecompressedbitmask.h"
#include "vrkframework/basic/kubo/raster/raster.h"
#include "vrkframework/basic/kubo/raster/rlecompresseddata.h"

namespace {

using kora::kubo::DataType;
using kora::kubo::Raster;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;

constexpr unsigned int kSide = 4096;
constexpr unsigned int kWindow = 256;
constexpr std::size_t kBytes = std::size_t{kSide} * kSide;

// Zero background with large filled discs of 255, as a validity mask of an image.
Raster MaskLike() {
    Raster raster(RasterInfo(kSide, kSide, 1, DataType::Type8U), RasterContext());
    std::fill(raster.data, raster.data + kBytes, 0);
    std::mt19937 random(1);
    for (int disc = 0; disc < 40; ++disc) {
        const int cx = static_cast<int>(random() % kSide);
        const int cy = static_cast<int>(random() % kSide);
        const int r = 150 + static_cast<int>(random() % 550);
        for (int y = std::max(cy - r, 0); y < std::min(cy + r, static_cast<int>(kSide)); ++y) {
            for (int x = std::max(cx - r, 0); x < std::min(cx + r, static_cast<int>(kSide)); ++x) {
                if ((x - cx) * (x - cx) + (y - cy) * (y - cy) < r * r) {
                    raster.data[static_cast<std::size_t>(y) * kSide + static_cast<std::size_t>(x)] =
                        255;
                }
            }
        }
    }
    return raster;
}

Raster Noise() {
    Raster raster(RasterInfo(kSide, kSide, 1, DataType::Type8U), RasterContext());
    std::mt19937_64 random(2);
    for (std::size_t i = 0; i < kBytes; ++i) {
        raster.data[i] = static_cast<unsigned char>(random());
    }
    return raster;
}

// How each class is built from a raster and how big its compressed form is.
struct Rle {
    static constexpr const char* kName = "rle";
    static kora::kubo::RLECompressedData Compress(Raster& raster) {
        RasterContext context;
        return kora::kubo::RLECompressedData(raster.data, raster, context);
    }
    static std::size_t Size(const kora::kubo::RLECompressedData& data) {
        return data.GetCompressedSize();
    }
};

struct Bitwise {
    static constexpr const char* kName = "bitwise";
    static kora::kubo::BitwiseRLECompressedData Compress(Raster& raster) {
        return kora::kubo::BitwiseRLECompressedData(raster.data, raster);
    }
    static std::size_t Size(const kora::kubo::BitwiseRLECompressedData& data) {
        return data.GetCompressedSize();
    }
};

struct Line {
    static constexpr const char* kName = "line";
    static kora::kubo::LineRLECompressedBitMask Compress(Raster& raster) {
        return kora::kubo::LineRLECompressedBitMask(raster);
    }
    static std::size_t Size(const kora::kubo::LineRLECompressedBitMask& mask) {
        std::size_t size = 0;
        for (unsigned long row = 0; row < mask.GetHeight(); ++row) {
            size += mask.GetCompressedRowSize(row);
        }
        return size;
    }
};

template <class Codec>
void Compress(benchmark::State& state, Raster* raster) {
    std::size_t size = 0;
    for (auto _ : state) {
        const auto data = Codec::Compress(*raster);
        size = Codec::Size(data);
        benchmark::DoNotOptimize(size);
    }
    state.counters["ratio"] = static_cast<double>(kBytes) / static_cast<double>(size);
    kubo_bench::CompareWithMemcpy(state, kBytes);
}

template <class Codec>
void DecodeWhole(benchmark::State& state, Raster* raster) {
    const auto data = Codec::Compress(*raster);
    std::vector<unsigned char> out(kBytes);
    for (auto _ : state) {
        data.Decode(out.data());
        benchmark::ClobberMemory();
    }
    kubo_bench::CompareWithMemcpy(state, kBytes);
}

// Every 256 x 256 window of the raster once per iteration, so the time compares with
// one whole decoding.
template <class Codec>
void DecodeWindows(benchmark::State& state, Raster* raster) {
    const auto data = Codec::Compress(*raster);
    std::vector<unsigned char> out(std::size_t{kWindow} * kWindow);
    for (auto _ : state) {
        for (unsigned int y = 0; y < kSide; y += kWindow) {
            for (unsigned int x = 0; x < kSide; x += kWindow) {
                data.Decode(static_cast<int>(x), static_cast<int>(y), kWindow, kWindow, out.data());
                benchmark::ClobberMemory();
            }
        }
    }
    kubo_bench::CompareWithMemcpy(state, kBytes);
}

template <class Codec>
void Register(const char* rasterName, Raster* raster) {
    const std::string prefix = std::string(Codec::kName) + "/" + rasterName + "/";
    benchmark::RegisterBenchmark((prefix + "compress").c_str(), Compress<Codec>, raster)
        ->Unit(benchmark::kMillisecond);
    benchmark::RegisterBenchmark((prefix + "decode").c_str(), DecodeWhole<Codec>, raster)
        ->Unit(benchmark::kMillisecond);
    benchmark::RegisterBenchmark((prefix + "windows").c_str(), DecodeWindows<Codec>, raster)
        ->Unit(benchmark::kMillisecond);
}

}  // namespace

int main(int argc, char** argv) {
    static Raster mask = MaskLike();
    static Raster noise = Noise();
    kubo_bench::AddMemcpyReference(kBytes);
    for (const auto& [name, raster] :
         {std::make_pair("mask", &mask), std::make_pair("noise", &noise)}) {
        Register<Rle>(name, raster);
        Register<Bitwise>(name, raster);
        Register<Line>(name, raster);
    }
    return kubo_bench::RunWithMemcpyTable(argc, argv);
}
