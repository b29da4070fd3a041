// The processor and kernel variants of a run, and registration per variant.
#include "machine.h"

#include <cstdio>  // std::printf
#include <fstream>
#include <string>

#include "vrkframework/basic/core/kernels/kernelvariants.h"

namespace kubo_bench {
namespace {

using kora::kubo::detail::KernelVariant;

// The value of the first "<key>\t: value" line of /proc/cpuinfo, or "?".
std::string CpuInfo(const std::string& key) {
    std::ifstream info("/proc/cpuinfo");
    for (std::string line; std::getline(info, line);) {
        if (line.rfind(key, 0) == 0 && line.find(':') != std::string::npos) {
            const std::size_t value = line.find_first_not_of(' ', line.find(':') + 1);
            return value == std::string::npos ? "" : line.substr(value);
        }
    }
    return "?";
}

}  // namespace

void PrintMachine() {
    std::printf("Processor: %s, family %s, model %s\n", CpuInfo("model name").c_str(),
                CpuInfo("cpu family").c_str(), CpuInfo("model\t").c_str());
    std::printf("Kernel variants:");
    for (KernelVariant variant = 0; variant < kora::kubo::detail::kKernelVariantCount; ++variant) {
        std::printf(" %s%s", kora::kubo::detail::KernelVariantName(variant),
                    kora::kubo::detail::IsKernelVariantSupported(variant) ? "" : " (not run here)");
    }
    std::printf("; in use unless forced: %s\n",
                kora::kubo::detail::KernelVariantName(kora::kubo::detail::ActiveKernelVariant()));
}

std::vector<benchmark::internal::Benchmark*> RegisterPerVariant(
    const std::string& name, const std::function<void(benchmark::State&)>& run) {
    std::vector<benchmark::internal::Benchmark*> registered;
    for (KernelVariant variant = 0; variant < kora::kubo::detail::kKernelVariantCount; ++variant) {
        if (!kora::kubo::detail::IsKernelVariantSupported(variant)) {
            continue;
        }
        const std::string full = name + "/" + kora::kubo::detail::KernelVariantName(variant);
        registered.push_back(
            benchmark::RegisterBenchmark(full.c_str(), [variant, run](benchmark::State& state) {
                const KernelVariant before = kora::kubo::detail::ActiveKernelVariant();
                kora::kubo::detail::ForceKernelVariant(variant);
                run(state);
                kora::kubo::detail::ForceKernelVariant(before);
            }));
    }
    return registered;
}

}  // namespace kubo_bench
