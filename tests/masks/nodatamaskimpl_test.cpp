// The no-data kernels and their factory. Kernels the factory makes run the library's loops
// (its fastest clone on this machine); copies made here run this program's baseline loops.
#include "vrkframework/basic/kubo/masks/nodatamaskimpl.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <limits>
#include <memory>
#include <string>
#include <typeinfo>
#include <vector>

namespace {

using kora::kubo::BkgdAllChans;
using kora::kubo::BkgdAnyChan;
using kora::kubo::BkgdChanPairs;
using kora::kubo::BkgdRule;
using kora::kubo::DataType;
using kora::kubo::GetMaskDecisionImpl;
using kora::kubo::IMaskDecisionImpl;
using kora::kubo::detail::WiderType;
using Kernel = std::unique_ptr<IMaskDecisionImpl>;

const std::type_info& ClassOf(const IMaskDecisionImpl* kernel) { return typeid(*kernel); }

template <class T>
DataType TypeOf() {
    if constexpr (std::is_floating_point_v<T>) {
        return sizeof(T) == 4 ? DataType::Type32R : DataType::Type64R;
    } else {
        const auto bits = static_cast<unsigned int>(8 * sizeof(T));
        return DataType(bits, std::is_signed_v<T>, false, bits, 0, false);
    }
}

using ElementTypes = ::testing::Types<char, unsigned char, short, unsigned short, int, unsigned int,
                                      float, double, std::int64_t, std::uint64_t>;
struct ElementNames {
    template <class T>
    static std::string GetName(int) {
        if constexpr (std::is_floating_point_v<T>) {
            return sizeof(T) == 4 ? "Float" : "Double";
        } else {
            return std::string(std::is_signed_v<T> ? "Int" : "UInt") +
                   std::to_string(8 * sizeof(T));
        }
    }
};

static_assert(std::is_same_v<WiderType<char>, short> &&
              std::is_same_v<WiderType<unsigned char>, unsigned short> &&
              std::is_same_v<WiderType<short>, int> &&
              std::is_same_v<WiderType<unsigned short>, unsigned int> &&
              std::is_same_v<WiderType<int>, std::int64_t> &&
              std::is_same_v<WiderType<unsigned int>, std::uint64_t> &&
              std::is_same_v<WiderType<float>, double> &&
              std::is_same_v<WiderType<std::int64_t>, OneMoreBit<std::int64_t>> &&
              std::is_same_v<WiderType<std::uint64_t>, OneMoreBit<std::uint64_t>> &&
              std::is_same_v<WiderType<double>, OneMoreBit<double>>);

// One channel as the definitions see it: whether it is tested, and its no-data value.
struct Channel {
    bool tested;
    double value;
};

// The flag of one pixel, straight from the rule definitions.
template <class T>
unsigned char Reference(BkgdRule rule, const T* pixel, const std::vector<Channel>& channels) {
    const auto matches = [&](std::size_t k) {
        return channels[k].tested && pixel[k] == static_cast<T>(channels[k].value);
    };
    bool background = false;
    if (rule == BkgdAllChans) {
        background = true;
        for (std::size_t k = 0; k < channels.size(); ++k) {
            background = background && (!channels[k].tested || matches(k));
        }
    } else if (rule == BkgdAnyChan) {
        for (std::size_t k = 0; k < channels.size(); ++k) {
            background = background || matches(k);
        }
    } else {
        for (std::size_t k = 0; k + 1 < channels.size(); k += 2) {
            background = background || (matches(k) && matches(k + 1));
        }
    }
    return background ? 0 : 1;
}

// Every combination of matching and differing samples, repeated to 1003 pixels so that
// vector bodies and tails both run; checks the flags and that nothing past them is written.
template <class T>
void ExpectFlags(IMaskDecisionImpl& kernel, BkgdRule rule, const std::vector<Channel>& channels) {
    const std::size_t stride = channels.size();
    const std::size_t count = 1003;
    std::vector<T> samples(count * stride);
    for (std::size_t i = 0; i < count; ++i) {
        const std::size_t pattern = (i * 37) % (std::size_t{1} << stride);
        for (std::size_t k = 0; k < stride; ++k) {
            const bool hit = (pattern >> k) & 1;
            samples[i * stride + k] = static_cast<T>(channels[k].value + (hit ? 0 : 20));
        }
    }
    std::vector<unsigned char> flags(count + 16, 0xab);
    kernel.Evaluate(samples.data(), flags.data(), count);
    for (std::size_t i = 0; i < count; ++i) {
        ASSERT_EQ(flags[i], Reference(rule, &samples[i * stride], channels)) << "pixel " << i;
    }
    for (std::size_t i = count; i < flags.size(); ++i) {
        ASSERT_EQ(flags[i], 0xab) << "written past the end";
    }
    flags.assign(flags.size(), 0xab);
    kernel.Evaluate(samples.data(), flags.data(), 0);
    EXPECT_EQ(flags[0], 0xab);
}

// The factory's kernel must be of class K; it, its clone and a copy made here (baseline
// loops) all flag as the definitions say.
template <class K, class T>
void ExpectKernel(IMaskDecisionImpl* made, BkgdRule rule, const std::vector<Channel>& channels) {
    Kernel owned(made);
    auto* kernel = dynamic_cast<K*>(made);
    ASSERT_NE(kernel, nullptr) << ClassOf(made).name();
    ExpectFlags<T>(*made, rule, channels);
    Kernel clone(made->Clone());
    EXPECT_EQ(ClassOf(clone.get()), ClassOf(made));
    ExpectFlags<T>(*clone, rule, channels);
    K baseline(*kernel);
    ExpectFlags<T>(baseline, rule, channels);
}

template <class T>
class NoDataKernels : public ::testing::Test {};
TYPED_TEST_SUITE(NoDataKernels, ElementTypes, ElementNames);

template <class T, BkgdRule Rule>
void SweepStrides() {
    using Listed = DiffNoDataMaskImpl<T, 1, WiderType<T>, Rule>;
    using ByPosition = DiffNoDataMaskImpl<T, 0, WiderType<T>, Rule>;
    for (unsigned int c = 1; c <= 6; ++c) {
        SCOPED_TRACE("channels " + std::to_string(c) + ", rule " + std::to_string(Rule));
        std::vector<unsigned int> all(c);
        std::vector<Channel> same(c);
        std::vector<Channel> different(c);
        std::vector<double> differentValues(c);
        for (unsigned int k = 0; k < c; ++k) {
            all[k] = k + 1;
            same[k] = {true, 7};
            different[k] = {true, 10.0 + k};
            differentValues[k] = different[k].value;
        }
        const DataType type = TypeOf<T>();
        if (c == 1) {
            ExpectKernel<SingleChannelNoDataMaskImpl<T>, T>(
                GetMaskDecisionImpl(type, 1, Rule, {7}, {1}), BkgdAnyChan, same);
            continue;
        }
        ExpectKernel<SameNoDataMaskImpl<T, Rule>, T>(
            GetMaskDecisionImpl(type, c, Rule, std::vector<double>(c, 7), all), Rule, same);
        ExpectKernel<ByPosition, T>(GetMaskDecisionImpl(type, c, Rule, differentValues, all), Rule,
                                    different);
        // Listing channel c, and channel 1 unless that would list every channel.
        std::vector<Channel> listed(c, Channel{false, 30});
        listed[c - 1] = {true, 10.0 + c};
        std::vector<unsigned int> numbers{c};
        std::vector<double> values{listed[c - 1].value};
        if (c > 2) {
            listed[0] = {true, 10};
            numbers.push_back(1);
            values.push_back(10);
        }
        ExpectKernel<Listed, T>(GetMaskDecisionImpl(type, c, Rule, values, numbers), Rule, listed);
    }
}

TYPED_TEST(NoDataKernels, EveryRuleStrideAndLayoutFlagsAsDefined) {
    SweepStrides<TypeParam, BkgdAllChans>();
    SweepStrides<TypeParam, BkgdAnyChan>();
    SweepStrides<TypeParam, BkgdChanPairs>();
}

TYPED_TEST(NoDataKernels, AnEmptyChannelListOrNoValueMarksEveryPixelValid) {
    for (const BkgdRule rule : {BkgdAllChans, BkgdAnyChan, BkgdChanPairs, BkgdRule(9)}) {
        for (IMaskDecisionImpl* made :
             {GetMaskDecisionImpl(TypeOf<TypeParam>(), 3, rule, {0, 0}, {}),
              GetMaskDecisionImpl(TypeOf<TypeParam>(), 3, rule, {}, {1})}) {
            const Kernel kernel(made);
            ASSERT_NE(dynamic_cast<DummyNoDataMaskImpl*>(kernel.get()), nullptr);
            unsigned char flags[5] = {0, 0, 0, 0, 0xab};
            kernel->Evaluate(nullptr, flags, 4);
            EXPECT_EQ(std::vector<unsigned char>(flags, flags + 5),
                      (std::vector<unsigned char>{1, 1, 1, 1, 0xab}));
        }
    }
}

TYPED_TEST(NoDataKernels, NanMatchesNoSample) {
    using T = TypeParam;
    if constexpr (std::is_floating_point_v<T>) {
        const double nan = std::numeric_limits<double>::quiet_NaN();
        const T samples[4] = {T(1), std::numeric_limits<T>::quiet_NaN(), T(0), T(0)};
        for (const BkgdRule rule : {BkgdAllChans, BkgdAnyChan, BkgdChanPairs}) {
            for (const auto& values :
                 {std::vector<double>{nan, nan}, std::vector<double>{nan, 0.0}}) {
                Kernel kernel(GetMaskDecisionImpl(TypeOf<T>(), 2, rule, values, {1, 2}));
                unsigned char flags[2] = {};
                kernel->Evaluate(samples, flags, 2);
                // Only a channel compared with 0 can match; alone it never decides the pixel
                // under the all-channels or pair rules.
                const bool anyZeroMatch = rule == BkgdAnyChan && values[1] == 0.0;
                EXPECT_EQ(flags[0], 1);
                EXPECT_EQ(flags[1], anyZeroMatch ? 0 : 1) << rule;
            }
        }
        Kernel single(GetMaskDecisionImpl(TypeOf<T>(), 1, BkgdAllChans, {nan}, {1}));
        unsigned char flag = 0;
        single->Evaluate(&samples[1], &flag, 1);
        EXPECT_EQ(flag, 1);
    }
}

// A half pair (the last sample of an odd stride) decides nothing: it is not paired with the
// next pixel's first sample.
TYPED_TEST(NoDataKernels, ThePairRuleIgnoresTheLastSampleOfAnOddStride) {
    using T = TypeParam;
    const T samples[6] = {T(6), T(5), T(5), T(5), T(5), T(9)};
    for (const auto& values : {std::vector<double>(3, 5.0), std::vector<double>{5, 5, 5.5}}) {
        Kernel kernel(GetMaskDecisionImpl(TypeOf<T>(), 3, BkgdChanPairs, values, {1, 2, 3}));
        unsigned char flags[2] = {};
        kernel->Evaluate(samples, flags, 2);
        EXPECT_EQ(flags[0], 1);
        EXPECT_EQ(flags[1], 0);
    }
}

// Tags 2 (matches nothing) and 3 (matches every sample) are never made by the factory but
// are honoured by the three families that store tagged entries.
template <class T>
unsigned char TaggedFlag(BkgdRule rule, const std::vector<OneMoreBit<T>>& entries,
                         const std::vector<T>& pixel) {
    Kernel kernel;
    if (rule == BkgdAllChans) {
        kernel = std::make_unique<DiffNoDataAllChansMaskImpl<T, 1>>(entries);
    } else if (rule == BkgdAnyChan) {
        kernel = std::make_unique<DiffNoDataAnyChanMaskImpl<T, 1, OneMoreBit<T>>>(entries);
    } else {
        kernel = std::make_unique<DiffNoDataChanPairsMaskImpl<T, 1, OneMoreBit<T>>>(entries);
    }
    unsigned char flag = 9;
    kernel->Evaluate(pixel.data(), &flag, 1);
    return flag;
}

TYPED_TEST(NoDataKernels, TaggedEntriesHonourAllFourTags) {
    using T = TypeParam;
    if constexpr (sizeof(T) == 8) {
        using E = OneMoreBit<T>;
        const E four{T(4), E::kCompared};
        const E none{T(4), E::kMatchesNone};
        const E all{T(0), E::kMatchesAll};
        const E untested{T(4), E::kUntested};
        struct Case {
            BkgdRule rule;
            std::vector<E> entries;
            std::vector<T> pixel;
            unsigned char flag;
        };
        const Case cases[] = {
            {BkgdAllChans, {all, untested}, {9, 9}, 0},
            {BkgdAllChans, {all, none}, {9, 4}, 1},
            {BkgdAllChans, {four, untested}, {4, 9}, 0},
            {BkgdAllChans, {four, untested}, {5, 4}, 1},
            {BkgdAnyChan, {all, untested}, {9, 9}, 0},
            {BkgdAnyChan, {none, untested}, {4, 4}, 1},
            {BkgdAnyChan, {four, none}, {4, 5}, 0},
            {BkgdAnyChan, {four, none}, {5, 4}, 1},
            {BkgdChanPairs, {four, all}, {4, 77}, 0},
            {BkgdChanPairs, {four, all}, {5, 77}, 1},
            {BkgdChanPairs, {none, all}, {4, 77}, 1},
            {BkgdChanPairs, {all, untested}, {4, 4}, 1},
        };
        for (const Case& c : cases) {
            EXPECT_EQ(TaggedFlag<T>(c.rule, c.entries, c.pixel), c.flag)
                << "rule " << c.rule << ", pixel " << c.pixel[0] << " " << c.pixel[1];
        }
    }
}

TEST(GetMaskDecisionImpl, DiffKernelsAreTheReassignedSigned8BitInstances) {
    Kernel any(GetMaskDecisionImpl(DataType::Type16U, 3, BkgdAnyChan, {1}, {2}));
    EXPECT_EQ(ClassOf(any.get()),
              typeid(DiffNoDataAnyChanMaskImpl<char, 1, short>::Reassign<unsigned short>));
    EXPECT_NE(
        (dynamic_cast<DiffNoDataAnyChanMaskImpl<unsigned short, 1, unsigned int>*>(any.get())),
        nullptr);
    Kernel all(GetMaskDecisionImpl(DataType::Type64R, 2, BkgdAllChans, {1, 2}, {1, 2}));
    EXPECT_EQ(ClassOf(all.get()), typeid(DiffNoDataAllChansMaskImpl<char, 0>::Reassign<double>));
    Kernel pairs(GetMaskDecisionImpl(DataType::Type8S, 4, BkgdChanPairs, {1, 2}, {1, 2}));
    EXPECT_EQ(ClassOf(pairs.get()),
              typeid(DiffNoDataChanPairsMaskImpl<char, 1, short>::Reassign<char>));
    Kernel clone(pairs->Clone());
    EXPECT_EQ(ClassOf(clone.get()), ClassOf(pairs.get()));
}

TEST(GetMaskDecisionImpl, UnknownTypesAndRulesYieldNull) {
    for (const DataType& type :
         {DataType::Type1U, DataType(12, false, false, 12, 0, false), DataType(),
          DataType(32, false, true, 23, 8, false), DataType(128, true, false, 128, 0, false)}) {
        EXPECT_EQ(Kernel(GetMaskDecisionImpl(type, 2, BkgdAnyChan, {0, 0}, {1, 2})).get(), nullptr);
    }
    for (const BkgdRule rule : {BkgdRule(3), BkgdRule(-1)}) {
        EXPECT_EQ(Kernel(GetMaskDecisionImpl(DataType::Type8U, 2, rule, {0, 0}, {1, 2})).get(),
                  nullptr);
        // One channel does not consult the rule.
        Kernel single(GetMaskDecisionImpl(DataType::Type8U, 1, rule, {0}, {1}));
        EXPECT_NE(dynamic_cast<SingleChannelNoDataMaskImpl<unsigned char>*>(single.get()), nullptr);
    }
}

TEST(GetMaskDecisionImpl, OneChannelIsTestedAloneWhateverTheListNames) {
    Kernel kernel(GetMaskDecisionImpl(DataType::Type16S, 1, BkgdAllChans, {-3, 8}, {4, 2}));
    auto* single = dynamic_cast<SingleChannelNoDataMaskImpl<short>*>(kernel.get());
    ASSERT_NE(single, nullptr);
    EXPECT_EQ(single->GetNoData(), -3);
}

TEST(GetMaskDecisionImpl, ListedChannelsSkipOutOfRangeNumbersAndLaterEntriesWin) {
    Kernel kernel(
        GetMaskDecisionImpl(DataType::Type8U, 6, BkgdAnyChan, {1, 2, 3, 4, 5}, {6, 0, 2, 7, 6}));
    auto* listed =
        dynamic_cast<DiffNoDataAnyChanMaskImpl<unsigned char, 1, unsigned short>*>(kernel.get());
    ASSERT_NE(listed, nullptr);
    EXPECT_EQ(listed->GetNoData(), (std::vector<unsigned short>{65535, 3, 65535, 65535, 65535, 5}));
}

TEST(GetMaskDecisionImpl, ByPositionTheValueListLengthIsTheStride) {
    Kernel kernel(GetMaskDecisionImpl(DataType::Type32S, 2, BkgdAnyChan, {1, 2, 3}, {9, 9}));
    auto* byPosition = dynamic_cast<DiffNoDataAnyChanMaskImpl<int, 0, std::int64_t>*>(kernel.get());
    ASSERT_NE(byPosition, nullptr);
    EXPECT_EQ(byPosition->GetNoData(), (std::vector<int>{1, 2, 3}));
    const int samples[6] = {5, 5, 3, 5, 5, 5};
    unsigned char flags[2] = {};
    kernel->Evaluate(samples, flags, 2);
    EXPECT_EQ(flags[0], 0);
    EXPECT_EQ(flags[1], 1);
}

TEST(GetMaskDecisionImpl, SameValueKernelsKeepTheValueAndChannelCount) {
    Kernel kernel(
        GetMaskDecisionImpl(DataType::Type32U, 5, BkgdChanPairs, {-2, -2}, {1, 3, 5, 2, 4}));
    auto* same = dynamic_cast<SameNoDataChanPairsMaskImpl<unsigned int>*>(kernel.get());
    ASSERT_NE(same, nullptr);
    EXPECT_EQ(same->GetNoData(), 4294967294u);
    EXPECT_EQ(same->GetChannelCount(), 5u);
}

// Complex samples: two channels each, 0 as imaginary no-data value, pairs for any-channel.
TEST(GetMaskDecisionImpl, ComplexChannelsBecomeRealImaginaryPairs) {
    Kernel kernel(GetMaskDecisionImpl(DataType::TypeC32R, 1, BkgdAnyChan, {3.0}, {1}));
    auto* pairs = dynamic_cast<DiffNoDataChanPairsMaskImpl<float, 0, double>*>(kernel.get());
    ASSERT_NE(pairs, nullptr);
    EXPECT_EQ(pairs->GetNoData(), (std::vector<float>{3.0f, 0.0f}));
    const float samples[6] = {3.0f, 0.0f, 3.0f, 1.0f, 0.0f, 0.0f};
    unsigned char flags[3] = {};
    kernel->Evaluate(samples, flags, 3);
    EXPECT_EQ(std::vector<unsigned char>(flags, flags + 3), (std::vector<unsigned char>{0, 1, 1}));

    Kernel listed(GetMaskDecisionImpl(DataType::TypeC16S, 3, BkgdAllChans, {-5, 2}, {2, 3}));
    auto* all = dynamic_cast<DiffNoDataAllChansMaskImpl<short, 1>*>(listed.get());
    ASSERT_NE(all, nullptr);
    EXPECT_EQ(all->GetNoData(), (std::vector<int>{2147483647, 2147483647, -5, 0, 2, 0}));
}

TEST(GetMaskDecisionImpl, ComplexTypesAreTestedByTheirComponentType) {
    struct Case {
        DataType complex;
        const std::type_info& kernel;
    };
    const Case cases[] = {
        {DataType::TypeC8U, typeid(SameNoDataAllChansMaskImpl<unsigned char>)},
        {DataType::TypeC8S, typeid(SameNoDataAllChansMaskImpl<char>)},
        {DataType::TypeC16U, typeid(SameNoDataAllChansMaskImpl<unsigned short>)},
        {DataType::TypeC32U, typeid(SameNoDataAllChansMaskImpl<unsigned int>)},
        {DataType::TypeC32S, typeid(SameNoDataAllChansMaskImpl<int>)},
        {DataType::TypeC64U, typeid(SameNoDataAllChansMaskImpl<std::uint64_t>)},
        {DataType::TypeC64S, typeid(SameNoDataAllChansMaskImpl<std::int64_t>)},
        {DataType::TypeC64R, typeid(SameNoDataAllChansMaskImpl<double>)},
    };
    for (const Case& c : cases) {
        // No-data 0 leaves the pair (0, 0): one shared value.
        Kernel kernel(GetMaskDecisionImpl(c.complex, 2, BkgdAllChans, {0, 0}, {1, 2}));
        ASSERT_NE(kernel, nullptr);
        EXPECT_EQ(ClassOf(kernel.get()), c.kernel);
    }
}

// Integers keep the low bits of the truncated value; 2^63 and up go through the unsigned
// offset; float rounds; nothing clamps.
template <class T>
T Stored(const DataType& type, double v) {
    Kernel kernel(GetMaskDecisionImpl(type, 1, BkgdAnyChan, {v}, {1}));
    return dynamic_cast<SingleChannelNoDataMaskImpl<T>&>(*kernel).GetNoData();
}

TEST(GetMaskDecisionImpl, NoDataValuesAreStoredByTruncationKeepingLowBits) {
    EXPECT_EQ(Stored<unsigned char>(DataType::Type8U, -1.0), 255);
    EXPECT_EQ(Stored<unsigned char>(DataType::Type8U, 300.9), 44);
    EXPECT_EQ(Stored<char>(DataType::Type8S, -129.9), 127);
    EXPECT_EQ(Stored<char>(DataType::Type8S, -2.7), -2);
    EXPECT_EQ(Stored<unsigned short>(DataType::Type16U, -1.0), 65535);
    EXPECT_EQ(Stored<short>(DataType::Type16S, 40000.0), -25536);
    EXPECT_EQ(Stored<unsigned int>(DataType::Type32U, -1.0), 4294967295u);
    EXPECT_EQ(Stored<int>(DataType::Type32S, 2147483648.0), -2147483647 - 1);
    EXPECT_EQ(Stored<std::int64_t>(DataType::Type64S, -9223372036854775808.0),
              std::numeric_limits<std::int64_t>::min());
    // From 2^63 up the unsigned offset keeps every bit.
    EXPECT_EQ(Stored<std::uint64_t>(DataType::Type64U, 9223372036854777856.0),
              9223372036854777856u);
    EXPECT_EQ(Stored<std::uint64_t>(DataType::Type64U, 18446744073709549568.0),
              18446744073709549568u);
    EXPECT_EQ(Stored<unsigned short>(DataType::Type16U, 9223372036854781952.0), 6144);
    // No integer at all: the pattern 2^63, whose low bits are 0.
    EXPECT_EQ(Stored<std::uint64_t>(DataType::Type64U, 1e30), 9223372036854775808u);
    EXPECT_EQ(Stored<std::int64_t>(DataType::Type64S, std::nan("")),
              std::numeric_limits<std::int64_t>::min());
    EXPECT_EQ(Stored<int>(DataType::Type32S, -1e30), 0);
    // Floats round, without clamping; doubles are kept.
    EXPECT_EQ(Stored<float>(DataType::Type32R, 0.1), 0.1f);
    EXPECT_EQ(Stored<float>(DataType::Type32R, 1e39), std::numeric_limits<float>::infinity());
    EXPECT_EQ(Stored<float>(DataType::Type32R, -3.4028235e38), -3.4028235e38f);
    EXPECT_EQ(Stored<double>(DataType::Type64R, 0.1), 0.1);
}

// Listed 32-bit float channels compare the double value with each sample widened to double,
// so 0.1 (no float) never matches there; the other float kernels round it first and match.
TEST(GetMaskDecisionImpl, FloatListedChannelsCompareInDouble) {
    const float samples[3] = {0.1f, 0.1f, 0.1f};
    unsigned char flag = 9;
    Kernel listed(GetMaskDecisionImpl(DataType::Type32R, 3, BkgdAnyChan, {0.1}, {1}));
    ASSERT_NE((dynamic_cast<DiffNoDataAnyChanMaskImpl<float, 1, double>*>(listed.get())), nullptr);
    listed->Evaluate(samples, &flag, 1);
    EXPECT_EQ(flag, 1);
    Kernel listedAll(GetMaskDecisionImpl(DataType::Type32R, 3, BkgdAllChans, {0.1}, {1}));
    listedAll->Evaluate(samples, &flag, 1);
    EXPECT_EQ(flag, 1);
    Kernel exact(GetMaskDecisionImpl(DataType::Type32R, 3, BkgdAnyChan, {0.5}, {1}));
    const float half[3] = {0.5f, 1.0f, 1.0f};
    exact->Evaluate(half, &flag, 1);
    EXPECT_EQ(flag, 0);
    for (IMaskDecisionImpl* made :
         {GetMaskDecisionImpl(DataType::Type32R, 1, BkgdAnyChan, {0.1}, {1}),
          GetMaskDecisionImpl(DataType::Type32R, 3, BkgdAnyChan, {0.1, 0.1, 0.1}, {1, 2, 3}),
          GetMaskDecisionImpl(DataType::Type32R, 3, BkgdAllChans, {0.1, 0.1, 0.1}, {1, 2, 3}),
          GetMaskDecisionImpl(DataType::Type32R, 2, BkgdAnyChan, {0.1, 0.2}, {1, 2})}) {
        const Kernel rounded(made);
        rounded->Evaluate(samples, &flag, 1);
        EXPECT_EQ(flag, 0);
    }
}

// A listed value of 8-bit data that converts to the wider type's marker is an untested
// channel: the value -1 is 65535 there, not 255.
TEST(GetMaskDecisionImpl, AListedValueEqualToTheMarkerLeavesItsChannelUntested) {
    const unsigned char samples[3] = {255, 255, 255};
    unsigned char flag = 9;
    Kernel any(GetMaskDecisionImpl(DataType::Type8U, 3, BkgdAnyChan, {-1.0}, {2}));
    any->Evaluate(samples, &flag, 1);
    EXPECT_EQ(flag, 1);
    Kernel all(GetMaskDecisionImpl(DataType::Type8U, 3, BkgdAllChans, {-1.0}, {2}));
    all->Evaluate(samples, &flag, 1);
    EXPECT_EQ(flag, 0);
}

TEST(GetMaskDecisionImpl, ChannelsOfTheDocumentedExamples) {
    unsigned char flag = 9;
    const auto flagOf = [&flag](IMaskDecisionImpl& kernel, std::vector<unsigned char> pixel) {
        kernel.Evaluate(pixel.data(), &flag, 1);
        return flag;
    };
    Kernel all(GetMaskDecisionImpl(DataType::Type8U, 3, BkgdAllChans, {0, 0, 0}, {1, 2, 3}));
    EXPECT_EQ(flagOf(*all, {0, 5, 0}), 1);
    EXPECT_EQ(flagOf(*all, {0, 0, 0}), 0);
    Kernel any(GetMaskDecisionImpl(DataType::Type8U, 3, BkgdAnyChan, {0, 0, 0}, {1, 2, 3}));
    EXPECT_EQ(flagOf(*any, {0, 5, 7}), 0);
    Kernel minusOne(GetMaskDecisionImpl(DataType::Type8U, 1, BkgdAllChans, {-1.0}, {1}));
    EXPECT_EQ(flagOf(*minusOne, {255}), 0);
    EXPECT_EQ(flagOf(*minusOne, {254}), 1);
    for (const BkgdRule rule : {BkgdAllChans, BkgdAnyChan}) {
        Kernel listed(GetMaskDecisionImpl(DataType::Type8U, 3, rule, {9}, {2}));
        EXPECT_EQ(flagOf(*listed, {1, 9, 1}), 0);
        EXPECT_EQ(flagOf(*listed, {1, 8, 1}), 1);
    }
    // Channel 5 of three: nothing is tested.
    Kernel noneAll(GetMaskDecisionImpl(DataType::Type8U, 3, BkgdAllChans, {9}, {5}));
    EXPECT_EQ(flagOf(*noneAll, {1, 8, 1}), 0);
    Kernel noneAny(GetMaskDecisionImpl(DataType::Type8U, 3, BkgdAnyChan, {9}, {5}));
    EXPECT_EQ(flagOf(*noneAny, {9, 9, 9}), 1);
}

}  // namespace
