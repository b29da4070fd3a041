// The twelve conversions an imaging pipeline uses most, timed in one process on the same
// buffers through kubo's PromoteFactory, OpenCV's Mat::convertTo (one thread) and GDAL's
// GDALCopyWords64, each against a memcpy of the same traffic and a read of the source plus
// a memset of the target. The three round floating values to integers differently (kubo by
// its own rule, the peers to nearest); the traffic and the saturation are the same.
#include <gdal.h>

#include <functional>
#include <map>
#include <memory>
#include <opencv2/core.hpp>
#include <string>
#include <utility>
#include <vector>

#include "machine.h"
#include "memcpyreference.h"
#include "vrkframework/basic/core/typeconv/ipromote.h"
#include "vrkframework/basic/kubo/raster/datatype.h"
#include "vrkframework/basic/kubo/raster/promotefactory.h"

namespace {

using kora::kubo::DataType;

constexpr std::size_t kOutOfCache = std::size_t{16} << 20;  // samples
constexpr std::size_t kInCache = std::size_t{64} << 10;

/// One sample type as each of the three names it.
struct SampleType {
    const char* label;
    DataType kubo;
    int opencv;
    GDALDataType gdal;
    std::size_t bytes;
};

const SampleType k8U{"8U", DataType::Type8U, CV_8U, GDT_Byte, 1};
const SampleType k16U{"16U", DataType::Type16U, CV_16U, GDT_UInt16, 2};
const SampleType k16S{"16S", DataType::Type16S, CV_16S, GDT_Int16, 2};
const SampleType k32S{"32S", DataType::Type32S, CV_32S, GDT_Int32, 4};
const SampleType k32R{"32R", DataType::Type32R, CV_32F, GDT_Float32, 4};
const SampleType k64R{"64R", DataType::Type64R, CV_64F, GDT_Float64, 8};

const std::pair<SampleType, SampleType> kPairs[] = {
    {k8U, k16U},  {k8U, k32R}, {k8U, k64R},  {k16U, k8U},  {k16U, k32R}, {k16S, k32R},
    {k32S, k16U}, {k32R, k8U}, {k32R, k16S}, {k32R, k16U}, {k64R, k32R}, {k32R, k64R},
};

/// A pair's source (small values, exact in every type) and target, shared by the three.
struct Buffers {
    std::vector<unsigned char> source;
    std::vector<unsigned char> target;
};

Buffers& BuffersFor(const SampleType& from, const SampleType& to, std::size_t count) {
    static std::map<std::string, Buffers> all;
    Buffers& buffers = all[std::string(from.label) + to.label + std::to_string(count)];
    if (buffers.source.empty()) {
        std::vector<unsigned char> bytes(count);
        for (std::size_t i = 0; i < count; ++i) {
            bytes[i] = static_cast<unsigned char>((i * 37) % 101);
        }
        buffers.source.resize(count * from.bytes);
        GDALCopyWords64(bytes.data(), GDT_Byte, 1, buffers.source.data(), from.gdal,
                        static_cast<int>(from.bytes), static_cast<GPtrDiff_t>(count));
        buffers.target.assign(count * to.bytes, 0);
    }
    return buffers;
}

using Convert = std::function<void(const unsigned char*, unsigned char*)>;

void Run(benchmark::State& state, Buffers& buffers, const Convert& convert) {
    for (auto _ : state) {
        convert(buffers.source.data(), buffers.target.data());
        benchmark::ClobberMemory();
    }
    const std::size_t traffic = buffers.source.size() + buffers.target.size();
    state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(traffic));
    kubo_bench::CompareWithMemcpy(state, traffic / 2);
    kubo_bench::CompareWithReadAndFill(state, buffers.source.data(), buffers.source.size(),
                                       buffers.target.data(), buffers.target.size());
}

void Register(const SampleType& from, const SampleType& to, std::size_t count) {
    kubo_bench::AddMemcpyReference(count * (from.bytes + to.bytes) / 2);
    const std::string pair =
        std::string(from.label) + "_to_" + to.label + "/" + std::to_string(count);
    benchmark::RegisterBenchmark(("kubo/" + pair).c_str(), [=](benchmark::State& state) {
        const std::unique_ptr<typeconv::IPromote> promote(
            kora::kubo::PromoteFactory().Create(from.kubo, to.kubo));
        Run(state, BuffersFor(from, to, count), [&](const unsigned char* in, unsigned char* out) {
            promote->Promote(in, out, static_cast<unsigned int>(count));
        });
    });
    benchmark::RegisterBenchmark(("opencv/" + pair).c_str(), [=](benchmark::State& state) {
        Run(state, BuffersFor(from, to, count), [&](const unsigned char* in, unsigned char* out) {
            const cv::Mat source(1, static_cast<int>(count), from.opencv,
                                 const_cast<unsigned char*>(in));
            cv::Mat target(1, static_cast<int>(count), to.opencv, out);
            source.convertTo(target, to.opencv);
        });
    });
    benchmark::RegisterBenchmark(("gdal/" + pair).c_str(), [=](benchmark::State& state) {
        Run(state, BuffersFor(from, to, count), [&](const unsigned char* in, unsigned char* out) {
            GDALCopyWords64(in, from.gdal, static_cast<int>(from.bytes), out, to.gdal,
                            static_cast<int>(to.bytes), static_cast<GPtrDiff_t>(count));
        });
    });
}

}  // namespace

int main(int argc, char** argv) {
    cv::setNumThreads(1);
    for (std::size_t count : {kOutOfCache, kInCache}) {
        for (const auto& [from, to] : kPairs) {
            Register(from, to, count);
        }
    }
    return kubo_bench::RunWithMemcpyTable(argc, argv);
}
