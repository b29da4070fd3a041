// Per-value cost of table lookups: a classic 256-entry table hit through its direct index
// with whole inputs, and a 16-breakpoint table searched and interpolated for random inputs.
#include <benchmark/benchmark.h>

#include <cstdint>  // std::int64_t
#include <random>
#include <vector>

#include "memcpyreference.h"
#include "vrkframework/basic/kubo/luts/lut.h"
#include "vrkframework/basic/kubo/luts/pct.h"

namespace {

using kora::kubo::LUT;
using kora::kubo::PCT;

// Enough inputs that the branch predictor cannot learn their sequence, few enough to stay
// in the second-level cache.
constexpr std::size_t kValues = 1 << 16;

std::vector<double> Inputs(bool whole) {
    std::mt19937 random(7);
    std::uniform_real_distribution<double> spread(0.0, 255.0);
    std::vector<double> inputs(kValues);
    for (double& x : inputs) {
        x = spread(random);
        x = whole ? static_cast<double>(static_cast<int>(x)) : x;
    }
    return inputs;
}

unsigned char Byte(std::mt19937& random) { return static_cast<unsigned char>(random() & 0xff); }

// Inputs 0, 17, ..., 255, so random inputs fall between breakpoints of the whole table.
std::vector<double> SixteenBreakpoints() {
    std::vector<double> inputs(16);
    for (std::size_t i = 0; i < inputs.size(); ++i) {
        inputs[i] = 17.0 * static_cast<double>(i);
    }
    return inputs;
}

LUT ClassicLut() {
    std::mt19937 random(1);
    std::vector<unsigned char> bytes(256);
    for (auto& byte : bytes) {
        byte = Byte(random);
    }
    return LUT(bytes);
}

LUT BreakpointLut() {
    std::mt19937 random(2);
    std::vector<LUT::Entry> entries;
    for (double input : SixteenBreakpoints()) {
        entries.emplace_back(input, Byte(random));
    }
    return LUT(entries);
}

PCT ClassicPct() {
    std::mt19937 random(3);
    std::vector<PCT::Colour> colours(256);
    for (auto& colour : colours) {
        colour = {Byte(random), Byte(random), Byte(random)};
    }
    return PCT(colours);
}

PCT BreakpointPct() {
    std::mt19937 random(4);
    std::vector<PCT::Entry> entries;
    for (double input : SixteenBreakpoints()) {
        entries.push_back({input, {Byte(random), Byte(random), Byte(random)}});
    }
    return PCT(entries);
}

template <class Table>
void Lookup(benchmark::State& state, const Table& table, bool wholeInputs) {
    const std::vector<double> inputs = Inputs(wholeInputs);
    std::vector<decltype(table.GetValue(0.0))> outputs(inputs.size());
    for (auto _ : state) {
        for (std::size_t i = 0; i < inputs.size(); ++i) {
            outputs[i] = table.GetValue(inputs[i]);
        }
        benchmark::ClobberMemory();
    }
    const auto values = static_cast<std::int64_t>(inputs.size());
    state.SetItemsProcessed(state.iterations() * values);
}

}  // namespace

int main(int argc, char** argv) {
    const LUT classicLut = ClassicLut();
    const LUT breakpointLut = BreakpointLut();
    const PCT classicPct = ClassicPct();
    const PCT breakpointPct = BreakpointPct();
    benchmark::RegisterBenchmark("LUT::GetValue/classic256/whole",
                                 [&](benchmark::State& state) { Lookup(state, classicLut, true); });
    benchmark::RegisterBenchmark(
        "LUT::GetValue/breakpoints16/random",
        [&](benchmark::State& state) { Lookup(state, breakpointLut, false); });
    benchmark::RegisterBenchmark("PCT::GetValue/classic256/whole",
                                 [&](benchmark::State& state) { Lookup(state, classicPct, true); });
    benchmark::RegisterBenchmark(
        "PCT::GetValue/breakpoints16/random",
        [&](benchmark::State& state) { Lookup(state, breakpointPct, false); });
    return kubo_bench::RunWithMemcpyTable(argc, argv);
}
