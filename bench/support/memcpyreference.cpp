// The memcpy reference runs and the closing ratio table.
#include "memcpyreference.h"

#include <cstdio>   // std::printf
#include <cstring>  // std::memcpy
#include <map>
#include <set>
#include <string>
#include <vector>

#include "machine.h"

namespace kubo_bench {
namespace {

constexpr char kReferenceCounter[] = "ref_bytes";

std::set<std::size_t>& RegisteredSizes() {
    static std::set<std::size_t> sizes;
    return sizes;
}

void CopyReference(benchmark::State& state) {
    const auto bytes = static_cast<std::size_t>(state.range(0));
    std::vector<unsigned char> source(bytes, 0x5a);
    std::vector<unsigned char> target(bytes, 0);
    for (auto _ : state) {
        std::memcpy(target.data(), source.data(), bytes);
        benchmark::ClobberMemory();
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * 2 * bytes));
}

std::string ReferenceName(std::size_t bytes) { return "memcpy/" + std::to_string(bytes); }

double SecondsPerIteration(const benchmark::BenchmarkReporter::Run& run) {
    return run.real_accumulated_time / static_cast<double>(run.iterations);
}

// Prints the usual console output and keeps what the closing table needs.
class TableReporter : public benchmark::ConsoleReporter {
public:
    void ReportRuns(const std::vector<Run>& runs) override {
        ConsoleReporter::ReportRuns(runs);
        for (const Run& run : runs) {
            if (run.run_type != Run::RT_Iteration || run.iterations == 0) {
                continue;
            }
            const std::string name = run.benchmark_name();
            const auto counter = run.counters.find(kReferenceCounter);
            if (name.rfind("memcpy/", 0) == 0) {
                m_references[name] = SecondsPerIteration(run);
            } else if (counter != run.counters.end()) {
                m_compared.push_back(
                    {name, SecondsPerIteration(run),
                     ReferenceName(static_cast<std::size_t>(counter->second.value))});
            }
        }
    }

    void Finalize() override {
        ConsoleReporter::Finalize();
        if (m_compared.empty()) {
            return;
        }
        std::printf("\n%-60s %12s %12s %8s\n", "run", "ns/iter", "memcpy ns", "ratio");
        for (const Compared& entry : m_compared) {
            const auto reference = m_references.find(entry.reference);
            if (reference == m_references.end()) {
                std::printf("%-60s %12.0f %12s %8s\n", entry.name.c_str(), entry.seconds * 1e9, "-",
                            "-");
                continue;
            }
            std::printf("%-60s %12.0f %12.0f %8.2f\n", entry.name.c_str(), entry.seconds * 1e9,
                        reference->second * 1e9, entry.seconds / reference->second);
        }
    }

private:
    struct Compared {
        std::string name;
        double seconds;
        std::string reference;
    };
    std::map<std::string, double> m_references;
    std::vector<Compared> m_compared;
};

}  // namespace

void AddMemcpyReference(std::size_t bytes) {
    if (RegisteredSizes().insert(bytes).second) {
        benchmark::RegisterBenchmark("memcpy", CopyReference)
            ->Arg(static_cast<std::int64_t>(bytes));
    }
}

void CompareWithMemcpy(benchmark::State& state, std::size_t bytes) {
    state.counters[kReferenceCounter] = static_cast<double>(bytes);
}

int RunWithMemcpyTable(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) {
        return 1;
    }
    PrintMachine();
    TableReporter reporter;
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    return 0;
}

}  // namespace kubo_bench
