#include "vrkframework/basic/kubo/masks/maskdecisionbuilder.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <memory>
#include <vector>

#include "vrkframework/basic/kubo/masks/mask.h"
#include "vrkframework/basic/kubo/masks/maskdecision.h"
#include "vrkframework/basic/kubo/masks/nodatamaskimpl.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace {

using kora::kubo::BkgdAllChans;
using kora::kubo::BkgdAnyChan;
using kora::kubo::BkgdRule;
using kora::kubo::DataType;
using kora::kubo::IMaskDecision;
using kora::kubo::Mask;
using kora::kubo::MaskDecision;
using kora::kubo::MaskDecisionBuilder;
using kora::kubo::Raster;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;

const MaskDecision& DecisionOf(const MaskDecisionBuilder& builder) {
    return dynamic_cast<const MaskDecision&>(*builder.GetDecision());
}

// Pixel-interleaved 8-bit raster from its samples, margins included.
Raster ByteRaster(const RasterInfo& info, const RasterContext& context,
                  const std::vector<unsigned char>& samples) {
    Raster raster(info, context);
    EXPECT_EQ(raster.byteSize, samples.size());
    std::copy(samples.begin(), samples.end(), raster.data);
    return raster;
}

std::vector<bool> BitsOf(const Mask& mask) {
    std::vector<bool> bits;
    for (unsigned int i = 0; i < mask.GetBitCount(); ++i) {
        bits.push_back(mask.GetBit(i));
    }
    return bits;
}

TEST(MaskDecisionBuilder, FromARasterDescriptionTestsEveryChannelAgainstOneValueAtOnce) {
    const RasterInfo info(2, 2, 3, DataType::Type8U);
    const MaskDecisionBuilder builder(info, 5.0);
    const MaskDecision& decision = DecisionOf(builder);
    EXPECT_EQ(decision.GetRule(), BkgdAnyChan);
    EXPECT_EQ(decision.GetNoData(), (std::vector<double>{5, 5, 5}));
    EXPECT_EQ(decision.GetChannels(), (std::vector<unsigned int>{1, 2, 3}));
    EXPECT_NE(dynamic_cast<const SameNoDataAnyChanMaskImpl<unsigned char>*>(decision.GetImpl()),
              nullptr);
    const Raster raster = ByteRaster(info, RasterContext(), {5, 1, 1, 1, 5, 1, 1, 1, 1, 1, 1, 5});
    const std::unique_ptr<Mask> mask(builder.BuildMask(raster));
    EXPECT_EQ(BitsOf(*mask), (std::vector<bool>{false, false, true, false}));
}

TEST(MaskDecisionBuilder, OneValueAndARuleBindToTheFirstRasterForGood) {
    const MaskDecisionBuilder builder(0.0, BkgdAllChans);
    EXPECT_EQ(DecisionOf(builder).GetImpl(), nullptr);
    EXPECT_EQ(DecisionOf(builder).GetNoData(), std::vector<double>{0});
    EXPECT_TRUE(DecisionOf(builder).GetChannels().empty());
    const std::unique_ptr<Mask> first(builder.BuildMask(
        ByteRaster(RasterInfo(2, 1, 1, DataType::Type8U), RasterContext(), {0, 3})));
    EXPECT_EQ(BitsOf(*first), (std::vector<bool>{false, true}));
    // The lists now name channel 1 only, also for a three-channel raster.
    const std::unique_ptr<Mask> second(builder.BuildMask(
        ByteRaster(RasterInfo(2, 1, 3, DataType::Type8U), RasterContext(), {0, 4, 4, 1, 0, 0})));
    EXPECT_EQ(BitsOf(*second), (std::vector<bool>{false, true}));
    EXPECT_EQ(DecisionOf(builder).GetChannels(), std::vector<unsigned int>{1});
}

TEST(MaskDecisionBuilder, OneValueForListedChannels) {
    const MaskDecisionBuilder builder(9.0, BkgdAnyChan, {2, 3});
    const MaskDecision& decision = DecisionOf(builder);
    EXPECT_EQ(decision.GetNoData(), (std::vector<double>{9, 9}));
    EXPECT_EQ(decision.GetChannels(), (std::vector<unsigned int>{2, 3}));
    EXPECT_TRUE(decision.IsExpanded());
    EXPECT_EQ(decision.GetImpl(), nullptr);
    const std::unique_ptr<Mask> mask(builder.BuildMask(ByteRaster(
        RasterInfo(3, 1, 3, DataType::Type8U), RasterContext(), {9, 1, 1, 1, 9, 1, 1, 1, 9})));
    EXPECT_EQ(BitsOf(*mask), (std::vector<bool>{true, false, false}));
}

TEST(MaskDecisionBuilder, AnEmptyChannelListMarksEveryPixelValidAtOnce) {
    const MaskDecisionBuilder builder(9.0, BkgdAllChans, {});
    EXPECT_NE(dynamic_cast<const DummyNoDataMaskImpl*>(DecisionOf(builder).GetImpl()), nullptr);
    const std::unique_ptr<Mask> mask(builder.BuildMask(ByteRaster(
        RasterInfo(2, 1, 1, DataType::Type8U), RasterContext(1, 0, 0, 0), {9, 9, 9, 9})));
    EXPECT_EQ(BitsOf(*mask), std::vector<bool>(4, true));
}

TEST(MaskDecisionBuilder, ValuesByChannelInOrderOrAsListed) {
    const MaskDecisionBuilder inOrder(std::vector<double>{1, 2}, BkgdAllChans);
    EXPECT_EQ(DecisionOf(inOrder).GetChannels(), (std::vector<unsigned int>{1, 2}));
    EXPECT_EQ(DecisionOf(inOrder).GetNoData(), (std::vector<double>{1, 2}));
    EXPECT_TRUE(DecisionOf(inOrder).IsExpanded());
    const Raster raster =
        ByteRaster(RasterInfo(3, 1, 2, DataType::Type8U), RasterContext(), {1, 2, 2, 1, 1, 1});
    EXPECT_EQ(BitsOf(*std::unique_ptr<Mask>(inOrder.BuildMask(raster))),
              (std::vector<bool>{false, true, true}));
    // A list naming every channel is applied by position, whatever numbers it holds.
    const MaskDecisionBuilder full(std::vector<double>{1, 2}, BkgdAllChans, {2, 1});
    EXPECT_EQ(DecisionOf(full).GetChannels(), (std::vector<unsigned int>{2, 1}));
    EXPECT_EQ(BitsOf(*std::unique_ptr<Mask>(full.BuildMask(raster))),
              (std::vector<bool>{false, true, true}));
    // A shorter one addresses channels: 1 for channel 2, 2 for channel 1, channel 3 untested.
    const Raster three = ByteRaster(RasterInfo(3, 1, 3, DataType::Type8U), RasterContext(),
                                    {2, 1, 9, 1, 2, 9, 2, 1, 0});
    EXPECT_EQ(BitsOf(*std::unique_ptr<Mask>(full.BuildMask(three))),
              (std::vector<bool>{false, true, false}));
}

// A decision of the client's own: the builder evaluates it over the whole extent at once.
class EveryThirdPixel : public IMaskDecision {
public:
    explicit EveryThirdPixel(int* alive) : m_alive(alive) { ++*m_alive; }
    EveryThirdPixel(const EveryThirdPixel& other) : IMaskDecision(other), m_alive(other.m_alive) {
        ++*m_alive;
    }
    EveryThirdPixel& operator=(const EveryThirdPixel&) = delete;
    ~EveryThirdPixel() override { --*m_alive; }
    void Evaluate(const void*, unsigned char* flags, std::size_t count) override {
        for (std::size_t i = 0; i < count; ++i) {
            flags[i] = i % 3 == 0 ? 1 : 0;
        }
    }
    void Evaluate(const Raster& raster, unsigned char* flags) override {
        Evaluate(raster.data, flags, std::size_t{raster.lineStride} * raster.bufferHeight);
    }
    unsigned char IsValid(const void*) override { return 1; }
    IMaskDecision* Clone() const override { return new EveryThirdPixel(*this); }

private:
    int* m_alive;
};

TEST(MaskDecisionBuilder, UsesACloneOfAGivenDecisionOverTheWholeExtent) {
    int alive = 0;
    const EveryThirdPixel decision(&alive);
    {
        const MaskDecisionBuilder builder(&decision);
        EXPECT_EQ(alive, 2);
        EXPECT_NE(builder.GetDecision(), &decision);
        const Raster raster(RasterInfo(2, 1, 1, DataType::Type8U), RasterContext(1, 1, 0, 0));
        const std::unique_ptr<Mask> mask(builder.BuildMask(raster));
        std::vector<bool> expected(12);
        for (std::size_t i = 0; i < 12; ++i) {
            expected[i] = i % 3 == 0;
        }
        EXPECT_EQ(BitsOf(*mask), expected);
    }
    EXPECT_EQ(alive, 1);
}

TEST(MaskDecisionBuilder, WithoutADecisionEveryPixelIsBackground) {
    const MaskDecisionBuilder builder(nullptr);
    EXPECT_EQ(builder.GetDecision(), nullptr);
    const std::unique_ptr<Mask> mask(builder.BuildMask(
        ByteRaster(RasterInfo(2, 1, 1, DataType::Type8U), RasterContext(), {1, 2})));
    EXPECT_EQ(BitsOf(*mask), (std::vector<bool>{false, false}));
}

// Copies share one decision; each is released once, by the last builder holding it.
TEST(MaskDecisionBuilder, CopiesShareOneDecisionReleasedByItsLastHolder) {
    int alive = 0;
    const EveryThirdPixel prototype(&alive);
    {
        const MaskDecisionBuilder original(&prototype);
        MaskDecisionBuilder copy(original);
        EXPECT_EQ(copy.GetDecision(), original.GetDecision());
        MaskDecisionBuilder other(&prototype);
        EXPECT_EQ(alive, 3);
        other = original;
        EXPECT_EQ(other.GetDecision(), original.GetDecision());
        EXPECT_EQ(alive, 2);
        copy = MaskDecisionBuilder(0.0, BkgdAnyChan);
        EXPECT_EQ(alive, 2);
    }
    EXPECT_EQ(alive, 1);

    // What one copy binds, the others see.
    const MaskDecisionBuilder lazy(3.0, BkgdAnyChan);
    const MaskDecisionBuilder shared(lazy);
    delete lazy.BuildMask(Raster(RasterInfo(1, 1, 2, DataType::Type16S), RasterContext()));
    EXPECT_EQ(DecisionOf(shared).GetChannels(), (std::vector<unsigned int>{1, 2}));
}

// Pieces of the extent are flagged and packed one after another; the mask equals the
// decision's whole-raster flags, margins included, for every element type and rule.
TEST(MaskDecisionBuilder, MasksMatchTheWholeRasterFlagsMarginsIncluded) {
    const RasterInfo info(101, 97, 2, DataType::Type16U);
    const RasterContext context(3, 2, 5, 6);  // 107 x 101 = 10807 pixels, several pieces
    Raster raster(info, context);
    auto* samples = reinterpret_cast<unsigned short*>(raster.data);
    std::uint32_t state = 1;
    for (std::size_t i = 0; i < raster.byteSize / 2; ++i) {
        state = state * 1103515245u + 12345u;
        samples[i] = static_cast<unsigned short>((state >> 16) % 3);
    }
    for (const BkgdRule rule : {BkgdAllChans, BkgdAnyChan, kora::kubo::BkgdChanPairs}) {
        const MaskDecisionBuilder builder(std::vector<double>{0, 1}, rule);
        const std::unique_ptr<Mask> mask(builder.BuildMask(raster));
        ASSERT_EQ(mask->GetBitCount(), 10807u);
        EXPECT_EQ(mask->xOffset, 5u);
        MaskDecision decision(rule, {0, 1}, {1, 2}, true);
        std::vector<unsigned char> flags(10807);
        decision.Evaluate(raster, flags.data());
        std::size_t valid = 0;
        for (unsigned int i = 0; i < 10807; ++i) {
            ASSERT_EQ(mask->GetBit(i), flags[i] == 1) << i;
            valid += flags[i];
        }
        EXPECT_GT(valid, 0u);
        EXPECT_LT(valid, 10807u);
        EXPECT_EQ(mask->GetBits()[mask->GetByteCount() - 1] & 1, 0);  // 10807 % 8 = 7 bits
    }
}

TEST(MaskDecisionBuilder, ComplexRastersTestRealAndImaginaryPartsAsPairs) {
    const MaskDecisionBuilder builder(3.0, BkgdAnyChan);
    Raster raster(RasterInfo(3, 1, 1, DataType::TypeC32R), RasterContext());
    const float samples[6] = {3.0f, 0.0f, 3.0f, 1.0f, 0.0f, 0.0f};
    std::copy(samples, samples + 6, reinterpret_cast<float*>(raster.data));
    const std::unique_ptr<Mask> mask(builder.BuildMask(raster));
    EXPECT_EQ(BitsOf(*mask), (std::vector<bool>{false, true, true}));
}

}  // namespace
