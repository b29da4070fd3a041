// Throughput benchmarks reported against a memcpy of the same traffic, measured in the
// same run: each kernel run names its reference size and a closing table prints the ratio.
#ifndef KUBO_BENCH_SUPPORT_MEMCPYREFERENCE_H
#define KUBO_BENCH_SUPPORT_MEMCPYREFERENCE_H

#include <benchmark/benchmark.h>

#include <cstddef>  // std::size_t

namespace kubo_bench {

/// Registers "memcpy/<bytes>" once per distinct size: a copy of `bytes` bytes between two
/// buffers that were touched beforehand.
void AddMemcpyReference(std::size_t bytes);

/// Marks the current run as comparable to "memcpy/<bytes>"; register that size with
/// AddMemcpyReference before the runs start. Call it from the benchmark body.
void CompareWithMemcpy(benchmark::State& state, std::size_t bytes);

/// Prints the machine, runs the registered benchmarks with the console output and then
/// prints one table line per compared run: time per iteration, the reference time and their
/// ratio.
int RunWithMemcpyTable(int argc, char** argv);

}  // namespace kubo_bench

#endif  // KUBO_BENCH_SUPPORT_MEMCPYREFERENCE_H
