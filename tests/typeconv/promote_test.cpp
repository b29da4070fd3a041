// The per-value rules of the four conversion families over all 100 pairs of component
// types, in every kernel variant, against a plain reference of the documented rules.
#include "vrkframework/basic/core/typeconv/promote.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <functional>
#include <initializer_list>
#include <limits>
#include <memory>
#include <ostream>
#include <random>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include "support/datatypes.h"
#include "support/expectfailure.h"
#include "support/kernelvariants.h"
#include "support/promotereference.h"
#include "vrkframework/basic/core/typeconv/complex2realpromote.h"
#include "vrkframework/basic/core/typeconv/complexpromote.h"
#include "vrkframework/basic/core/typeconv/conversionkernels.h"
#include "vrkframework/basic/core/typeconv/packedpromote.h"
#include "vrkframework/basic/core/typeconv/real2complexpromote.h"

namespace {

using typeconv::SampleLayout;

using kubo_test::Expected;
using kubo_test::High;
using kubo_test::Low;
using kubo_test::SameValue;

// ------------------------------------------------------------------ inputs

// Boundary values of every destination, halves around them, specials, then random
// bit patterns; those A cannot hold are skipped.
template <class A>
std::vector<A> Inputs() {
    std::vector<A> values;
    const long double edges[] = {0x1p7L,  0x1p8L,  0x1p15L, 0x1p16L, 0x1p31L, 0x1p32L,
                                 0x1p53L, 0x1p63L, 0x1p64L, 200,     1000,    2,
                                 1,       0x1p23L, 0x1p24L, 0x1p52L};
    std::vector<long double> candidates = {0, 0.5L, 0.4L, 0.6L, 1.5L, 2.5L, 126.6L, 254.5L};
    for (long double edge : edges) {
        for (long double delta : {-2.0L, -1.0L, -0.5L, -0.25L, 0.0L, 0.25L, 0.5L, 1.0L}) {
            candidates.push_back(edge + delta);
        }
    }
    for (long double candidate : std::vector<long double>(candidates)) {
        candidates.push_back(-candidate);
    }
    for (long double candidate : candidates) {
        if (candidate >= Low<A>() && candidate <= High<A>()) {
            values.push_back(static_cast<A>(candidate));
        }
    }
    values.push_back(std::numeric_limits<A>::max());
    values.push_back(std::numeric_limits<A>::lowest());
    if constexpr (std::is_floating_point_v<A>) {
        for (A special :
             {std::numeric_limits<A>::infinity(), std::numeric_limits<A>::quiet_NaN(),
              std::numeric_limits<A>::denorm_min(), A(0.49999997f), A(8388609.0f), A(-8388609.0f),
              A(2147483520.0f), A(4294967040.0f), A(1e30f), std::numeric_limits<A>::min()}) {
            values.push_back(special);
            values.push_back(-special);
        }
        if constexpr (std::is_same_v<A, double>) {
            for (double special : {2147483646.5, 4294967294.5, 9223372036854774784.0,
                                   18446744073709549568.0, 3.5e38, 1e300}) {
                values.push_back(special);
                values.push_back(-special);
            }
        }
    }
    std::mt19937_64 random(20240611u);
    for (int i = 0; i < 600; ++i) {
        const std::uint64_t bits = random();
        A value;
        std::memcpy(&value, &bits, sizeof value);
        values.push_back(value);
        // Random integers of every width, so narrow values reach wide sources too.
        const long double narrow =
            static_cast<long double>(static_cast<std::int64_t>(bits) >> (i % 64));
        if (narrow >= Low<A>() && narrow <= High<A>()) {
            values.push_back(static_cast<A>(narrow));
        }
    }
    return values;
}

// ------------------------------------------------------------------ checking

template <class T>
std::string Show(T value) {
    if constexpr (std::is_floating_point_v<T>) {
        char text[64];
        std::snprintf(text, sizeof text, "%.17g", static_cast<double>(value));
        return text;
    } else if constexpr (std::is_signed_v<T>) {
        return std::to_string(static_cast<long long>(value));
    } else {
        return std::to_string(static_cast<unsigned long long>(value));
    }
}

constexpr unsigned char kSentinel = 0xA5;
constexpr std::size_t kGuard = 32;
const std::size_t kLengths[] = {0, 1, 7, 8, 9, 17, 1003};
const SampleLayout kLayouts[] = {SampleLayout::kReal, SampleLayout::kComplex,
                                 SampleLayout::kRealToComplex, SampleLayout::kComplexToReal};

/// Compares one converted value with the reference: empty when equal, else a description.
template <class A, class B>
std::string Mismatch(const unsigned char* in, const unsigned char* out) {
    A x;
    B actual;
    std::memcpy(&x, in, sizeof x);
    std::memcpy(&actual, out, sizeof actual);
    const B expected = Expected<B>(x);
    if (SameValue(actual, expected)) {
        return {};
    }
    return Show(x) + " gave " + Show(actual) + ", expected " + Show(expected);
}

template <class A>
std::vector<unsigned char> InputBytes() {
    const std::vector<A> values = Inputs<A>();
    std::vector<unsigned char> bytes(values.size() * sizeof(A));
    std::memcpy(bytes.data(), values.data(), bytes.size());
    return bytes;
}

template <class A, class B>
std::unique_ptr<typeconv::IPromote> NewFamily(SampleLayout layout) {
    switch (layout) {
        case SampleLayout::kReal:
            return std::make_unique<typeconv::Promote<A, B>>();
        case SampleLayout::kComplex:
            return std::make_unique<typeconv::ComplexPromote<A, B>>();
        case SampleLayout::kRealToComplex:
            return std::make_unique<typeconv::Real2ComplexPromote<A, B>>();
        case SampleLayout::kComplexToReal:
            break;
    }
    return std::make_unique<typeconv::Complex2RealPromote<A, B>>();
}

/// What the checks need of a pair; only these few functions are instantiated per pair.
struct Pair {
    std::string name;
    std::size_t from;
    std::size_t to;
    std::size_t fromSize;
    std::size_t toSize;
    std::vector<unsigned char> (*inputs)();
    std::string (*mismatch)(const unsigned char* in, const unsigned char* out);
    std::unique_ptr<typeconv::IPromote> (*newFamily)(SampleLayout layout);
};

using Run = std::function<void(const void* src, void* dst, std::size_t count)>;

/// Runs one family over `count` samples of the input values (cycled) and checks every
/// value, the zero imaginary parts and the guard bytes after the output.
void CheckFamily(const Pair& pair, SampleLayout layout, const std::vector<unsigned char>& values,
                 std::size_t count, const Run& run, const std::string& where) {
    const bool complexIn =
        layout == SampleLayout::kComplex || layout == SampleLayout::kComplexToReal;
    const bool complexOut =
        layout == SampleLayout::kComplex || layout == SampleLayout::kRealToComplex;
    const std::size_t valueCount = values.size() / pair.fromSize;
    std::vector<unsigned char> input((complexIn ? 2 : 1) * count * pair.fromSize);
    for (std::size_t i = 0; i < input.size() / pair.fromSize; ++i) {
        std::memcpy(input.data() + i * pair.fromSize,
                    values.data() + (i * 7 + count) % valueCount * pair.fromSize, pair.fromSize);
    }
    const std::size_t outBytes = (complexOut ? 2 : 1) * count * pair.toSize;
    std::vector<unsigned char> output(outBytes + kGuard, kSentinel);
    run(input.data(), output.data(), count);
    ASSERT_EQ(std::vector<unsigned char>(output.begin() + static_cast<std::ptrdiff_t>(outBytes),
                                         output.end()),
              std::vector<unsigned char>(kGuard, kSentinel))
        << where << ", count " << count;
    const std::vector<unsigned char> zero(pair.toSize, 0);
    for (std::size_t i = 0; i < count; ++i) {
        const unsigned char* in = input.data() + (complexIn ? 2 : 1) * i * pair.fromSize;
        const unsigned char* out = output.data() + (complexOut ? 2 : 1) * i * pair.toSize;
        const std::string real = pair.mismatch(in, out);
        ASSERT_TRUE(real.empty()) << where << ", count " << count << ", sample " << i << ": "
                                  << real;
        if (layout == SampleLayout::kComplex) {
            const std::string imaginary = pair.mismatch(in + pair.fromSize, out + pair.toSize);
            ASSERT_TRUE(imaginary.empty()) << where << ", imaginary part: " << imaginary;
        } else if (layout == SampleLayout::kRealToComplex) {
            ASSERT_EQ(std::memcmp(out + pair.toSize, zero.data(), pair.toSize), 0)
                << where << ", imaginary part";
        }
    }
}

void CheckPair(const Pair& pair) {
    const std::vector<unsigned char> values = pair.inputs();
    for (SampleLayout layout : kLayouts) {
        const std::string family = "layout " + std::to_string(static_cast<int>(layout));
        // The kernels of the variant in use, over all the values at once and the lengths
        // that reach vector bodies and tails; 2500 samples cross the real to complex blocks.
        const typeconv::detail::KernelSet& kernels = typeconv::detail::ActiveKernels();
        const Run run = [&](const void* src, void* dst, std::size_t count) {
            typeconv::detail::RunPromote(kernels, layout, pair.from, pair.to, src, dst, count);
        };
        CheckFamily(pair, layout, values, values.size() / pair.fromSize, run, family);
        CheckFamily(pair, layout, values, 2500, run, family);
        // Blocks copied out past the caches, as outputs of kCopyOutBytes and more are.
        const Run copiedOut = [&](const void* src, void* dst, std::size_t count) {
            typeconv::detail::RunPromoteInBlocks(kernels, layout, pair.from, pair.to, src, dst,
                                                 count, true);
        };
        CheckFamily(pair, layout, values, 2500, copiedOut, family + ", copied out");
        for (std::size_t count : kLengths) {
            CheckFamily(pair, layout, values, count, run, family);
        }
        // The class, through its interface.
        const std::unique_ptr<typeconv::IPromote> promote = pair.newFamily(layout);
        EXPECT_EQ(promote->GetInputBits(), pair.fromSize * 8);
        EXPECT_EQ(promote->GetOutputBits(), pair.toSize * 8);
        const Run throughClass = [&](const void* src, void* dst, std::size_t count) {
            promote->Promote(src, dst, static_cast<unsigned int>(count));
        };
        for (std::size_t count : kLengths) {
            CheckFamily(pair, layout, values, count, throughClass, family + ", class");
        }
    }
}

// ------------------------------------------------------------------ the 100 pairs

template <class A, class B>
Pair MakePair() {
    return {kubo_test::TypeName<A>() + "_" + kubo_test::TypeName<B>(),
            typeconv::detail::ComponentIndexOf<A>(),
            typeconv::detail::ComponentIndexOf<B>(),
            sizeof(A),
            sizeof(B),
            &InputBytes<A>,
            &Mismatch<A, B>,
            &NewFamily<A, B>};
}

std::vector<Pair> AllPairs() {
    std::vector<Pair> pairs;
#define KUBO_TEST_PAIR(A, B) pairs.push_back(MakePair<A, B>());
    KUBO_FOR_EACH_COMPONENT_PAIR(KUBO_TEST_PAIR)
#undef KUBO_TEST_PAIR
    return pairs;
}

// Promote.<pair>/<variant>: every family of the pair, in each kernel variant.
const bool kPairsRegistered = [] {
    for (const Pair& pair : AllPairs()) {
        kubo_test::RegisterPerVariant(
            "Promote", pair.name, [pair] { CheckPair(pair); }, __FILE__, __LINE__);
    }
    return true;
}();

// The copy out past the caches, per variant: every alignment of the destination and
// lengths short of, across and well past a vector, nothing written around them.
const bool kCopyOutRegistered = [] {
    kubo_test::RegisterPerVariant(
        "CopyOut", "EveryAlignmentAndLength",
        [] {
            const typeconv::detail::CopyOutKernel copyOut =
                typeconv::detail::ActiveKernels().copyOut;
            std::vector<unsigned char> block(700);
            for (std::size_t i = 0; i < block.size(); ++i) {
                block[i] = static_cast<unsigned char>(i * 37 + 11);
            }
            for (std::size_t offset = 0; offset < 64; ++offset) {
                for (std::size_t bytes :
                     {0u, 1u, 15u, 16u, 17u, 63u, 64u, 65u, 127u, 128u, 129u, 300u, 640u}) {
                    std::vector<unsigned char> out(offset + bytes + kGuard, kSentinel);
                    copyOut(block.data(), out.data() + offset, bytes, true);
                    for (std::size_t i = 0; i < out.size(); ++i) {
                        const bool copied = i >= offset && i < offset + bytes;
                        ASSERT_EQ(out[i], copied ? block[i - offset] : kSentinel)
                            << "offset " << offset << ", " << bytes << " bytes, byte " << i;
                    }
                }
            }
        },
        __FILE__, __LINE__);
    return true;
}();

// An output of kCopyOutBytes or more takes the copy out, at a destination off its cache
// line: the same values as the blocks written in place.
TEST(Promote, LargeOutputsAreTheSameCopiedOut) {
    const std::size_t count = typeconv::detail::kCopyOutBytes / sizeof(double) + 37;
    std::vector<short> input(count);
    for (std::size_t i = 0; i < count; ++i) {
        input[i] = static_cast<short>(i * 7919);
    }
    std::vector<double> expected(count);
    typeconv::detail::RunPromoteInBlocks(typeconv::detail::ActiveKernels(), SampleLayout::kReal,
                                         typeconv::detail::ComponentIndexOf<short>(),
                                         typeconv::detail::ComponentIndexOf<double>(), input.data(),
                                         expected.data(), count, false);
    std::vector<double> output(count + 2, -1.0);
    typeconv::Promote<short, double> family;
    typeconv::IPromote& promote = family;
    promote.Promote(input.data(), output.data() + 1, static_cast<unsigned int>(count));
    EXPECT_EQ(output.front(), -1.0);
    EXPECT_EQ(output.back(), -1.0);
    EXPECT_TRUE(std::equal(expected.begin(), expected.end(), output.begin() + 1));
}

// ------------------------------------------------------------------ documented cases

template <class B, class A>
std::vector<B> Converted(typeconv::IPromote&& promote, const std::vector<A>& input,
                         unsigned int count) {
    std::vector<B> output(2 * input.size() + 1, B(77));
    promote.Promote(input.data(), output.data(), count);
    return output;
}

TEST(Promote, DocumentedExamples) {
    EXPECT_EQ((Converted<unsigned char>(typeconv::Promote<char, unsigned char>(),
                                        std::vector<char>{-5, 0, 100}, 3)),
              (std::vector<unsigned char>{0, 0, 100, 77, 77, 77, 77}));
    EXPECT_EQ((Converted<char>(typeconv::Promote<unsigned char, char>(),
                               std::vector<unsigned char>{200}, 1)[0]),
              127);
    const float nan = std::numeric_limits<float>::quiet_NaN();
    EXPECT_EQ((Converted<char>(typeconv::Promote<float, char>(),
                               std::vector<float>{2.5f, -2.5f, 126.6f, -300.0f, nan}, 5)),
              (std::vector<char>{3, -3, 127, -128, 0, 77, 77, 77, 77, 77, 77}));
    EXPECT_EQ((Converted<unsigned char>(typeconv::Promote<float, unsigned char>(),
                                        std::vector<float>{-0.4f, -0.6f, 254.5f}, 3)),
              (std::vector<unsigned char>{0, 0, 255, 77, 77, 77, 77}));
    EXPECT_EQ((Converted<std::int64_t>(typeconv::Promote<double, std::int64_t>(),
                                       std::vector<double>{-1.0, 2.9}, 2)),
              (std::vector<std::int64_t>{0, 2, 77, 77, 77}));
    EXPECT_EQ((Converted<std::int64_t>(typeconv::Promote<int, std::int64_t>(), std::vector<int>{-7},
                                       1)[0]),
              0);
    EXPECT_EQ((Converted<char>(typeconv::Promote<std::int64_t, char>(),
                               std::vector<std::int64_t>{-200, 1000}, 2)),
              (std::vector<char>{56, 127, 77, 77, 77}));
    EXPECT_EQ((Converted<float>(typeconv::Complex2RealPromote<short, float>(),
                                std::vector<short>{3, 4}, 1)),
              (std::vector<float>{3.0f, 77, 77, 77, 77}));
    EXPECT_EQ(
        (Converted<short>(typeconv::Real2ComplexPromote<char, short>(), std::vector<char>{-5}, 1)),
        (std::vector<short>{-5, 0, 77}));
    EXPECT_EQ(
        (Converted<short>(typeconv::ComplexPromote<short, short>(), std::vector<short>{-5, 9}, 0)),
        (std::vector<short>{77, 77, 77, 77, 77}));
}

TEST(Promote, ThresholdsAreComparedInTheSourcePrecision) {
    // float(INT32_MAX) is 2^31: 2147483520.0f (the float below) converts, 2^31 saturates.
    EXPECT_EQ((Converted<int>(typeconv::Promote<float, int>(),
                              std::vector<float>{2147483520.0f, 2147483648.0f}, 2)),
              (std::vector<int>{2147483520, 2147483647, 77, 77, 77}));
    EXPECT_EQ((Converted<int>(typeconv::Promote<double, int>(),
                              std::vector<double>{2147483646.4, 2147483646.5}, 2)),
              (std::vector<int>{2147483646, 2147483647, 77, 77, 77}));
    // y = x + 0.5 is rounded to float: 0.49999997f + 0.5f is 1.0f.
    EXPECT_EQ((Converted<unsigned char>(typeconv::Promote<float, unsigned char>(),
                                        std::vector<float>{0.49999997f}, 1)[0]),
              1);
    EXPECT_EQ((Converted<unsigned char>(typeconv::Promote<double, unsigned char>(),
                                        std::vector<double>{0.49999997}, 1)[0]),
              0);
}

TEST(Promote, NaNAndInfinities) {
    const double nan = std::numeric_limits<double>::quiet_NaN();
    const double inf = std::numeric_limits<double>::infinity();
    EXPECT_EQ(
        (Converted<int>(typeconv::Promote<double, int>(), std::vector<double>{nan, inf, -inf}, 3)),
        (std::vector<int>{INT32_MIN, INT32_MAX, INT32_MIN, 77, 77, 77, 77}));
    EXPECT_EQ((Converted<unsigned int>(typeconv::Promote<double, unsigned int>(),
                                       std::vector<double>{nan, inf}, 2)),
              (std::vector<unsigned int>{0, UINT32_MAX, 77, 77, 77}));
    EXPECT_EQ((Converted<std::int64_t>(typeconv::Promote<double, std::int64_t>(),
                                       std::vector<double>{nan, inf}, 2)),
              (std::vector<std::int64_t>{INT64_MIN, INT64_MAX, 77, 77, 77}));
    EXPECT_EQ((Converted<std::uint64_t>(typeconv::Promote<double, std::uint64_t>(),
                                        std::vector<double>{nan, -inf}, 2)),
              (std::vector<std::uint64_t>{std::uint64_t{1} << 63, 0, 77, 77, 77}));
    const std::vector<float> overflow =
        Converted<float>(typeconv::Promote<double, float>(), std::vector<double>{1e300, -1e300}, 2);
    EXPECT_EQ(overflow[0], std::numeric_limits<float>::infinity());
    EXPECT_EQ(overflow[1], -std::numeric_limits<float>::infinity());
}

// A null source or destination is refused when there are samples to convert, in every
// family and in the packed converters; with none, nothing is touched.
TEST(Promote, NullBuffersAreRefusedWhenThereAreSamples) {
    typeconv::Promote<short, float> real;
    typeconv::ComplexPromote<float, int> complex;
    typeconv::SpecialPromote<12, short, 0> unpack;
    float buffer[4] = {};
    for (typeconv::IPromote* promote :
         std::initializer_list<typeconv::IPromote*>{&real, &complex, &unpack}) {
        for (const auto& buffers : {std::pair<const void*, void*>{nullptr, buffer},
                                    std::pair<const void*, void*>{buffer, nullptr}}) {
            const auto failure = kubo_test::Catch<kora::DataException>(
                [&] { promote->Promote(buffers.first, buffers.second, 1); });
            ASSERT_TRUE(failure.has_value());
            kubo_test::ExpectReport(
                *failure, "A conversion buffer is NULL.",
                "vrkframework/basic/core/typeconv/promote",
                "void __cdecl typeconv::IPromote::Promote(const void *,void *,unsigned int)", 0);
            promote->Promote(buffers.first, buffers.second, 0);
        }
    }
}

}  // namespace
