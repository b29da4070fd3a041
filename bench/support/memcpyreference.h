// Throughput benchmarks reported against a memcpy of the same traffic, measured in the
// same run, and where a run gives its buffers against a read of its source plus a memset of
// its target: each kernel run names its references and a closing table prints the ratios.
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

/// Times, on the run's own buffers, the other way to move its traffic: one read-only pass
/// over `source` and a memset of `target`. Call it from the benchmark body after the timed
/// loop; the closing table then also gives the run's ratio to the faster of the two
/// references, the limit a kernel is held to.
void CompareWithReadAndFill(benchmark::State& state, const unsigned char* source,
                            std::size_t sourceBytes, unsigned char* target,
                            std::size_t targetBytes);

/// Prints the machine, runs the registered benchmarks with the console output and then
/// prints one table line per compared run: time per iteration, the reference times and the
/// ratios to memcpy and, where the run has it, to the limit.
int RunWithMemcpyTable(int argc, char** argv);

}  // namespace kubo_bench

#endif  // KUBO_BENCH_SUPPORT_MEMCPYREFERENCE_H
