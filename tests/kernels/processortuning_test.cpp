#include "vrkframework/basic/core/kernels/processortuning.h"

#include <gtest/gtest.h>

#include <fstream>
#include <string>

#include "vrkframework/basic/core/typeconv/componenttraits.h"

namespace {

using kora::kubo::detail::KernelTables;
using kora::kubo::detail::ProcessorFamily;
using kora::kubo::detail::TuneForFamily;
using typeconv::detail::kComponentCount;
using typeconv::detail::kComponentIsInteger;

void Compiled(const void*, void*, std::size_t) {}
void Below(const void*, void*, std::size_t) {}

// Tables whose every conversion is `kernel`, for vectors of `bits` bits.
KernelTables TablesOf(typeconv::detail::ConvertKernel kernel, unsigned int bits) {
    KernelTables tables{};
    for (auto* table : {&tables.conversion.convert, &tables.conversion.convertRealParts}) {
        for (auto& row : *table) {
            row.fill(kernel);
        }
    }
    tables.vectorBits = bits;
    return tables;
}

// How many conversions of `tables` (both layouts) are `kernel`.
int CountOf(const KernelTables& tables, typeconv::detail::ConvertKernel kernel) {
    int count = 0;
    for (std::size_t from = 0; from < kComponentCount; ++from) {
        for (std::size_t to = 0; to < kComponentCount; ++to) {
            count += (tables.conversion.convert[from][to] == kernel) +
                     (tables.conversion.convertRealParts[from][to] == kernel);
        }
    }
    return count;
}

TEST(ProcessorTuning, Zen4TakesIntegerConversionsFromTheVariantBelowItsWidest) {
    const KernelTables below = TablesOf(&Below, 256);
    KernelTables tables = TablesOf(&Compiled, 512);
    TuneForFamily(tables, below, ProcessorFamily{true, 25});
    for (std::size_t from = 0; from < kComponentCount; ++from) {
        for (std::size_t to = 0; to < kComponentCount; ++to) {
            const auto expected =
                kComponentIsInteger[from] && kComponentIsInteger[to] ? &Below : &Compiled;
            EXPECT_EQ(tables.conversion.convert[from][to], expected) << from << " " << to;
            EXPECT_EQ(tables.conversion.convertRealParts[from][to], expected) << from << " " << to;
        }
    }
    EXPECT_EQ(CountOf(tables, &Below), 2 * 8 * 8);  // eight integer types
}

TEST(ProcessorTuning, OtherFamiliesAndNarrowerVariantsKeepTheirKernels) {
    const KernelTables below = TablesOf(&Below, 128);
    for (const auto& [family, bits] : {std::make_pair(ProcessorFamily{true, 26}, 512u),
                                       std::make_pair(ProcessorFamily{false, 25}, 512u),
                                       std::make_pair(ProcessorFamily{true, 25}, 256u),
                                       std::make_pair(ProcessorFamily{}, 512u)}) {
        KernelTables tables = TablesOf(&Compiled, bits);
        TuneForFamily(tables, below, family);
        EXPECT_EQ(CountOf(tables, &Below), 0) << family.family << " " << bits;
    }
}

#if defined(__x86_64__) && defined(__linux__)
// The value of the first "<key>\t: value" line of /proc/cpuinfo, or "" without one.
std::string CpuInfo(const std::string& key) {
    std::ifstream info("/proc/cpuinfo");
    for (std::string line; std::getline(info, line);) {
        if (line.rfind(key, 0) == 0 && line.find(':') != std::string::npos) {
            return line.substr(line.find(':') + 2);
        }
    }
    return "";
}

TEST(ProcessorTuning, ReadsTheFamilyTheSystemReports) {
    const std::string vendor = CpuInfo("vendor_id");
    const std::string family = CpuInfo("cpu family");
    const ProcessorFamily found = kora::kubo::detail::ThisProcessorFamily();
    if (family.empty() || found.amd != (vendor == "AuthenticAMD")) {
        // An emulator such as valgrind answers the processor's questions itself.
        GTEST_SKIP() << "the processor this code sees is not the one the system reports";
    }
    EXPECT_EQ(found.family, std::stoul(family));
}
#endif

}  // namespace
