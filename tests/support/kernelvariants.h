// Tests run once per kernel variant: registered as <Suite>.<Case>/<variant>, skipped with a
// reason where the processor lacks the variant, run with it forced otherwise. A program
// that runs whole (no test filter) fails when a variant the processor runs ran no test.
#ifndef KUBO_TESTS_SUPPORT_KERNELVARIANTS_H
#define KUBO_TESTS_SUPPORT_KERNELVARIANTS_H

#include <gtest/gtest.h>

#include <cstdio>
#include <functional>
#include <set>
#include <string>
#include <utility>

#include "vrkframework/basic/core/kernels/kernelvariants.h"

namespace kubo_test {

using kora::kubo::detail::KernelVariant;

/// Forces a kernel variant for its lifetime, then restores the one in use before.
class ScopedKernelVariant {
public:
    explicit ScopedKernelVariant(KernelVariant variant)
        : m_previous(kora::kubo::detail::ActiveKernelVariant()) {
        kora::kubo::detail::ForceKernelVariant(variant);
    }
    ScopedKernelVariant(const ScopedKernelVariant&) = delete;
    ScopedKernelVariant& operator=(const ScopedKernelVariant&) = delete;
    ~ScopedKernelVariant() { kora::kubo::detail::ForceKernelVariant(m_previous); }

private:
    KernelVariant m_previous;
};

/// The variants that ran a test in this program, and the check of them at its end.
class VariantCoverage : public testing::Environment {
public:
    static std::set<KernelVariant>& Ran() {
        static std::set<KernelVariant> ran;
        return ran;
    }

    void TearDown() override {
        std::string ran;
        std::string missing;
        for (KernelVariant variant = 0; variant < kora::kubo::detail::kKernelVariantCount;
             ++variant) {
            const std::string name = kora::kubo::detail::KernelVariantName(variant);
            if (Ran().count(variant) != 0) {
                ran += " " + name;
            } else if (kora::kubo::detail::IsKernelVariantSupported(variant)) {
                missing += " " + name;
            }
        }
        std::printf("kernel variants run:%s\n", ran.empty() ? " none" : ran.c_str());
        // A filtered run chooses its tests; a whole one must cover every variant it can.
        if (testing::GTEST_FLAG(filter) == "*" && !missing.empty()) {
            ADD_FAILURE() << "supported kernel variants that ran no test:" << missing;
        }
    }
};

inline const bool kVariantCoverageRegistered =
    (testing::AddGlobalTestEnvironment(new VariantCoverage), true);

/// A test case as a body that runs under the forced variant.
class VariantTest : public testing::Test {
public:
    VariantTest(KernelVariant variant, std::function<void()> body)
        : m_variant(variant), m_body(std::move(body)) {}

    void TestBody() override {
        if (!kora::kubo::detail::IsKernelVariantSupported(m_variant)) {
            GTEST_SKIP() << "this processor does not run the "
                         << kora::kubo::detail::KernelVariantName(m_variant) << " kernels";
        }
        const ScopedKernelVariant forced(m_variant);
        VariantCoverage::Ran().insert(m_variant);
        m_body();
    }

private:
    KernelVariant m_variant;
    std::function<void()> m_body;
};

/// Registers `body` as the tests <suite>.<name>/<variant>, one per variant of the build.
inline void RegisterPerVariant(const char* suite, const std::string& name,
                               const std::function<void()>& body, const char* file, int line) {
    for (KernelVariant variant = 0; variant < kora::kubo::detail::kKernelVariantCount; ++variant) {
        const std::string test = name + "/" + kora::kubo::detail::KernelVariantName(variant);
        testing::RegisterTest(
            suite, test.c_str(), nullptr, nullptr, file, line,
            [variant, body]() -> testing::Test* { return new VariantTest(variant, body); });
    }
}

}  // namespace kubo_test

#endif  // KUBO_TESTS_SUPPORT_KERNELVARIANTS_H
