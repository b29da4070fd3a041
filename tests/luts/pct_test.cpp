#include "vrkframework/basic/kubo/luts/pct.h"

#include <gtest/gtest.h>

#include <limits>
#include <vector>

#include "support/expectfailure.h"

namespace {

using kora::kubo::PCT;
using Colour = PCT::Colour;
using Entries = std::vector<PCT::Entry>;
using Rgb = std::vector<int>;

constexpr char kSource[] = "vrkframework/basic/kubo/luts/pct";
constexpr double kInf = std::numeric_limits<double>::infinity();

Rgb Components(const Colour& colour) { return {colour.r, colour.g, colour.b}; }

TEST(PCT, InterpolatesEachComponentTruncatedAndClampsOutside) {
    const PCT pct(Entries{{0, {0, 0, 0}}, {10, {255, 100, 7}}});
    EXPECT_EQ(Components(pct.GetValue(5)), (Rgb{127, 50, 3}));
    EXPECT_EQ(Components(pct.GetValue(9.99)), (Rgb{254, 99, 6}));
    EXPECT_EQ(Components(pct.GetValue(-1)), (Rgb{0, 0, 0}));
    EXPECT_EQ(Components(pct.GetValue(11)), (Rgb{255, 100, 7}));
    EXPECT_EQ(Components(pct.GetValue(std::numeric_limits<double>::quiet_NaN())), (Rgb{0, 0, 0}));
    // A falling component: signed difference, then truncation toward zero (4.5 gives 4).
    const PCT falling(Entries{{0, {200, 0, 9}}, {10, {100, 0, 0}}});
    EXPECT_EQ(Components(falling.GetValue(5)), (Rgb{150, 0, 4}));
    EXPECT_EQ(Components(falling.GetValue(9.99)), (Rgb{100, 0, 0}));
    // Between -inf and 0 the position is inf / inf = NaN: the upper colour answers.
    const PCT infinite(Entries{{-kInf, {10, 20, 30}}, {0, {40, 50, 60}}});
    EXPECT_EQ(Components(infinite.GetValue(-5)), (Rgb{40, 50, 60}));
    EXPECT_EQ(Components(infinite.GetValue(-kInf)), (Rgb{10, 20, 30}));
}

TEST(PCT, InterpolatesWithinTheGapAroundTheInputOfSortedAndCopiedTables) {
    const PCT unsorted(
        Entries{{30, {0, 90, 255}}, {0, {100, 0, 50}}, {10, {0, 10, 60}}, {20, {200, 50, 70}}});
    const PCT copy = unsorted;
    for (const PCT* pct : {&unsorted, &copy}) {
        EXPECT_EQ(Components(pct->GetValue(2.5)), (Rgb{75, 2, 52}));
        EXPECT_EQ(Components(pct->GetValue(15)), (Rgb{100, 30, 65}));
        EXPECT_EQ(Components(pct->GetValue(27.5)), (Rgb{50, 80, 208}));
    }
    std::vector<Colour> colours(256, Colour{0, 0, 0});
    colours[200] = {10, 20, 30};
    EXPECT_EQ(Components(PCT(colours).GetValue(199.5)), (Rgb{5, 10, 15}));
    EXPECT_EQ(Components(PCT(colours).GetValue(200.5)), (Rgb{5, 10, 15}));
}

TEST(PCT, SharesTheLookupRulesForEqualInputsAndOrder) {
    const PCT direct(Entries{{1, {1, 1, 1}}, {1, {2, 2, 2}}, {2, {4, 4, 4}}});
    EXPECT_EQ(Components(direct.GetValue(1)), (Rgb{2, 2, 2}));
    const PCT searched(
        Entries{{-1, {0, 0, 0}}, {0.5, {1, 1, 1}}, {0.5, {3, 3, 3}}, {2, {9, 9, 9}}});
    EXPECT_EQ(Components(searched.GetValue(0.5)), (Rgb{1, 1, 1}));
    const Entries sorted = PCT(Entries{{5, {1, 2, 3}}, {0, {4, 5, 6}}}).GetEntries();
    EXPECT_EQ(sorted[0].first, 0);
    EXPECT_EQ(Components(sorted[0].second), (Rgb{4, 5, 6}));
}

TEST(PCT, ClassicTablesFromColoursOrPlanes) {
    std::vector<unsigned char> planes(768);
    std::vector<Colour> colours(256);
    for (unsigned int i = 0; i < 768; ++i) {
        planes[i] = static_cast<unsigned char>(i * 7 % 251);
    }
    for (unsigned int i = 0; i < 256; ++i) {
        colours[i] = {planes[i], planes[256 + i], planes[512 + i]};
    }
    const PCT fromPlanes(planes.data());
    const PCT fromColours(colours);
    EXPECT_EQ(Components(fromPlanes.GetValueByIndex(3)),
              (Rgb{planes[3], planes[259], planes[515]}));
    for (unsigned int i = 0; i < 256; ++i) {
        EXPECT_EQ(fromColours.GetEntries()[i].first, i);
        EXPECT_EQ(Components(fromColours.GetValue(i)), Components(fromPlanes.GetValue(i))) << i;
    }
    EXPECT_EQ(Components(fromPlanes.GetValueByIndex(999)), Components(colours[255]));
    double range[2] = {1, 0};
    fromPlanes.GetInputValueRange(range[0], range[1]);
    EXPECT_EQ(std::vector<double>(range, range + 2), (std::vector<double>{0, 255}));
    EXPECT_EQ(fromPlanes.GetEntryCount(), 256u);
}

TEST(PCT, ClassicNeeds256InputsFrom0To255WhateverTheColours) {
    Entries entries;
    for (int i = 0; i < 256; ++i) {
        entries.push_back({static_cast<double>(i), {255, 0, 0}});
    }
    EXPECT_TRUE(IsClassicPCT(PCT(entries)));
    entries.back().first = 256;
    EXPECT_FALSE(IsClassicPCT(PCT(entries)));
    entries.pop_back();
    EXPECT_FALSE(IsClassicPCT(PCT(entries)));
}

TEST(PCT, ThrowsOnAColourVectorOfAnotherSizeOrFewerThanTwoEntries) {
    const auto colours =
        kubo_test::Catch<kora::DataException>([] { PCT(std::vector<Colour>(10)); });
    ASSERT_TRUE(colours);
    kubo_test::ExpectReport(*colours, "PCT must have 256 entries, 10 given.", kSource,
                            "__cdecl kora::kubo::PCT::PCT(const class std::vector<struct "
                            "kora::kubo::RGBTuple<unsigned char>,class std::allocator<struct "
                            "kora::kubo::RGBTuple<unsigned char> > > &)",
                            54);
    const auto entries = kubo_test::Catch<kora::ParameterException>([] {
        PCT(Entries{{0, {1, 2, 3}}});
    });
    ASSERT_TRUE(entries);
    EXPECT_EQ(entries->GetParameterName(), "PCT");
    EXPECT_EQ(static_cast<int>(entries->GetType()), 8);
    EXPECT_EQ(entries->GetReceived(), "A 1 PCT entries");
    EXPECT_EQ(entries->GetExpected(), "At least 2 PCT entries");
    kubo_test::ExpectReport(
        *entries, "desc", kSource,
        "__cdecl kora::kubo::PCT::PCT(const class std::vector<struct std::pair<double,struct "
        "kora::kubo::RGBTuple<unsigned char> >,class std::allocator<struct "
        "std::pair<double,struct kora::kubo::RGBTuple<unsigned char> > > > &)",
        80);
}

TEST(PCT, ATableFromANullBytePointerIsRefused) {
    const auto failure = kubo_test::Catch<kora::DataException>(
        [] { PCT(static_cast<const unsigned char*>(nullptr)); });
    ASSERT_TRUE(failure);
    kubo_test::ExpectReport(*failure, "The table bytes are NULL.", kSource,
                            "__cdecl kora::kubo::PCT::PCT(const unsigned char *)", 0);
}

}  // namespace
