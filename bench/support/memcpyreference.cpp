// The memcpy reference runs and the closing ratio table.
#include "memcpyreference.h"

#include <algorithm>  // std::min, std::max
#include <array>
#include <chrono>
#include <cstdio>   // std::printf
#include <cstring>  // std::memcpy, std::memchr, std::memset
#include <map>
#include <set>
#include <string>
#include <vector>

#include "machine.h"

namespace kubo_bench {
namespace {

constexpr char kReferenceCounter[] = "ref_bytes";
constexpr char kReadAndFillCounter[] = "read_fill_ns";

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

// A byte value that `bytes` does not hold, if there is one: memchr for it reads the whole
// buffer with the C library's widest loads, a read-only pass as fast as the machine goes.
int AbsentByte(const unsigned char* bytes, std::size_t count) {
    std::array<bool, 256> seen{};
    for (std::size_t i = 0; i < count; ++i) {
        seen[bytes[i]] = true;
    }
    const auto absent = std::find(seen.begin(), seen.end(), false);
    return absent == seen.end() ? -1 : static_cast<int>(absent - seen.begin());
}

// Reads every byte of `bytes`, in a way the compiler cannot drop.
void ReadAll(const unsigned char* bytes, std::size_t count, int absent) {
    if (absent >= 0) {
        benchmark::DoNotOptimize(std::memchr(bytes, absent, count));
        return;
    }
    std::uint64_t any = 0;
    for (std::size_t i = 0; i + 8 <= count; i += 8) {
        std::uint64_t word;
        std::memcpy(&word, bytes + i, 8);
        any |= word;
    }
    benchmark::DoNotOptimize(any);
}

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
            const auto readAndFill = run.counters.find(kReadAndFillCounter);
            if (name.rfind("memcpy/", 0) == 0) {
                m_references[name] = SecondsPerIteration(run);
            } else if (counter != run.counters.end()) {
                m_compared.push_back(
                    {name, SecondsPerIteration(run),
                     ReferenceName(static_cast<std::size_t>(counter->second.value)),
                     readAndFill == run.counters.end() ? 0.0 : readAndFill->second.value * 1e-9});
            }
        }
    }

    void Finalize() override {
        ConsoleReporter::Finalize();
        if (m_compared.empty()) {
            return;
        }
        // The limit is the faster of the two references; "-" where a run lacks one.
        std::printf("\n%-52s %11s %11s %11s %7s %7s\n", "run", "ns/iter", "memcpy ns",
                    "read+set ns", "/memcpy", "/limit");
        for (const Compared& entry : m_compared) {
            const auto reference = m_references.find(entry.reference);
            const double memcpySeconds = reference == m_references.end() ? 0.0 : reference->second;
            double limit = memcpySeconds;
            if (entry.readAndFill > 0.0) {
                limit = limit > 0.0 ? std::min(limit, entry.readAndFill) : entry.readAndFill;
            }
            std::printf(
                "%-52s %11.0f %11s %11s %7s %7s\n", entry.name.c_str(), entry.seconds * 1e9,
                Figure(memcpySeconds * 1e9, "%.0f").c_str(),
                Figure(entry.readAndFill * 1e9, "%.0f").c_str(),
                Figure(memcpySeconds > 0.0 ? entry.seconds / memcpySeconds : 0.0, "%.2f").c_str(),
                Figure(limit > 0.0 ? entry.seconds / limit : 0.0, "%.2f").c_str());
        }
    }

private:
    struct Compared {
        std::string name;
        double seconds;
        std::string reference;
        double readAndFill;  ///< seconds a pass, 0 when the run did not time it
    };

    // `value` printed with `format`, or "-" when there is none (0).
    static std::string Figure(double value, const char* format) {
        if (value <= 0.0) {
            return "-";
        }
        char text[32];
        std::snprintf(text, sizeof text, format, value);
        return text;
    }

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

void CompareWithReadAndFill(benchmark::State& state, const unsigned char* source,
                            std::size_t sourceBytes, unsigned char* target,
                            std::size_t targetBytes) {
    using Clock = std::chrono::steady_clock;
    const int absent = AbsentByte(source, sourceBytes);
    // The fastest of a few batches, together about a quarter of the run's own passes.
    const auto passes =
        static_cast<std::size_t>(std::max<std::int64_t>(1, state.iterations() / 16));
    double best = 0.0;
    for (int batch = 0; batch < 4; ++batch) {
        const Clock::time_point start = Clock::now();
        for (std::size_t pass = 0; pass < passes; ++pass) {
            ReadAll(source, sourceBytes, absent);
            std::memset(target, pass & 1 ? 0x00 : 0x5a, targetBytes);
            benchmark::ClobberMemory();
        }
        const double seconds = std::chrono::duration<double>(Clock::now() - start).count() /
                               static_cast<double>(passes);
        best = batch == 0 ? seconds : std::min(best, seconds);
    }
    state.counters[kReadAndFillCounter] = best * 1e9;
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
