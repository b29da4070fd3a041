// Mask building from no-data values on large rasters, and mask packing from flags, each
// against the two ways to move the bytes it must at least move (the raster read and the mask
// written): a memcpy of that traffic, and a read-only pass plus a memset.
#include <cstdint>
#include <cstring>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "machine.h"
#include "memcpyreference.h"
#include "vrkframework/basic/kubo/masks/mask.h"
#include "vrkframework/basic/kubo/masks/maskdecisionbuilder.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace {

using kora::kubo::DataType;
using kora::kubo::Mask;
using kora::kubo::MaskDecisionBuilder;
using kora::kubo::Raster;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;

constexpr unsigned int kSide = 8192;
constexpr unsigned int kBlock = 256;  // side of the no-data and data blocks
constexpr std::size_t kMaskBytes = std::size_t{kSide} * kSide / 8;

// Half the blocks, in a checkerboard, hold the no-data value 0 in every sample; the others
// hold values that are never 0.
template <class T>
std::unique_ptr<Raster> BlockRaster(unsigned int channels, const DataType& type) {
    auto raster =
        std::make_unique<Raster>(RasterInfo(kSide, kSide, channels, type), RasterContext());
    T* samples = reinterpret_cast<T*>(raster->data);
    std::uint32_t state = 12345;
    for (unsigned int y = 0; y < kSide; ++y) {
        for (unsigned int x = 0; x < kSide; ++x) {
            const bool noData = ((x / kBlock) + (y / kBlock)) % 2 == 0;
            for (unsigned int c = 0; c < channels; ++c) {
                state = state * 1664525u + 1013904223u;
                const auto value = static_cast<T>(1 + (state >> 24) % 100);
                samples[(std::size_t{y} * kSide + x) * channels + c] = noData ? T(0) : value;
            }
        }
    }
    return raster;
}

// Registers `run` per kernel variant, timed in milliseconds of real time.
void RegisterTimed(const std::string& name, const std::function<void(benchmark::State&)>& run) {
    for (benchmark::internal::Benchmark* registered : kubo_bench::RegisterPerVariant(name, run)) {
        registered->Unit(benchmark::kMillisecond)->UseRealTime();
    }
}

void RegisterBuildMask(const std::string& name, std::shared_ptr<Raster> raster,
                       std::shared_ptr<MaskDecisionBuilder> builder) {
    const std::size_t reference = (raster->byteSize + kMaskBytes) / 2;
    kubo_bench::AddMemcpyReference(reference);
    RegisterTimed(name, [raster, builder, reference](benchmark::State& state) {
        // One pass before the clock starts: the first read of a raster set up long before
        // can take many times as long (the memory comes back from the host), and a run
        // this long is often timed on one pass only.
        std::unique_ptr<Mask>(builder->BuildMask(*raster));
        for (auto _ : state) {
            std::unique_ptr<Mask> mask(builder->BuildMask(*raster));
            benchmark::DoNotOptimize(mask->GetBits());
        }
        state.SetItemsProcessed(state.iterations() * kSide * kSide);
        kubo_bench::CompareWithMemcpy(state, reference);
        std::vector<unsigned char> bits(kMaskBytes);
        kubo_bench::CompareWithReadAndFill(state, raster->data, raster->byteSize, bits.data(),
                                           bits.size());
    });
}

void RegisterPacking() {
    const std::size_t pixels = std::size_t{kSide} * kSide;
    const std::size_t reference = (pixels + kMaskBytes) / 2;
    kubo_bench::AddMemcpyReference(reference);
    auto flags = std::make_shared<std::vector<unsigned char>>(pixels);
    for (std::size_t i = 0; i < pixels; ++i) {
        (*flags)[i] = static_cast<unsigned char>((i / kBlock + i / (kBlock * kSide)) % 2);
    }
    RegisterTimed("Mask/pack_flags/8192x8192", [flags, reference](benchmark::State& state) {
        const RasterInfo info(kSide, kSide, 1, DataType::Type8U);
        for (auto _ : state) {
            Mask mask(info, RasterContext(), flags->data(), false, false);
            benchmark::DoNotOptimize(mask.GetBits());
        }
        state.SetItemsProcessed(state.iterations() * kSide * kSide);
        kubo_bench::CompareWithMemcpy(state, reference);
        std::vector<unsigned char> bits(kMaskBytes);
        kubo_bench::CompareWithReadAndFill(state, flags->data(), flags->size(), bits.data(),
                                           bits.size());
    });
}

}  // namespace

int main(int argc, char** argv) {
    RegisterBuildMask("BuildMask/16U_x1_single/8192x8192",
                      BlockRaster<unsigned short>(1, DataType::Type16U),
                      std::make_shared<MaskDecisionBuilder>(0.0, kora::kubo::BkgdAnyChan));
    RegisterBuildMask("BuildMask/8U_x3_any_channel/8192x8192",
                      BlockRaster<unsigned char>(3, DataType::Type8U),
                      std::make_shared<MaskDecisionBuilder>(0.0, kora::kubo::BkgdAnyChan));
    RegisterBuildMask("BuildMask/32R_x4_listed_1_2_3/8192x8192",
                      BlockRaster<float>(4, DataType::Type32R),
                      std::make_shared<MaskDecisionBuilder>(std::vector<double>{0.0, 0.0, 0.0},
                                                            kora::kubo::BkgdAllChans,
                                                            std::vector<unsigned int>{1, 2, 3}));
    RegisterPacking();
    return kubo_bench::RunWithMemcpyTable(argc, argv);
}
