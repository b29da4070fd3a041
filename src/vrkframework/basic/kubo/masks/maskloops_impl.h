// The mask loops of one kernel variant: the flag loops of every rule, stride, element type
// and kind of test, and the packing of flags (private to the library; included once per
// variant by the kernel tables). Everything has internal linkage, so that the copies of
// different variants never mix.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKLOOPS_IMPL_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKLOOPS_IMPL_H

#include <array>
#include <cstddef>      // std::size_t
#include <type_traits>  // std::is_integral_v, std::is_same_v
#include <utility>      // std::index_sequence

#include "vrkframework/basic/core/kernels/capabilities.h"
#include "vrkframework/basic/core/kernels/onebitblocks.h"
#include "vrkframework/basic/core/typeconv/componenttraits.h"
#include "vrkframework/basic/kubo/masks/bkgdrule.h"
#include "vrkframework/basic/kubo/masks/maskloops.h"
#include "vrkframework/basic/kubo/masks/nodatastorage.h"
#include "vrkframework/basic/kubo/masks/threebytepixels.h"

namespace kora::kubo::detail {
namespace {

// The same rules for a stride known at compile time, without branches, so the loop over
// pixels vectorises; as the tests have no side effects, the flags equal those of the scan.
template <BkgdRule Rule, std::size_t C, bool kHasNext, class T, class Test>
inline unsigned char FixedPixelFlag(const T* pixel, const std::array<Test, C>& tests) {
    bool valid = Rule != BkgdAllChans;
    if constexpr (Rule == BkgdAllChans) {
        for (std::size_t k = 0; k < C; ++k) {
            const bool differs = !tests[k].Matches(pixel[k]);
            valid |= tests[k].IsTested() & differs;
        }
    } else if constexpr (Rule == BkgdAnyChan) {
        for (std::size_t k = 0; k < C; ++k) {
            valid &= !tests[k].Matches(pixel[k]);
        }
    } else {
        for (std::size_t k = 0; k + 1 < C; k += 2) {
            const bool first = tests[k].Matches(pixel[k]);
            const bool second = tests[k + 1].Matches(pixel[k + 1]);
            valid &= !(first & second);
        }
        if constexpr (C % 2 == 1 && kHasNext) {
            const bool first = tests[C - 1].Matches(pixel[C - 1]);
            const bool second = tests[0].Matches(pixel[C]);
            valid &= !(first & second);
        }
    }
    return valid;
}

template <BkgdRule Rule, std::size_t C, class T, class Test>
void FlagFixedStride(const T* __restrict samples, unsigned char* __restrict flags,
                     std::size_t count, const std::array<Test, C> tests) {
    constexpr bool kReachesNext = Rule == BkgdChanPairs && C % 2 == 1;
    const std::size_t followed = kReachesNext && count != 0 ? count - 1 : count;
    for (std::size_t i = 0; i < followed; ++i) {
        flags[i] = FixedPixelFlag<Rule, C, true>(samples + i * C, tests);
    }
    if (followed != count) {
        flags[followed] = FixedPixelFlag<Rule, C, false>(samples + followed * C, tests);
    }
}

template <BkgdRule Rule, std::size_t C, class T, class Test>
void FlagLoopOf(const void* samples, unsigned char* flags, std::size_t count, const void* tests) {
    const auto* pixels = static_cast<const T*>(samples);
    const auto& channelTests = *static_cast<const std::array<Test, C>*>(tests);
    std::size_t done = 0;
#if KUBO_DETAIL_WIDE_BYTE_SHUFFLES
    // The loop below vectorises three-byte pixels (colour images) with a shuffle per channel
    // and position; spreading each pixel into a lane of its own takes one.
    if constexpr (C == 3 && std::is_same_v<Test, PlainTest<unsigned char>> &&
                  Rule != BkgdChanPairs) {
        done = FlagThreeBytePixels<Rule>(pixels, flags, count, channelTests);
    }
#endif
    FlagFixedStride<Rule>(pixels + C * done, flags + done, count - done, channelTests);
}

unsigned char PackEight(const unsigned char* flags, std::size_t n) {
    unsigned int byte = 0;
    for (std::size_t k = 0; k < n; ++k) {
        byte |= static_cast<unsigned int>(flags[k] != 0) << (7 - k);
    }
    return static_cast<unsigned char>(byte);
}

void PackFlagsLoop(const unsigned char* __restrict flags, unsigned char* __restrict bits,
                   std::size_t count) {
    const std::size_t whole = count / 8;
    std::size_t i = 0;
#if KUBO_DETAIL_MASK_REGISTERS
    for (; i + 8 <= whole; i += 8) {
        PackOneBitBlock(flags + 8 * i, bits + i, static_cast<char>(0xFF));
    }
#endif
    for (; i < whole; ++i) {
        bits[i] = PackEight(flags + 8 * i, 8);
    }
    if (count % 8 != 0) {
        bits[whole] = PackEight(flags + 8 * whole, count % 8);
    }
}

// Where comparisons write mask registers, an integer test's flags go from lanes to a mask
// register and back to bytes, which measures slower than comparing into lanes: such a
// variant leaves the integer loops to the variant below it. Floating tests gain.
template <BkgdRule Rule, std::size_t C, class T>
constexpr std::array<FlagLoop, 2> FlagLoopsOf() {
    if constexpr (kCompareIntoMaskRegisters && std::is_integral_v<T>) {
        return {};
    } else {
        return {{&FlagLoopOf<Rule, C, T, PlainTest<T>>, &FlagLoopOf<Rule, C, T, ChannelTest<T>>}};
    }
}

template <BkgdRule Rule, std::size_t C, std::size_t... Index>
constexpr auto FlagLoopsByType(std::index_sequence<Index...>) {
    return std::array<std::array<FlagLoop, 2>, sizeof...(Index)>{
        {FlagLoopsOf<Rule, C, typeconv::detail::ComponentAt<Index>>()...}};
}

template <BkgdRule Rule>
constexpr auto FlagLoopsByStride() {
    constexpr auto kTypes = std::make_index_sequence<typeconv::detail::kComponentCount>();
    return std::array<decltype(FlagLoopsByType<Rule, 1>(kTypes)), 4>{
        {FlagLoopsByType<Rule, 1>(kTypes), FlagLoopsByType<Rule, 2>(kTypes),
         FlagLoopsByType<Rule, 3>(kTypes), FlagLoopsByType<Rule, 4>(kTypes)}};
}

/// The mask loops of the variant this file is compiled for.
constexpr MaskLoops kMaskLoops = {
    {{FlagLoopsByStride<BkgdAllChans>(), FlagLoopsByStride<BkgdAnyChan>(),
      FlagLoopsByStride<BkgdChanPairs>()}},
    &PackFlagsLoop};

}  // namespace
}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKLOOPS_IMPL_H
