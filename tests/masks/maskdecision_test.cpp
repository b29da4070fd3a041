#include "vrkframework/basic/kubo/masks/maskdecision.h"

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <vector>

#include "vrkframework/basic/kubo/masks/nodatamaskimpl.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace {

using kora::kubo::BkgdAllChans;
using kora::kubo::BkgdAnyChan;
using kora::kubo::BkgdChanPairs;
using kora::kubo::DataType;
using kora::kubo::IMaskDecisionImpl;
using kora::kubo::MaskDecision;
using kora::kubo::Raster;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;

template <class K>
bool Is(const IMaskDecisionImpl* kernel) {
    return dynamic_cast<const K*>(kernel) != nullptr;
}

// A raster whose samples count up from `first` (wrapping in the sample type).
template <class T>
Raster CountingRaster(const RasterInfo& info, const RasterContext& context, int first = 0) {
    Raster raster(info, context);
    T* samples = reinterpret_cast<T*>(raster.data);
    for (std::size_t i = 0; i < raster.byteSize / sizeof(T); ++i) {
        samples[i] = static_cast<T>(first + static_cast<int>(i));
    }
    return raster;
}

TEST(MaskDecision, FlagsEverythingBackgroundUntilItHasAKernel) {
    MaskDecision decision(BkgdAnyChan, {4}, {}, false);
    EXPECT_EQ(decision.GetImpl(), nullptr);
    EXPECT_EQ(decision.GetRule(), BkgdAnyChan);
    EXPECT_FALSE(decision.IsExpanded());
    const unsigned char samples[3] = {1, 2, 3};
    unsigned char flags[4] = {9, 9, 9, 9};
    decision.Evaluate(samples, flags, 3);
    EXPECT_EQ(std::vector<unsigned char>(flags, flags + 4),
              (std::vector<unsigned char>{0, 0, 0, 9}));
    EXPECT_EQ(decision.IsValid(samples), 0);
}

TEST(MaskDecision, FirstRasterWidensTheSingleValueToEveryChannelForGood) {
    MaskDecision decision(BkgdAnyChan, {4}, {}, false);
    decision.Update(RasterInfo(10, 10, 3, DataType::Type8U));
    EXPECT_TRUE(decision.IsExpanded());
    EXPECT_EQ(decision.GetNoData(), (std::vector<double>{4, 4, 4}));
    EXPECT_EQ(decision.GetChannels(), (std::vector<unsigned int>{1, 2, 3}));
    EXPECT_TRUE(Is<SameNoDataAnyChanMaskImpl<unsigned char>>(decision.GetImpl()));
    const unsigned char pixel[5] = {1, 4, 1, 4, 4};
    EXPECT_EQ(decision.IsValid(pixel), 0);
    EXPECT_EQ(decision.IsValid(pixel + 2), 0);
    // More channels later: the three listed ones stay the only ones tested.
    decision.Update(RasterInfo(10, 10, 5, DataType::Type8U));
    EXPECT_EQ(decision.GetChannels(), (std::vector<unsigned int>{1, 2, 3}));
    EXPECT_TRUE(
        (Is<DiffNoDataAnyChanMaskImpl<unsigned char, 1, unsigned short>>(decision.GetImpl())));
    const unsigned char wide[5] = {1, 2, 3, 4, 4};
    EXPECT_EQ(decision.IsValid(wide), 1);
    // Fewer channels: one channel is tested alone.
    decision.Update(RasterInfo(10, 10, 1, DataType::Type16S));
    EXPECT_TRUE(Is<SingleChannelNoDataMaskImpl<short>>(decision.GetImpl()));
}

TEST(MaskDecision, WithoutAValueNothingIsTested) {
    MaskDecision decision(BkgdAllChans, {}, {}, false);
    decision.Update(RasterInfo(1, 1, 3, DataType::Type32R));
    EXPECT_FALSE(decision.IsExpanded());
    EXPECT_TRUE(Is<DummyNoDataMaskImpl>(decision.GetImpl()));
}

TEST(MaskDecision, RebuildsItsKernelOnlyForAnotherTypeOrChannelCount) {
    MaskDecision decision(BkgdAnyChan, {0}, {}, false);
    decision.Update(RasterInfo(4, 4, 2, DataType::Type16U));
    const IMaskDecisionImpl* first = decision.GetImpl();
    decision.Update(RasterInfo(400, 1, 2, DataType::Type16U));
    EXPECT_EQ(decision.GetImpl(), first);
    decision.Update(RasterInfo(4, 4, 2, DataType::TypeC16U));
    EXPECT_TRUE(Is<SameNoDataChanPairsMaskImpl<unsigned short>>(decision.GetImpl()));
    decision.Update(RasterInfo(4, 4, 2, DataType::Type64R));
    EXPECT_TRUE(Is<SameNoDataAnyChanMaskImpl<double>>(decision.GetImpl()));
    // A sample type without a kernel leaves none, and every pixel background.
    decision.Update(RasterInfo(4, 4, 2, DataType::Type1U));
    EXPECT_EQ(decision.GetImpl(), nullptr);
}

TEST(MaskDecision, FlagsTheWholeBufferMarginsIncluded) {
    // 3 x 2 image with margins 1 and 2: a 5 x 6 buffer of 16-bit samples 0, 1, 2, ...
    const Raster raster = CountingRaster<unsigned short>(RasterInfo(3, 2, 1, DataType::Type16U),
                                                         RasterContext(1, 2, 0, 0));
    MaskDecision decision(BkgdAnyChan, {0, 7, 29}, {1, 2, 3}, true);
    std::vector<unsigned char> flags(31, 0xab);
    decision.Evaluate(raster, flags.data());
    for (unsigned int i = 0; i < 30; ++i) {
        EXPECT_EQ(flags[i], i == 0 ? 0 : 1) << i;
    }
    EXPECT_EQ(flags[30], 0xab);
}

TEST(MaskDecision, RangesOfARasterGiveTheFlagsOfTheWholePass) {
    const Raster raster = CountingRaster<unsigned char>(RasterInfo(7, 5, 3, DataType::Type8U),
                                                        RasterContext(2, 1, 0, 0));
    MaskDecision decision(BkgdAllChans, {0, 1, 2}, {1, 2, 3}, true);
    std::vector<unsigned char> whole(77);
    decision.Evaluate(raster, whole.data());
    std::vector<unsigned char> pieces(77, 0xab);
    for (std::size_t first = 0; first < 77; first += 8) {
        decision.EvaluateRange(raster, first, std::min<std::size_t>(8, 77 - first),
                               pieces.data() + first);
    }
    EXPECT_EQ(pieces, whole);
    EXPECT_EQ(whole[0], 0);  // samples 0, 1, 2
    EXPECT_EQ(whole[1], 1);
}

// Four values by position on three channels read four samples a pixel; the pixels whose
// samples would lie past the buffer are background, unread.
TEST(MaskDecision, NeverReadsPastTheRastersBuffer) {
    const Raster raster =
        CountingRaster<unsigned char>(RasterInfo(4, 1, 3, DataType::Type8U), RasterContext());
    MaskDecision decision(BkgdAnyChan, {100, 100, 100, 7}, {1, 2, 3, 4}, true);
    std::vector<unsigned char> flags(4, 0xab);
    decision.Evaluate(raster, flags.data());
    // Pixels of four samples: 0-3, 4-7 (7 matches), 8-11, then nothing left.
    EXPECT_EQ(flags, (std::vector<unsigned char>{1, 0, 1, 0}));

    Raster unallocated;
    unallocated.width = 3;
    unallocated.height = 3;
    unallocated.channels = 1;
    unallocated.dataType = DataType::Type8U;
    MaskDecision single(BkgdAnyChan, {0}, {}, false);
    flags.assign(9, 0xab);
    single.Evaluate(unallocated, flags.data());
    EXPECT_EQ(flags, std::vector<unsigned char>(9, 0));
    MaskDecision nothing(BkgdAnyChan, {0}, {}, true);
    flags.assign(9, 0);
    nothing.Evaluate(unallocated, flags.data());
    EXPECT_EQ(flags, std::vector<unsigned char>(9, 1));
}

TEST(MaskDecision, ClonesAndCopiesAreIndependentEquals) {
    MaskDecision decision(BkgdChanPairs, {3, 0}, {1, 2}, true);
    const std::unique_ptr<kora::kubo::IMaskDecision> unbound(decision.Clone());
    decision.Update(RasterInfo(2, 2, 2, DataType::Type32S));
    const std::unique_ptr<kora::kubo::IMaskDecision> bound(decision.Clone());
    const auto& boundClone = dynamic_cast<const MaskDecision&>(*bound);
    EXPECT_EQ(dynamic_cast<const MaskDecision&>(*unbound).GetImpl(), nullptr);
    ASSERT_NE(boundClone.GetImpl(), nullptr);
    EXPECT_NE(boundClone.GetImpl(), decision.GetImpl());
    const IMaskDecisionImpl* cloned = boundClone.GetImpl();
    const IMaskDecisionImpl* original = decision.GetImpl();
    EXPECT_EQ(typeid(*cloned), typeid(*original));
    EXPECT_EQ(boundClone.GetRule(), BkgdChanPairs);
    EXPECT_EQ(boundClone.GetNoData(), (std::vector<double>{3, 0}));
    EXPECT_EQ(boundClone.GetChannels(), (std::vector<unsigned int>{1, 2}));
    EXPECT_TRUE(boundClone.IsExpanded());

    MaskDecision copy(decision);
    MaskDecision assigned(BkgdAnyChan, {}, {}, false);
    assigned = decision;
    decision.Update(RasterInfo(2, 2, 2, DataType::Type8U));
    const int pixel[2] = {3, 0};
    EXPECT_EQ(copy.IsValid(pixel), 0);
    EXPECT_EQ(assigned.IsValid(pixel), 0);
    EXPECT_TRUE((Is<DiffNoDataChanPairsMaskImpl<int, 0, std::int64_t>>(assigned.GetImpl())));
}

}  // namespace
