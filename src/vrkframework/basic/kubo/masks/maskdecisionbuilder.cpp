// Masks from a no-data decision, evaluated and packed in cache-sized pieces.
#include "vrkframework/basic/kubo/masks/maskdecisionbuilder.h"

#include <algorithm>  // std::min
#include <cstdint>    // std::uint64_t
#include <cstring>    // std::memset
#include <memory>     // std::unique_ptr, std::make_shared
#include <new>        // std::bad_alloc
#include <typeinfo>   // typeid
#include <utility>    // std::move

#include "vrkframework/basic/kubo/masks/mask.h"
#include "vrkframework/basic/kubo/masks/maskdecision.h"
#include "vrkframework/basic/kubo/masks/maskextent.h"
#include "vrkframework/basic/kubo/masks/maskloops.h"
#include "vrkframework/basic/kubo/raster/bufferextent.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace kora::kubo {
namespace {

// Pixels flagged per piece: a multiple of 8, so each piece packs into whole bytes, and
// small, so the processor keeps streaming the raster in while a piece is packed (pieces of
// 1024 to 2048 pixels measured fastest; 32768 took half as long again).
constexpr std::size_t kPiecePixels = 2048;

std::shared_ptr<MaskDecision> Decision(BkgdRule rule, std::vector<double> noData,
                                       std::vector<unsigned int> channels, bool expanded) {
    return std::make_shared<MaskDecision>(rule, std::move(noData), std::move(channels), expanded);
}

std::vector<unsigned int> ChannelsUpTo(std::size_t count) {
    std::vector<unsigned int> channels(count);
    for (std::size_t i = 0; i < count; ++i) {
        channels[i] = static_cast<unsigned int>(i + 1);
    }
    return channels;
}

// The decision's flags for the whole extent, then packed: for decisions of other kinds,
// whose Evaluate may look at the raster as a whole.
Mask* BuildFromFlags(IMaskDecision* decision, const Raster& raster) {
    const std::uint64_t pixels = detail::BufferPixels(raster, raster);
    std::unique_ptr<unsigned char[]> flags(new unsigned char[pixels]);
    if (decision != nullptr) {
        decision->Evaluate(raster, flags.get());
    } else if (pixels != 0) {
        std::memset(flags.get(), 0, pixels);
    }
    return new Mask(raster, raster, flags.get(), false, false);
}

// The same flags piece by piece, each packed while it is still in the cache.
Mask* BuildInPieces(MaskDecision& decision, const Raster& raster) {
    decision.Update(raster);
    std::unique_ptr<Mask> mask(new Mask(raster, raster));
    unsigned char flags[kPiecePixels];
    const std::uint64_t pixels = mask->GetBitCount();
    for (std::uint64_t first = 0; first < pixels; first += kPiecePixels) {
        const auto count =
            static_cast<std::size_t>(std::min<std::uint64_t>(kPiecePixels, pixels - first));
        decision.EvaluateRange(raster, first, count, flags);
        detail::PackFlags(flags, mask->GetBits() + first / 8, count);
    }
    return mask.release();
}

}  // namespace

MaskDecisionBuilder::MaskDecisionBuilder(const RasterInfo& info, double v) {
    auto decision = Decision(BkgdAnyChan, {v}, {}, false);
    decision->Update(info);
    m_decision = std::move(decision);
}

MaskDecisionBuilder::MaskDecisionBuilder(double v, BkgdRule r)
    : m_decision(Decision(r, {v}, {}, false)) {}

MaskDecisionBuilder::MaskDecisionBuilder(double v, BkgdRule r, const std::vector<unsigned int>& c) {
    auto decision = Decision(r, std::vector<double>(c.size(), v), c, true);
    if (c.empty()) {
        // Nothing to test needs no raster: binding now yields the every-pixel-valid kernel.
        decision->Update(RasterInfo());
    }
    m_decision = std::move(decision);
}

MaskDecisionBuilder::MaskDecisionBuilder(const std::vector<double>& d, BkgdRule r)
    : m_decision(Decision(r, d, ChannelsUpTo(d.size()), true)) {}

MaskDecisionBuilder::MaskDecisionBuilder(const std::vector<double>& d, BkgdRule r,
                                         const std::vector<unsigned int>& c)
    : m_decision(Decision(r, d, c, true)) {}

MaskDecisionBuilder::MaskDecisionBuilder(const IMaskDecision* decision)
    : m_decision(decision != nullptr ? decision->Clone() : nullptr) {}

MaskDecisionBuilder::~MaskDecisionBuilder() = default;

Mask* MaskDecisionBuilder::BuildMask(const Raster& raster) const {
    detail::CheckMaskExtent(raster, raster, "vrkframework/basic/kubo/masks/maskdecisionbuilder",
                            "class kora::kubo::Mask *__cdecl kora::kubo::MaskDecisionBuilder::"
                            "BuildMask(const class kora::kubo::Raster &) const");
    try {
        // Only the library's own decision is evaluated piece by piece; a class derived from
        // it may override Evaluate, which must then be called.
        IMaskDecision* decision = m_decision.get();
        if (decision != nullptr && typeid(*decision) == typeid(MaskDecision)) {
            return BuildInPieces(static_cast<MaskDecision&>(*decision), raster);
        }
        return BuildFromFlags(m_decision.get(), raster);
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
}

}  // namespace kora::kubo
