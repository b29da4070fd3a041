#include "vrkframework/basic/kubo/luts/lut.h"

#include <gtest/gtest.h>

#include <algorithm>  // std::sort
#include <cmath>
#include <limits>
#include <random>
#include <string>
#include <vector>

#include "support/expectfailure.h"

namespace {

using kora::kubo::LUT;
using Entries = std::vector<LUT::Entry>;

constexpr char kSource[] = "vrkframework/basic/kubo/luts/lut";
constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();
constexpr double kInf = std::numeric_limits<double>::infinity();

std::vector<unsigned char> Bytes() {
    std::vector<unsigned char> bytes(256);
    for (unsigned int i = 0; i < 256; ++i) {
        bytes[i] = static_cast<unsigned char>((i * 37 + 11) % 256);
    }
    return bytes;
}

TEST(LUT, InterpolatesBetweenAndClampsOutsideTheBreakpoints) {
    const LUT lut(Entries{{0, 0}, {10, 100}});
    // 1e300 lies outside the 64-bit range, so it has no direct index.
    const double cases[][2] = {{5, 50},     {2.5, 25},  {-3, 0},      {12, 100}, {10, 100},
                               {kInf, 100}, {-kInf, 0}, {1e300, 100}, {kNaN, 0}};
    for (const auto& c : cases) {
        EXPECT_EQ(lut.GetValue(c[0]), c[1]) << c[0];
    }
    const LUT uneven(Entries{{0.1, 1.0 / 3}, {0.7, 2.9}, {5, -4}});
    EXPECT_EQ(uneven.GetValue(0.3), (0.3 - 0.1) / (0.7 - 0.1) * (2.9 - 1.0 / 3) + 1.0 / 3);
}

TEST(LUT, ByteTablesMapWholeInputsDirectlyAndInterpolateBetween) {
    const std::vector<unsigned char> bytes = Bytes();
    const LUT fromVector(bytes);
    LUT fromPointer(bytes.data());
    Entries entries{{0, 0}};
    fromVector.GetEntries(entries);
    ASSERT_EQ(fromVector.GetEntryCount(), 256u);
    EXPECT_EQ(fromPointer.GetEntries(), entries);
    for (unsigned int i = 0; i < 256; ++i) {
        EXPECT_EQ(entries[i], LUT::Entry(i, bytes[i]));
        EXPECT_EQ(fromPointer.GetValue(i), bytes[i]) << i;
        EXPECT_EQ(fromPointer.GetValueByIndex(i), bytes[i]) << i;
    }
    EXPECT_EQ(fromPointer.GetValueByIndex(1ull << 40), bytes[255]);  // past the end: the last
    EXPECT_EQ(fromPointer.GetValue(7.5), 0.5 * (bytes[8] - bytes[7]) + bytes[7]);
    double range[2] = {};
    fromVector.GetInputValueRange(range[0], range[1]);
    EXPECT_EQ(std::vector<double>(range, range + 2), (std::vector<double>{0, 255}));
    const LUT moved(std::move(fromPointer));
    EXPECT_EQ(fromPointer.GetEntryCount(), 256u);  // NOLINT(bugprone-use-after-move): copies
    EXPECT_EQ(moved.GetEntries(), entries);
}

TEST(LUT, EqualInputsAnswerWithTheDirectIndexElseTheFirstOfThem) {
    // 1 truncates to index 1, whose input is 1: that entry answers, not the first 1.
    const LUT direct(Entries{{1, 5}, {1, 7}, {2, 9}});
    EXPECT_EQ(direct.GetValue(1), 7);
    EXPECT_EQ(direct.GetValue(1.5), 8);
    // 0.5 indexes entry 0 (input -1), so the search answers with the first 0.5.
    const LUT searched(Entries{{-1, 0}, {0.5, 1}, {0.5, 3}, {2, 5}});
    EXPECT_EQ(searched.GetValue(0.5), 1);
    EXPECT_EQ(searched.GetValue(1), (1 - 0.5) / (2 - 0.5) * (5 - 3) + 3);
    // 2^32 + 1 keeps the low 32 bits of its truncation: index 1.
    const double big = 4294967297.0;
    EXPECT_EQ(LUT(Entries{{big, 10}, {big, 20}, {big, 30}}).GetValue(big), 20);
}

// Index of the first entry whose input is not below `x`, walking from the start.
std::size_t FirstNotBelow(const Entries& entries, double x) {
    std::size_t j = 0;
    while (j < entries.size() && entries[j].first < x) {
        ++j;
    }
    return j;
}

TEST(LUT, SearchesTheFirstBreakpointNotBelowTheInputAtEveryTableSize) {
    // Outputs are the indices, inputs quarters with repeats (odd sizes end in NaN) and the
    // inputs looked up odd eighths, which no direct index serves: an output shows the bracket.
    std::mt19937 random(5);
    std::uniform_int_distribution<int> quarters(-60, 60);
    for (std::size_t size : {2u, 15u, 16u, 17u, 33u, 255u, 256u, 257u, 600u}) {
        Entries entries;
        for (std::size_t i = 0; i < size; ++i) {
            entries.emplace_back(quarters(random) / 4.0, 0);
        }
        std::sort(entries.begin(), entries.end());
        entries.back().first = size % 2 == 1 ? kNaN : entries.back().first;
        for (std::size_t i = 0; i < size; ++i) {
            entries[i].second = static_cast<double>(i);
        }
        const LUT lut(entries);
        for (int eighths = -8 * 16 + 1; eighths < 8 * 16; eighths += 2) {
            const double x = eighths / 8.0;
            const std::size_t j = FirstNotBelow(entries, x);
            const auto bracket = static_cast<double>(j);
            const double value = lut.GetValue(x);
            if (j == 0 || j == size) {
                EXPECT_EQ(value, j == 0 ? 0 : bracket - 1) << size << " " << x;
            } else if (!std::isnan(entries[j].first)) {
                EXPECT_GT(value, bracket - 1) << size << " " << x;
                EXPECT_LT(value, bracket) << size << " " << x;
            }
        }
        for (const LUT::Entry& entry : entries) {
            if (entry.first != std::trunc(entry.first)) {  // no direct index
                EXPECT_EQ(lut.GetValue(entry.first),
                          static_cast<double>(FirstNotBelow(entries, entry.first)));
            }
        }
    }
    // A NaN among numbers stays where it was given; the halving search lands on entry 0 for
    // 0.5, where a count of the inputs below would land on the NaN.
    const LUT unordered(Entries{{1, 10}, {kNaN, 20}, {0, 30}});
    EXPECT_EQ(unordered.GetValue(0.5), 10);
}

TEST(LUT, SortsOnlyWhenANeighbourPairIsOutOfOrderNaNLast) {
    EXPECT_EQ(LUT(Entries{{5, 1}, {0, 0}}).GetEntries(), (Entries{{0, 0}, {5, 1}}));
    // In order already: kept as given, which an (unstable) sort of 40 equal inputs is not.
    Entries equal;
    Entries mixed;
    for (int i = 0; i < 100; ++i) {
        equal.emplace_back(1, i);
        mixed.emplace_back(i % 7 == 0 ? kNaN : 100.0 - i, i);  // 15 NaN, descending numbers
    }
    equal.resize(40);
    EXPECT_EQ(LUT(equal).GetEntries(), equal);
    const Entries sorted = LUT(mixed).GetEntries();
    for (std::size_t i = 1; i < sorted.size(); ++i) {
        EXPECT_EQ(std::isnan(sorted[i].first), i >= 85) << i;
        EXPECT_FALSE(sorted[i].first <= sorted[i - 1].first) << i;  // ascending
    }
}

TEST(LUT, ClassicTablesHave256WholeByteOutputsAtInputs0To255) {
    EXPECT_TRUE(IsClassicLUT(LUT(Bytes())));
    Entries entries;
    for (int i = 0; i < 256; ++i) {
        entries.emplace_back(i, 255 - i);
    }
    for (double output : {255.5, 256.0, -1.0, kNaN}) {
        Entries changed = entries;
        changed[100].second = output;
        EXPECT_FALSE(IsClassicLUT(LUT(changed))) << output;
    }
    entries.back().first = 256;
    EXPECT_FALSE(IsClassicLUT(LUT(entries)));
    entries.pop_back();
    EXPECT_FALSE(IsClassicLUT(LUT(entries)));
}

TEST(LUT, ThrowsOnA256ByteVectorOfAnotherSizeOrFewerThanTwoEntries) {
    for (std::size_t size : {255u, 257u}) {
        const auto failure =
            kubo_test::Catch<kora::DataException>([&] { LUT(std::vector<unsigned char>(size)); });
        ASSERT_TRUE(failure);
        kubo_test::ExpectReport(
            *failure, ("LUT must have 256 entries, " + std::to_string(size) + " given.").c_str(),
            kSource,
            "__cdecl kora::kubo::LUT::LUT(const class std::vector<unsigned char,class "
            "std::allocator<unsigned char> > &)",
            50);
    }
    for (std::size_t size : {1u, 0u}) {
        const auto failure = kubo_test::Catch<kora::ParameterException>([&] {
            LUT(Entries(size, {1, 1}));
        });
        ASSERT_TRUE(failure);
        EXPECT_EQ(failure->GetParameterName(), "LUT");
        EXPECT_EQ(static_cast<int>(failure->GetType()), 8);
        EXPECT_EQ(failure->GetReceived(), "A " + std::to_string(size) + " LUT entries");
        EXPECT_EQ(failure->GetExpected(), "At least 2 LUT entries");
        kubo_test::ExpectReport(
            *failure, "desc", kSource,
            "__cdecl kora::kubo::LUT::LUT(const class std::vector<struct "
            "std::pair<double,double>,class std::allocator<struct std::pair<double,double> > > &)",
            80);
    }
}

TEST(LUT, ATableFromANullBytePointerIsRefused) {
    const auto lut = kubo_test::Catch<kora::DataException>(
        [] { LUT(static_cast<const unsigned char*>(nullptr)); });
    ASSERT_TRUE(lut);
    kubo_test::ExpectReport(*lut, "The table bytes are NULL.", kSource,
                            "__cdecl kora::kubo::LUT::LUT(const unsigned char *)", 0);
}

}  // namespace
