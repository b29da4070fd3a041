// The machine a benchmark run measures: its processor and the kernel variants it runs,
// printed ahead of every run, and benchmarks registered once per such variant.
#ifndef KUBO_BENCH_SUPPORT_MACHINE_H
#define KUBO_BENCH_SUPPORT_MACHINE_H

#include <benchmark/benchmark.h>

#include <functional>
#include <string>
#include <vector>

namespace kubo_bench {

/// Prints the processor (model name, family, model) and the kernel variants: which this
/// build compiles, which the processor runs, which the library chose.
void PrintMachine();

/// Registers `run` as <name>/<variant> for every kernel variant the processor runs, with
/// that variant forced while it runs; returns the registrations for further settings.
std::vector<benchmark::internal::Benchmark*> RegisterPerVariant(
    const std::string& name, const std::function<void(benchmark::State&)>& run);

}  // namespace kubo_bench

#endif  // KUBO_BENCH_SUPPORT_MACHINE_H
