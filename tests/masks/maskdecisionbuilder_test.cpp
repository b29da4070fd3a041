// No-data decisions and the masks their builders derive from pixel values.
#include "vrkframework/basic/kubo/masks/maskdecisionbuilder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <memory>
#include <tuple>
#include <utility>
#include <vector>

#include "vrkframework/basic/kubo/masks/mask.h"
#include "vrkframework/basic/kubo/masks/maskdecision.h"
#include "vrkframework/basic/kubo/masks/nodatamaskimpl.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace {

using namespace kora::kubo;
using Flags = std::vector<unsigned char>;

// The no-data values, channels, rule, whether they are final, and whether a kernel is made.
using Fields = std::tuple<std::vector<double>, std::vector<unsigned int>, BkgdRule, bool, bool>;

Fields FieldsOf(const MaskDecision& decision) {
    return {decision.GetNoData(), decision.GetChannels(), decision.GetRule(), decision.IsExpanded(),
            decision.GetImpl() != nullptr};
}

template <class K>
bool Is(const IMaskDecisionImpl* kernel) {
    return dynamic_cast<const K*>(kernel) != nullptr;
}

const MaskDecision& DecisionOf(const MaskDecisionBuilder& builder) {
    return dynamic_cast<const MaskDecision&>(*builder.GetDecision());
}

// A raster whose bytes count up from 0, margins included.
Raster CountingRaster(const RasterInfo& info, const RasterContext& context) {
    Raster raster(info, context);
    for (std::size_t i = 0; i < raster.byteSize; ++i) {
        raster.data[i] = static_cast<unsigned char>(i);
    }
    return raster;
}

Flags BitsOf(const Mask& mask) {
    Flags bits;
    for (unsigned int i = 0; i < mask.GetBitCount(); ++i) {
        bits.push_back(mask.GetBit(i) ? 1 : 0);
    }
    return bits;
}

TEST(MaskDecision, WidensASingleValueToTheFirstRastersChannelsForGood) {
    MaskDecision decision(BkgdAnyChan, {4}, {}, false);
    const unsigned char valid[5] = {1, 2, 3, 4, 4};
    const unsigned char background[3] = {1, 4, 1};
    EXPECT_EQ(decision.IsValid(valid), 0);  // no kernel yet: background
    decision.Update(RasterInfo(10, 10, 3, DataType::Type8U));
    EXPECT_EQ(FieldsOf(decision), (Fields{{4, 4, 4}, {1, 2, 3}, BkgdAnyChan, true, true}));
    EXPECT_EQ(decision.IsValid(valid), 1);
    EXPECT_EQ(decision.IsValid(background), 0);
    // More channels later: the three listed ones stay the only ones tested.
    decision.Update(RasterInfo(10, 10, 5, DataType::Type8U));
    EXPECT_EQ(decision.GetChannels(), (std::vector<unsigned int>{1, 2, 3}));
    EXPECT_EQ(decision.IsValid(valid), 1);
    // Without a value there is nothing to widen and nothing to test.
    MaskDecision empty(BkgdAllChans, {}, {}, false);
    empty.Update(RasterInfo(1, 1, 3, DataType::Type32R));
    EXPECT_EQ(FieldsOf(empty), (Fields{{}, {}, BkgdAllChans, false, true}));
    EXPECT_EQ(empty.IsValid(background), 1);
}

// The kernel follows the sample type and channel count, not the size; a sample type without
// a kernel leaves none, and every pixel background.
TEST(MaskDecision, RebuildsItsKernelOnlyForAnotherTypeOrChannelCount) {
    MaskDecision decision(BkgdAnyChan, {0}, {}, false);
    decision.Update(RasterInfo(4, 4, 2, DataType::Type16U));
    const IMaskDecisionImpl* first = decision.GetImpl();
    decision.Update(RasterInfo(400, 1, 2, DataType::Type16U));
    EXPECT_EQ(decision.GetImpl(), first);
    decision.Update(RasterInfo(4, 4, 2, DataType::TypeC16U));
    EXPECT_TRUE(Is<SameNoDataChanPairsMaskImpl<unsigned short>>(decision.GetImpl()));
    decision.Update(RasterInfo(4, 4, 1, DataType::Type16U));
    EXPECT_TRUE(Is<SingleChannelNoDataMaskImpl<unsigned short>>(decision.GetImpl()));
    const Raster raster = CountingRaster(RasterInfo(2, 1, 1, DataType::Type1U), RasterContext());
    Flags flags(2, 9);
    decision.Evaluate(raster, flags.data());
    EXPECT_EQ(decision.GetImpl(), nullptr);
    EXPECT_EQ(flags, Flags(2, 0));
}

// Pixels whose samples would lie past the buffer (four values by position on three channels
// read four samples a pixel) are background, unread.
TEST(MaskDecision, NeverReadsPastTheRastersBuffer) {
    Flags flags(4, 0xab);
    const Raster raster = CountingRaster(RasterInfo(4, 1, 3, DataType::Type8U), RasterContext());
    MaskDecision(BkgdAnyChan, {100, 100, 100, 7}, {1, 2, 3, 4}, true)
        .Evaluate(raster, flags.data());
    EXPECT_EQ(flags, (Flags{1, 0, 1, 0}));  // samples 0-3, 4-7 (7 matches), 8-11, none left
    Raster unallocated;
    unallocated.width = 3;
    unallocated.height = 1;
    unallocated.channels = 1;
    unallocated.dataType = DataType::Type8U;
    MaskDecision single(BkgdAnyChan, {0}, {}, false);
    single.Evaluate(unallocated, flags.data());
    EXPECT_EQ(flags, (Flags{0, 0, 0, 0}));
    MaskDecision nothing(BkgdAnyChan, {0}, {}, true);
    nothing.Evaluate(unallocated, flags.data());
    EXPECT_EQ(flags, (Flags{1, 1, 1, 0}));
}

// Clones and copies hold equal fields and a kernel of their own.
TEST(MaskDecision, ClonesAndCopiesAreIndependentEquals) {
    MaskDecision decision(BkgdChanPairs, {3, 0}, {1, 2}, true);
    const std::unique_ptr<IMaskDecision> unbound(decision.Clone());
    EXPECT_EQ(dynamic_cast<const MaskDecision&>(*unbound).GetImpl(), nullptr);
    decision.Update(RasterInfo(2, 2, 2, DataType::Type32S));
    const std::unique_ptr<IMaskDecision> clone(decision.Clone());
    MaskDecision copy(decision);
    MaskDecision assigned(BkgdAnyChan, {}, {}, false);
    assigned = decision;
    const int pixel[2] = {3, 0};
    for (MaskDecision* other : {&dynamic_cast<MaskDecision&>(*clone), &copy, &assigned}) {
        EXPECT_EQ(FieldsOf(*other), FieldsOf(decision));
        EXPECT_NE(other->GetImpl(), decision.GetImpl());
        EXPECT_EQ(other->IsValid(pixel), 0);
    }
}

// Each constructor's decision, and its mask of six pixels of three 8-bit channels.
TEST(MaskDecisionBuilder, EachConstructorSetsUpItsDecision) {
    Raster raster(RasterInfo(6, 1, 3, DataType::Type8U), RasterContext());
    const Flags samples{5, 1, 1, 0, 0, 0, 9, 9, 5, 1, 2, 9, 2, 1, 7, 9, 1, 1};
    std::copy(samples.begin(), samples.end(), raster.data);
    struct Case {
        MaskDecisionBuilder builder;
        Fields decision;
        Flags valid;
    };
    const Case cases[] = {
        {MaskDecisionBuilder(RasterInfo(6, 1, 3, DataType::Type8U), 5.0),
         {{5, 5, 5}, {1, 2, 3}, BkgdAnyChan, true, true},
         {0, 1, 0, 1, 1, 1}},
        {MaskDecisionBuilder(0.0, BkgdAllChans),
         {{0}, {}, BkgdAllChans, false, false},
         {1, 0, 1, 1, 1, 1}},
        {MaskDecisionBuilder(9.0, BkgdAnyChan, {2, 3}),
         {{9, 9}, {2, 3}, BkgdAnyChan, true, false},
         {1, 1, 0, 0, 1, 1}},
        {MaskDecisionBuilder(9.0, BkgdAllChans, {}),
         {{}, {}, BkgdAllChans, true, true},
         Flags(6, 1)},
        {MaskDecisionBuilder(std::vector<double>{1, 2}, BkgdChanPairs),
         {{1, 2}, {1, 2}, BkgdChanPairs, true, false},
         {1, 1, 1, 0, 1, 1}},
        // Channel 2 is compared with 1, channel 1 with 2, channel 3 not at all.
        {MaskDecisionBuilder(std::vector<double>{1, 2}, BkgdAllChans, {2, 1}),
         {{1, 2}, {2, 1}, BkgdAllChans, true, false},
         {1, 1, 1, 1, 0, 1}},
    };
    for (const Case& c : cases) {
        EXPECT_EQ(FieldsOf(DecisionOf(c.builder)), c.decision);
        EXPECT_EQ(BitsOf(*std::unique_ptr<Mask>(c.builder.BuildMask(raster))), c.valid);
    }
}

TEST(MaskDecisionBuilder, ComplexRastersTestRealAndImaginaryPartsAsPairs) {
    Raster raster(RasterInfo(3, 1, 1, DataType::TypeC32R), RasterContext());
    const float samples[6] = {3.0f, 0.0f, 3.0f, 1.0f, 0.0f, 0.0f};
    std::copy(samples, samples + 6, reinterpret_cast<float*>(raster.data));
    const std::unique_ptr<Mask> mask(MaskDecisionBuilder(3.0, BkgdAnyChan).BuildMask(raster));
    EXPECT_EQ(BitsOf(*mask), (Flags{0, 1, 1}));
}

// Large rasters are flagged and packed piece by piece: every pixel's flag, margins included,
// must land in its bit, and the bits past the last pixel stay 0. A decision flags the same
// extent in one pass, and nothing past it.
TEST(MaskDecisionBuilder, PiecesOfALargeRasterGiveEveryPixelsFlag) {
    // 107 x 101 = 10807 pixels of two channels.
    Raster raster(RasterInfo(101, 97, 2, DataType::Type16U), RasterContext(3, 2, 5, 6));
    auto* samples = reinterpret_cast<unsigned short*>(raster.data);
    std::uint32_t state = 1;
    for (std::size_t i = 0; i < 2 * 10807; ++i) {
        state = state * 1103515245u + 12345u;
        samples[i] = static_cast<unsigned short>((state >> 16) % 3);
    }
    for (const BkgdRule rule : {BkgdAllChans, BkgdAnyChan, BkgdChanPairs}) {
        const std::unique_ptr<Mask> mask(
            MaskDecisionBuilder(std::vector<double>{0, 1}, rule).BuildMask(raster));
        Flags flags(10808, 0xab);
        MaskDecision(rule, {0, 1}, {1, 2}, true).Evaluate(raster, flags.data());
        EXPECT_EQ(flags.back(), 0xab);
        ASSERT_EQ(mask->GetBitCount(), 10807u);
        for (unsigned int i = 0; i < 10807; ++i) {
            const bool first = samples[2 * i] == 0;
            const bool second = samples[2 * i + 1] == 1;
            const bool background = rule == BkgdAnyChan ? first || second : first && second;
            ASSERT_EQ(mask->GetBit(i), !background) << "rule " << rule << ", pixel " << i;
            ASSERT_EQ(flags[i], background ? 0 : 1) << "rule " << rule << ", pixel " << i;
        }
        EXPECT_EQ(mask->GetBits()[mask->GetByteCount() - 1] & 1, 0);  // 10807 % 8 = 7 bits
    }
}

// Under the pair rule three channels pair the third with the next pixel's first, also
// across the pieces the builder evaluates a large raster in; the last pixel has no partner.
TEST(MaskDecisionBuilder, OddPairsReachIntoTheNextPixelAcrossPieces) {
    // 4099 pixels of (0, 5, 0): only the third sample and the next pixel's first match, so
    // every pixel is background but the last. Pixel 2048, the first of the second piece,
    // starts with 5: pixel 2047 loses its partner.
    Raster raster(RasterInfo(4099, 1, 3, DataType::Type8U), RasterContext());
    for (std::size_t i = 0; i < raster.byteSize; ++i) {
        raster.data[i] = i % 3 == 1 ? 5 : 0;
    }
    raster.data[3 * 2048] = 5;
    Flags expected(4099, 0);
    expected[2047] = expected[4098] = 1;
    const std::unique_ptr<Mask> same(
        MaskDecisionBuilder(0.0, BkgdChanPairs, {1, 2, 3}).BuildMask(raster));
    EXPECT_EQ(BitsOf(*same), expected);
    const std::unique_ptr<Mask> byPosition(
        MaskDecisionBuilder({0.0, 7.0, 0.0}, BkgdChanPairs, {1, 2, 3}).BuildMask(raster));
    EXPECT_EQ(BitsOf(*byPosition), expected);
}

// A decision derived from the library's own is evaluated through its override.
TEST(MaskDecisionBuilder, CallsTheEvaluateOfAClassDerivedFromMaskDecision) {
    struct EveryPixelValid : MaskDecision {
        EveryPixelValid() : MaskDecision(BkgdAnyChan, {0}, {}, false) {}
        using MaskDecision::Evaluate;
        void Evaluate(const Raster& raster, unsigned char* flags) override {
            std::fill(flags, flags + std::size_t{raster.lineStride} * raster.bufferHeight, 1);
        }
        IMaskDecision* Clone() const override { return new EveryPixelValid(*this); }
    };
    Raster raster(RasterInfo(2, 2, 1, DataType::Type8U), RasterContext());
    std::fill(raster.data, raster.data + raster.byteSize, 0);
    const EveryPixelValid decision;
    EXPECT_EQ(BitsOf(*std::unique_ptr<Mask>(MaskDecisionBuilder(&decision).BuildMask(raster))),
              Flags(4, 1));
}

// A client's decision: every third pixel of the extent valid. Its copies share `instances`,
// whose use count counts them.
struct EveryThirdPixel : IMaskDecision {
    explicit EveryThirdPixel(std::shared_ptr<int> counter) : instances(std::move(counter)) {}
    void Evaluate(const void*, unsigned char*, std::size_t) override {}
    void Evaluate(const Raster& raster, unsigned char* flags) override {
        for (std::size_t i = 0; i < std::size_t{raster.lineStride} * raster.bufferHeight; ++i) {
            flags[i] = i % 3 == 0 ? 1 : 0;
        }
    }
    unsigned char IsValid(const void*) override { return 1; }
    IMaskDecision* Clone() const override { return new EveryThirdPixel(*this); }
    std::shared_ptr<int> instances;
};

// A given decision is cloned and asked for the whole extent; copies of a builder share one
// decision, released once by its last holder. Without a decision every pixel is background.
TEST(MaskDecisionBuilder, CopiesShareOneDecisionReleasedByItsLastHolder) {
    const auto instances = std::make_shared<int>();
    const EveryThirdPixel prototype(instances);
    const Raster raster(RasterInfo(2, 1, 1, DataType::Type8U), RasterContext(1, 1, 0, 0));
    {
        const MaskDecisionBuilder original(&prototype);
        EXPECT_NE(original.GetDecision(), &prototype);
        EXPECT_EQ(BitsOf(*std::unique_ptr<Mask>(original.BuildMask(raster))),
                  (Flags{1, 0, 0, 1, 0, 0, 1, 0, 0, 1, 0, 0}));
        MaskDecisionBuilder copy(original);
        MaskDecisionBuilder other(&prototype);
        EXPECT_EQ(instances.use_count(), 4);
        other = original;
        EXPECT_EQ(instances.use_count(), 3);
        EXPECT_EQ(copy.GetDecision(), original.GetDecision());
        EXPECT_EQ(other.GetDecision(), original.GetDecision());
        copy = MaskDecisionBuilder(0.0, BkgdAnyChan);
        EXPECT_EQ(instances.use_count(), 3);
    }
    EXPECT_EQ(instances.use_count(), 2);
    const MaskDecisionBuilder none(nullptr);
    EXPECT_EQ(BitsOf(*std::unique_ptr<Mask>(none.BuildMask(raster))), Flags(12, 0));
}

}  // namespace
