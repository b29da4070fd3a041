// Throughput of the sample conversions: every real pair and a few complex ones through
// PromoteFactory::Create, and the packed streams, each against memcpy of the same traffic.
#include <benchmark/benchmark.h>

#include <cstddef>
#include <cstdint>
#include <cstring>  // std::memcpy
#include <memory>
#include <string>
#include <type_traits>
#include <vector>

#include "machine.h"
#include "memcpyreference.h"
#include "vrkframework/basic/core/typeconv/promote.h"
#include "vrkframework/basic/core/typeconv/typelist.h"
#include "vrkframework/basic/kubo/raster/datatype.h"
#include "vrkframework/basic/kubo/raster/promotefactory.h"

namespace {

using kora::kubo::DataType;

constexpr std::size_t kOutOfCache = std::size_t{16} << 20;  // samples
constexpr std::size_t kInCache = std::size_t{64} << 10;

template <class T>
std::string Label() {
    if constexpr (std::is_floating_point_v<T>) {
        return sizeof(T) == 4 ? "32R" : "64R";
    } else {
        return std::to_string(sizeof(T) * 8) + (std::is_signed_v<T> ? "S" : "U");
    }
}

/// The bytes of `values` small values of T (masked with `mask`), valid in every type.
template <class T>
std::vector<unsigned char> Input(std::size_t values, unsigned int mask = ~0u) {
    std::vector<unsigned char> bytes(values * sizeof(T));
    for (std::size_t i = 0; i < values; ++i) {
        const T value = static_cast<T>((i * 37) % 101 & mask);
        std::memcpy(bytes.data() + i * sizeof(T), &value, sizeof value);
    }
    return bytes;
}

/// Runs `promote` over `count` samples into an output of `outBytes` bytes.
void RunConversion(benchmark::State& state, typeconv::IPromote& promote,
                   const std::vector<unsigned char>& input, std::size_t outBytes,
                   unsigned int count) {
    std::vector<unsigned char> output(outBytes, 0);
    for (auto _ : state) {
        promote.Promote(input.data(), output.data(), count);
        benchmark::ClobberMemory();
    }
    const std::size_t traffic = input.size() + outBytes;
    state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(traffic));
    kubo_bench::CompareWithMemcpy(state, traffic / 2);
    kubo_bench::CompareWithReadAndFill(state, input.data(), input.size(), output.data(), outBytes);
}

/// Registers the conversion from `from` to `to` (components A and B) at `count` samples.
template <class A, class B>
void AddConversion(const DataType& from, const DataType& to, std::size_t count) {
    const std::size_t inBytes = count * sizeof(A) * (from.isComplex ? 2 : 1);
    const std::size_t outBytes = count * sizeof(B) * (to.isComplex ? 2 : 1);
    kubo_bench::AddMemcpyReference((inBytes + outBytes) / 2);
    const std::string name = std::string(from.isComplex ? "C" : "") + Label<A>() + "_to_" +
                             (to.isComplex ? "C" : "") + Label<B>();
    kubo_bench::RegisterPerVariant(
        "convert/" + name + "/" + std::to_string(count),
        [from, to, count, inBytes, outBytes](benchmark::State& state) {
            // Equal types need no conversion and the factory returns null; the copy is
            // measured through the class itself.
            std::unique_ptr<typeconv::IPromote> promote(
                kora::kubo::PromoteFactory().Create(from, to));
            if (!promote) {
                promote = std::make_unique<typeconv::Promote<A, B>>();
            }
            const std::vector<unsigned char> input = Input<A>(inBytes / sizeof(A));
            RunConversion(state, *promote, input, outBytes, static_cast<unsigned int>(count));
        });
}

template <class A, class B>
void AddRealPair() {
    for (std::size_t count : {kOutOfCache, kInCache}) {
        AddConversion<A, B>(typeconv::priv::RealDescriptor<A>(),
                            typeconv::priv::RealDescriptor<B>(), count);
    }
}

/// Unpacks (or packs) `count` samples of `bits` bits from (into) element type T.
template <class T>
void AddPacked(unsigned int bits, bool pack, std::size_t count) {
    const std::size_t streamBytes = (count * bits + 7) / 8;
    const std::size_t inBytes = pack ? count * sizeof(T) : streamBytes;
    const std::size_t outBytes = pack ? streamBytes : count * sizeof(T);
    kubo_bench::AddMemcpyReference((inBytes + outBytes) / 2);
    const DataType packed(bits, false, false, bits, 0, false);
    const DataType whole = typeconv::priv::RealDescriptor<T>();
    kubo_bench::RegisterPerVariant(
        (pack ? "pack/" : "unpack/") + std::to_string(bits) + "_" + Label<T>() + "/" +
            std::to_string(count),
        [=](benchmark::State& state) {
            const std::unique_ptr<typeconv::IPromote> promote(
                pack ? kora::kubo::PromoteFactory().Create(whole, packed)
                     : kora::kubo::PromoteFactory().Create(packed, whole));
            const std::vector<unsigned char> input =
                pack ? Input<T>(count, (1u << bits) - 1) : Input<unsigned char>(inBytes);
            RunConversion(state, *promote, input, outBytes, static_cast<unsigned int>(count));
        });
}

void RegisterAll() {
#define KUBO_BENCH_PAIR(A, B) AddRealPair<A, B>();
    KUBO_FOR_EACH_COMPONENT_PAIR(KUBO_BENCH_PAIR)
#undef KUBO_BENCH_PAIR
    for (std::size_t count : {kOutOfCache, kInCache}) {
        AddConversion<short, float>(DataType::TypeC16S, DataType::TypeC32R, count);
        AddConversion<float, short>(DataType::TypeC32R, DataType::TypeC16S, count);
        AddConversion<double, float>(DataType::TypeC64R, DataType::TypeC32R, count);
        AddConversion<unsigned short, float>(DataType::Type16U, DataType::TypeC32R, count);
        AddConversion<float, unsigned char>(DataType::TypeC32R, DataType::Type8U, count);
        AddConversion<int, double>(DataType::TypeC32S, DataType::Type64R, count);
    }
    for (bool pack : {false, true}) {
        AddPacked<unsigned char>(1, pack, kOutOfCache);
        AddPacked<unsigned char>(4, pack, kOutOfCache);
        AddPacked<unsigned short>(12, pack, kOutOfCache);
        AddPacked<unsigned int>(20, pack, kOutOfCache);
    }
}

}  // namespace

int main(int argc, char** argv) {
    RegisterAll();
    return kubo_bench::RunWithMemcpyTable(argc, argv);
}
