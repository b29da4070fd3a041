// Raster operations on 4096 x 4096 rasters: complex interpretation (pixels per second) and
// margin filling (against a memcpy of the margin bytes).
#include <benchmark/benchmark.h>

#include <cstdint>  // std::uint64_t
#include <cstring>  // std::memset
#include <string>

#include "memcpyreference.h"
#include "vrkframework/basic/kubo/raster/complexrasterinterpretation.h"
#include "vrkframework/basic/kubo/raster/marginfiller.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace {

using kora::kubo::DataType;
using kora::kubo::Raster;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;

constexpr unsigned int kSide = 4096;
constexpr unsigned int kMargin = 16;

void Interpret(benchmark::State& state, DataType type) {
    Raster in(RasterInfo(kSide, kSide, 1, type), RasterContext());
    // Small components keep every interpretation finite and away from denormals.
    for (std::uint64_t i = 0; i < in.byteSize; ++i) {
        in.data[i] = static_cast<unsigned char>(i % 7 == 0 ? 0x3f : i % 5);
    }
    Raster out(RasterInfo(kSide, kSide, 1, DataType::Type32R), RasterContext());
    const kora::kubo::ComplexInterpretation interpretation;
    for (auto _ : state) {
        interpretation.InterpretRaster(&in, &out, kora::core::INTERPRETATION_AMPLITUDE);
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(static_cast<std::int64_t>(state.iterations()) * kSide * kSide);
    state.counters["s/pixel"] =
        benchmark::Counter(double{kSide} * kSide, benchmark::Counter::kIsIterationInvariantRate |
                                                      benchmark::Counter::kInvert);
    kubo_bench::CompareWithMemcpy(state, in.byteSize);
}

std::size_t MarginBytes(const DataType& type) {
    const std::size_t buffer = std::size_t{kSide + 2 * kMargin} * (kSide + 2 * kMargin);
    return (buffer - std::size_t{kSide} * kSide) * (type.bits / 8);
}

void FillMargins(benchmark::State& state, DataType type, eMarginBehaviour behaviour) {
    Raster raster(RasterInfo(kSide, kSide, 1, type), RasterContext(kMargin, kMargin, 0, 0));
    std::memset(raster.data, 0x2a, raster.byteSize);
    for (auto _ : state) {
        kora::kubo::FillRasterMargins(&raster, behaviour, MARGIN_ALL);
        benchmark::ClobberMemory();
    }
    state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(MarginBytes(type)));
    kubo_bench::CompareWithMemcpy(state, MarginBytes(type));
}

}  // namespace

int main(int argc, char** argv) {
    for (const auto& [name, type] :
         {std::pair{"C16S", DataType::TypeC16S}, std::pair{"C32R", DataType::TypeC32R}}) {
        kubo_bench::AddMemcpyReference(std::size_t{kSide} * kSide * 2 * (type.bits / 8));
        benchmark::RegisterBenchmark((std::string("InterpretRaster/amplitude/") + name).c_str(),
                                     Interpret, type)
            ->Unit(benchmark::kMillisecond);
    }
    for (const auto& [name, type] :
         {std::pair{"8U", DataType::Type8U}, std::pair{"32R", DataType::Type32R}}) {
        kubo_bench::AddMemcpyReference(MarginBytes(type));
        for (const auto& [rule, behaviour] :
             {std::pair{"mirror", MARGIN_MIRROR}, std::pair{"wrap", MARGIN_WRAP}}) {
            benchmark::RegisterBenchmark(
                (std::string("FillRasterMargins/") + rule + "/all/16/" + name).c_str(), FillMargins,
                type, behaviour)
                ->Unit(benchmark::kMicrosecond);
        }
    }
    return kubo_bench::RunWithMemcpyTable(argc, argv);
}
