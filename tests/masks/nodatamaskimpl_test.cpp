// The no-data kernels and their factory, in every kernel variant.
#include "vrkframework/basic/kubo/masks/nodatamaskimpl.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <functional>
#include <limits>
#include <memory>
#include <numeric>
#include <string>
#include <vector>

#include "support/datatypes.h"
#include "support/expectfailure.h"
#include "support/kernelvariants.h"
#include "vrkframework/basic/core/typeconv/typelist.h"
#include "vrkframework/basic/kubo/masks/maskdecision.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace {

using namespace kora::kubo;
using detail::WiderType;
using typeconv::priv::ComplexDescriptor;
using typeconv::priv::RealDescriptor;
using Flags = std::vector<unsigned char>;
using Kernel = std::unique_ptr<IMaskDecisionImpl>;

// The flags of `count` pixels; nothing past them may be written.
template <class T>
Flags FlagsOf(IMaskDecisionImpl& kernel, const std::vector<T>& samples, std::size_t count) {
    Flags flags(count + 1, 0xab);
    kernel.Evaluate(samples.data(), flags.data(), count);
    EXPECT_EQ(flags.back(), 0xab) << "written past the end";
    flags.pop_back();
    return flags;
}

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

// The factory makes each Diff kernel as its family's signed 8-bit instance rebound to T.
template <int Listed, BkgdRule Rule, class T>
using Made = typename DiffNoDataMaskImpl<char, Listed, short, Rule>::template Reassign<T>;
static_assert(std::is_base_of_v<DiffNoDataAnyChanMaskImpl<unsigned short, 1, unsigned int>,
                                Made<1, BkgdAnyChan, unsigned short>>);

// One channel as the rules see it: whether it is tested, and its no-data value.
struct Channel {
    bool tested;
    double value;
};

// Every combination of matching and differing samples over `count` pixels (by default
// enough that vector bodies and tails both run), against the flags the rule gives. Under the pair
// rule an odd stride pairs the last sample with the next pixel's first, tested as channel 1; the
// last pixel has no next one.
template <class T>
void ExpectFlags(IMaskDecisionImpl& kernel, BkgdRule rule, const std::vector<Channel>& channels,
                 std::size_t count = 1003) {
    const std::size_t stride = channels.size();
    std::vector<T> samples(count * stride);
    std::vector<bool> hits(count * stride + 1, false);
    for (std::size_t i = 0; i < count; ++i) {
        const std::size_t pattern = (i * 37) % (std::size_t{1} << stride);
        for (std::size_t k = 0; k < stride; ++k) {
            const bool equal = (pattern >> k) & 1;
            samples[i * stride + k] = static_cast<T>(channels[k].value + (equal ? 0 : 20));
            hits[i * stride + k] = equal && channels[k].tested;
        }
    }
    Flags expected(count);
    for (std::size_t i = 0; i < count; ++i) {
        bool background = rule == BkgdAllChans;
        for (std::size_t k = 0; k < stride; ++k) {
            const bool hit = hits[i * stride + k];
            if (rule == BkgdAllChans) {
                background = background && (hit || !channels[k].tested);
            } else if (rule == BkgdAnyChan) {
                background = background || hit;
            } else if (k % 2 == 0) {
                const bool partner =
                    k + 1 < stride || i + 1 < count ? hits[i * stride + k + 1] : false;
                background = background || (hit && partner);
            }
        }
        expected[i] = background ? 0 : 1;
    }
    EXPECT_EQ(FlagsOf(kernel, samples, count), expected);
}

// The factory's kernel for the tested channels of `channels`, listed by number.
IMaskDecisionImpl* Make(const DataType& type, BkgdRule rule, const std::vector<Channel>& channels) {
    std::vector<double> values;
    std::vector<unsigned int> numbers;
    for (unsigned int k = 0; k < channels.size(); ++k) {
        if (channels[k].tested) {
            values.push_back(channels[k].value);
            numbers.push_back(k + 1);
        }
    }
    return GetMaskDecisionImpl(type, channels.size(), rule, values, numbers);
}

// The factory's kernel must be of class K; it, its clone and a copy all flag as the rule
// says.
template <class K, class T>
void ExpectKernel(IMaskDecisionImpl* made, BkgdRule rule, const std::vector<Channel>& channels) {
    const Kernel owned(made);
    ASSERT_NE(dynamic_cast<K*>(made), nullptr);
    ExpectFlags<T>(*made, rule, channels);
    const Kernel clone(made->Clone());
    EXPECT_NE(dynamic_cast<K*>(clone.get()), nullptr);
    ExpectFlags<T>(*clone, rule, channels);
    K copy(static_cast<K&>(*made));
    ExpectFlags<T>(copy, rule, channels);
}

// One channel (tested alone whatever the rule and list), one complex channel (a pair of
// parts), and strides 2 to 6 (branch-free loops up to 4, scans beyond) with one shared value,
// values by position, and listed channels.
template <class T, BkgdRule Rule>
void SweepLayouts() {
    SCOPED_TRACE("rule " + std::to_string(Rule));
    const DataType type = RealDescriptor<T>();
    ExpectKernel<SingleChannelNoDataMaskImpl<T>, T>(GetMaskDecisionImpl(type, 1, Rule, {7}, {2}),
                                                    BkgdAnyChan, {{true, 7}});
    constexpr BkgdRule kComplexRule = Rule == BkgdAnyChan ? BkgdChanPairs : Rule;
    ExpectKernel<Made<0, kComplexRule, T>, T>(
        GetMaskDecisionImpl(ComplexDescriptor<T>(), 1, Rule, {7}, {1}), kComplexRule,
        {{true, 7}, {true, 0}});
    for (unsigned int c = 2; c <= 6; ++c) {
        SCOPED_TRACE("channels " + std::to_string(c));
        const std::vector<Channel> same(c, Channel{true, 7});
        std::vector<Channel> different(c);
        std::vector<Channel> listed(c, Channel{false, 30});
        for (unsigned int k = 0; k < c; ++k) {
            different[k] = {true, 10.0 + k};
        }
        // Channel 2 listed, and channel 1 unless that would list every channel.
        listed[1] = different[1];
        listed[0] = c > 2 ? different[0] : listed[0];
        ExpectKernel<SameNoDataMaskImpl<T, Rule>, T>(Make(type, Rule, same), Rule, same);
        ExpectKernel<Made<0, Rule, T>, T>(Make(type, Rule, different), Rule, different);
        ExpectKernel<Made<1, Rule, T>, T>(Make(type, Rule, listed), Rule, listed);
    }
}

// NoDataKernels.<type>/<variant>: every rule and layout of one element type.
const bool kSweepsRegistered = [] {
    kubo_test::ForEachComponentType([](auto tag) {
        using T = typename decltype(tag)::type;
        kubo_test::RegisterPerVariant(
            "NoDataKernels", kubo_test::TypeName<T>(),
            [] {
                SweepLayouts<T, BkgdAllChans>();
                SweepLayouts<T, BkgdAnyChan>();
                SweepLayouts<T, BkgdChanPairs>();
            },
            __FILE__, __LINE__);
    });
    return true;
}();

// Colour pixels go 32 at a time where a step stays inside the samples: every count up to
// three steps, each in a buffer of its exact size.
const bool kColourCountsRegistered = [] {
    kubo_test::RegisterPerVariant(
        "NoDataKernels", "ColourPixelsOfEveryCount",
        [] {
            const std::vector<Channel> channels = {{true, 10}, {true, 11}, {true, 12}};
            for (BkgdRule rule : {BkgdAllChans, BkgdAnyChan}) {
                const Kernel kernel(Make(RealDescriptor<unsigned char>(), rule, channels));
                for (std::size_t count = 0; count <= 100; ++count) {
                    ExpectFlags<unsigned char>(*kernel, rule, channels, count);
                }
            }
        },
        __FILE__, __LINE__);
    return true;
}();

// Tags 2 (matches nothing) and 3 (matches every sample) are never made by the factory but
// are honoured by the three families that store tagged entries.
TEST(NoDataKernels, TaggedEntriesHonourAllFourTags) {
    using E = OneMoreBit<double>;
    const E four{4, E::kCompared};
    const E none{4, E::kMatchesNone};
    const E all{0, E::kMatchesAll};
    const E untested{4, E::kUntested};
    struct Case {
        std::vector<E> entries;
        std::vector<double> pixel;
        Flags flags;  // all channels, any channel, channel pairs
    };
    const Case cases[] = {
        {{all, untested}, {9, 9}, {0, 0, 1}},  {{all, none}, {9, 4}, {1, 0, 1}},
        {{none, untested}, {4, 4}, {1, 1, 1}}, {{four, all}, {4, 7}, {0, 0, 0}},
        {{four, all}, {5, 7}, {1, 0, 1}},
    };
    for (const Case& c : cases) {
        DiffNoDataAllChansMaskImpl<double, 1> allChannels(c.entries);
        DiffNoDataAnyChanMaskImpl<double, 1, E> anyChannel(c.entries);
        DiffNoDataChanPairsMaskImpl<double, 1, E> pairs(c.entries);
        const Flags flags{FlagsOf(allChannels, c.pixel, 1)[0], FlagsOf(anyChannel, c.pixel, 1)[0],
                          FlagsOf(pairs, c.pixel, 1)[0]};
        EXPECT_EQ(flags, c.flags) << "case " << &c - cases;
    }
}

TEST(GetMaskDecisionImpl, ListedEntriesAddressChannels) {
    // Listed: numbers outside 1..channelCount are skipped; a later entry wins.
    const Kernel listed(
        GetMaskDecisionImpl(DataType::Type8U, 6, BkgdAnyChan, {1, 2, 3, 4, 5}, {6, 0, 2, 7, 6}));
    EXPECT_EQ((dynamic_cast<DiffNoDataAnyChanMaskImpl<unsigned char, 1, unsigned short>&>(*listed)
                   .GetNoData()),
              (std::vector<unsigned short>{65535, 3, 65535, 65535, 65535, 5}));
    // Complex channel c is parts 2c - 1 and 2c, with 0 as imaginary value.
    const Kernel complex(GetMaskDecisionImpl(DataType::TypeC16S, 3, BkgdAllChans, {-5, 2}, {2, 3}));
    EXPECT_EQ((dynamic_cast<DiffNoDataAllChansMaskImpl<short, 1>&>(*complex).GetNoData()),
              (std::vector<int>{2147483647, 2147483647, -5, 0, 2, 0}));
}

template <class T>
T Stored(const DataType& type, double v) {
    const Kernel kernel(GetMaskDecisionImpl(type, 1, BkgdAnyChan, {v}, {1}));
    return dynamic_cast<SingleChannelNoDataMaskImpl<T>&>(*kernel).GetNoData();
}

// Integers keep the low bits of the truncated value, from 2^63 up through the unsigned
// offset (no integer at all gives 2^63); floats round; nothing clamps.
TEST(GetMaskDecisionImpl, NoDataValuesAreStoredByTruncationKeepingLowBits) {
    EXPECT_EQ(Stored<unsigned char>(DataType::Type8U, -1.0), 255);
    EXPECT_EQ(Stored<unsigned char>(DataType::Type8U, 300.9), 44);
    EXPECT_EQ(Stored<char>(DataType::Type8S, -129.9), 127);
    EXPECT_EQ(Stored<short>(DataType::Type16S, 40000.0), -25536);
    EXPECT_EQ(Stored<int>(DataType::Type32S, 2147483648.0), -2147483647 - 1);
    EXPECT_EQ(Stored<std::uint64_t>(DataType::Type64U, 18446744073709549568.0),
              18446744073709549568u);
    EXPECT_EQ(Stored<unsigned short>(DataType::Type16U, 9223372036854781952.0), 6144);
    EXPECT_EQ(Stored<std::uint64_t>(DataType::Type64U, 1e30), 9223372036854775808u);
    EXPECT_EQ(Stored<int>(DataType::Type32S, std::nan("")), 0);
    EXPECT_EQ(Stored<float>(DataType::Type32R, 1e39), std::numeric_limits<float>::infinity());
    EXPECT_EQ(Stored<double>(DataType::Type64R, 0.1), 0.1);
}

template <class T>
Flags BytesOf(const std::vector<double>& values) {
    const std::vector<T> samples(values.begin(), values.end());
    const auto* bytes = reinterpret_cast<const unsigned char*>(samples.data());
    return Flags(bytes, bytes + samples.size() * sizeof(T));
}

// Samples of the element type of `type`, as bytes; unsigned 8-bit unless named here.
Flags SamplesOf(const DataType& type, const std::vector<double>& values) {
    return type == DataType::Type32R   ? BytesOf<float>(values)
           : type == DataType::Type64R ? BytesOf<double>(values)
           : type == DataType::Type32S ? BytesOf<int>(values)
                                       : BytesOf<unsigned char>(values);
}

TEST(GetMaskDecisionImpl, FlagsTheEdgeCases) {
    const double nan = std::numeric_limits<double>::quiet_NaN();
    struct Case {
        DataType type;
        std::uint64_t channelCount;
        BkgdRule rule;
        std::vector<double> noData;
        std::vector<unsigned int> channels;
        std::vector<double> samples;
        Flags flags;  // none: no kernel
    };
    const Case cases[] = {
        // Nothing to test: every pixel valid, whatever the type and rule.
        {DataType::Type1U, 3, BkgdRule(9), {0}, {}, {}, {1, 1}},
        {DataType::Type8U, 3, BkgdAnyChan, {}, {1}, {}, {1, 1}},
        // Unknown sample types and rules; one channel does not consult the rule.
        {DataType::Type1U, 2, BkgdAnyChan, {0, 0}, {1, 2}, {}, {}},
        {DataType(12, false, false, 12, 0, false), 2, BkgdAnyChan, {0, 0}, {1, 2}, {}, {}},
        {DataType(32, false, true, 23, 8, false), 2, BkgdAnyChan, {0, 0}, {1, 2}, {}, {}},
        {DataType::Type8U, 2, BkgdRule(3), {0, 0}, {1, 2}, {}, {}},
        {DataType::Type8U, 1, BkgdRule(3), {4}, {1}, {4, 5}, {0, 1}},
        // By position the value list, not the channel count, is the stride.
        {DataType::Type32S, 2, BkgdAnyChan, {1, 2, 3}, {9, 9}, {5, 5, 3, 5, 5, 5}, {0, 1}},
        // Channel 5 of three: nothing is tested.
        {DataType::Type8U, 3, BkgdAllChans, {9}, {5}, {1, 8, 1}, {0}},
        {DataType::Type8U, 3, BkgdAnyChan, {9}, {5}, {9, 9, 9}, {1}},
        // Listed, -1 is 65535, the untested marker of the wider type, not 255.
        {DataType::Type8U, 3, BkgdAnyChan, {-1}, {2}, {255, 255, 255}, {1}},
        {DataType::Type8U, 3, BkgdAllChans, {-1}, {2}, {255, 255, 255}, {0}},
        // Listed 32-bit float channels compare in double, so 0.1 (no float) never matches
        // there; the other float kernels round it first.
        {DataType::Type32R, 3, BkgdAllChans, {0.1}, {1}, {0.1, 0.1, 0.1}, {1}},
        {DataType::Type32R, 3, BkgdAnyChan, {0.1}, {1}, {0.1, 0.1, 0.1}, {1}},
        {DataType::Type32R, 1, BkgdAnyChan, {0.1}, {1}, {0.1}, {0}},
        {DataType::Type32R, 3, BkgdAllChans, {0.1, 0.1, 0.1}, {1, 2, 3}, {0.1, 0.1, 0.1}, {0}},
        {DataType::Type32R, 2, BkgdAnyChan, {0.1, 0.2}, {1, 2}, {0.1, 0.1}, {0}},
        // A NaN no-data value matches no sample, NaN included.
        {DataType::Type32R, 1, BkgdAllChans, {nan}, {1}, {nan}, {1}},
        {DataType::Type64R, 2, BkgdAnyChan, {nan, nan}, {1, 2}, {nan, nan}, {1}},
        {DataType::Type32R, 2, BkgdAllChans, {nan, 0}, {1, 2}, {nan, 0}, {1}},
        {DataType::Type32R, 3, BkgdAnyChan, {nan}, {1}, {nan, 0, 0}, {1}},
        {DataType::Type64R, 3, BkgdChanPairs, {nan, 0}, {1, 2}, {nan, 0, 0}, {1}},
    };
    for (const Case& c : cases) {
        const Kernel kernel(
            GetMaskDecisionImpl(c.type, c.channelCount, c.rule, c.noData, c.channels));
        if (c.flags.empty()) {
            EXPECT_EQ(kernel.get(), nullptr) << "case " << &c - cases;
        } else if (kernel != nullptr) {
            EXPECT_EQ(FlagsOf(*kernel, SamplesOf(c.type, c.samples), c.flags.size()), c.flags)
                << "case " << &c - cases;
        } else {
            ADD_FAILURE() << "no kernel for case " << &c - cases;
        }
    }
}

// Kernels and decisions refuse null sample or flag buffers when there are pixels to flag.
TEST(NoDataKernels, NullBuffersAreRefusedWhenThereArePixels) {
    const Kernel single(GetMaskDecisionImpl(DataType::Type8U, 1, BkgdAnyChan, {0}, {1}));
    const Kernel dummy(GetMaskDecisionImpl(DataType::Type8U, 3, BkgdAnyChan, {}, {}));
    MaskDecision decision(BkgdAnyChan, {0}, {}, false);
    const unsigned char samples[3] = {};
    unsigned char flags[3];
    const std::function<void()> calls[] = {
        [&] { single->Evaluate(nullptr, flags, 3); },
        [&] { single->Evaluate(samples, nullptr, 3); },
        [&] { dummy->Evaluate(samples, nullptr, 3); },
        [&] {
            decision.Evaluate(Raster(RasterInfo(3, 1, 1, DataType::Type8U), RasterContext()),
                              nullptr);
        },
    };
    for (const auto& call : calls) {
        const auto failure = kubo_test::Catch<kora::DataException>(call);
        ASSERT_TRUE(failure.has_value());
        kubo_test::ExpectReport(*failure, "A sample or flag buffer is NULL.",
                                "vrkframework/basic/kubo/masks/nodatamaskimpl",
                                "void __cdecl kora::kubo::IMaskDecisionImpl::Evaluate(const void "
                                "*,unsigned char *,unsigned __int64)",
                                0);
    }
    single->Evaluate(nullptr, nullptr, 0);
}

}  // namespace
