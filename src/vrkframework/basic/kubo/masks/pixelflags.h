// The per-pixel loops of the no-data kernels: one flag byte per pixel (1 valid,
// 0 background) from the pixel's samples and one test per channel.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_PIXELFLAGS_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_PIXELFLAGS_H

#include <array>
#include <cstddef>  // std::size_t

#include "vrkframework/basic/kubo/masks/bkgdrule.h"
#include "vrkframework/basic/kubo/masks/vectorclones.h"
#include "vrkframework/platform/exception.h"

namespace kora::kubo::detail {

/// Reports a null sample or flag buffer for pixels to flag (kora::DataException): the
/// kernels read and write nothing else.
inline void CheckFlagBuffers(const void* samples, const unsigned char* flags, std::size_t count) {
    if (count != 0 && (samples == nullptr || flags == nullptr)) {
        throw kora::DataException("A sample or flag buffer is NULL.",
                                  "vrkframework/basic/kubo/masks/nodatamaskimpl",
                                  "void __cdecl kora::kubo::IMaskDecisionImpl::Evaluate(const void "
                                  "*,unsigned char *,unsigned __int64)",
                                  0);
    }
}

// The pair rule pairs samples k and k + 1 for every even k below the stride, so an odd
// stride pairs its last sample with the first sample of the next pixel, tested as that
// pixel's first channel. The last pixel a kernel is given has no next one: its half pair
// counts as not matching, so nothing outside the given pixels is read.

// The three rules, each as a scan that stops at the first decisive channel.
template <BkgdRule Rule, class T, class TestAt>
KUBO_INTERNAL unsigned char ScanPixel(const T* pixel, std::size_t stride, const TestAt& testAt,
                                      bool hasNext) {
    if constexpr (Rule == BkgdAllChans) {
        for (std::size_t k = 0; k < stride; ++k) {
            const auto test = testAt(k);
            if (test.IsTested() && !test.Matches(pixel[k])) {
                return 1;
            }
        }
        return 0;
    } else if constexpr (Rule == BkgdAnyChan) {
        for (std::size_t k = 0; k < stride; ++k) {
            if (testAt(k).Matches(pixel[k])) {
                return 0;
            }
        }
        return 1;
    } else {
        for (std::size_t k = 0; k < stride; k += 2) {
            const bool partner = k + 1 < stride ? testAt(k + 1).Matches(pixel[k + 1])
                                                : hasNext && testAt(0).Matches(pixel[stride]);
            if (partner && testAt(k).Matches(pixel[k])) {
                return 0;
            }
        }
        return 1;
    }
}

// The same rules for a stride known at compile time, without branches, so the loop over
// pixels vectorises; as the tests have no side effects, the flags equal those of the scan.
template <BkgdRule Rule, std::size_t C, bool kHasNext, class T, class Test>
KUBO_INTERNAL inline unsigned char FixedPixelFlag(const T* pixel,
                                                  const std::array<Test, C>& tests) {
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
KUBO_CLONED_TEMPLATE void FlagFixedStride(const T* __restrict samples,
                                          unsigned char* __restrict flags, std::size_t count,
                                          const std::array<Test, C> tests) {
    constexpr bool kReachesNext = Rule == BkgdChanPairs && C % 2 == 1;
    const std::size_t followed = kReachesNext && count != 0 ? count - 1 : count;
    for (std::size_t i = 0; i < followed; ++i) {
        flags[i] = FixedPixelFlag<Rule, C, true>(samples + i * C, tests);
    }
    if (followed != count) {
        flags[followed] = FixedPixelFlag<Rule, C, false>(samples + followed * C, tests);
    }
}

template <std::size_t C, class TestAt>
KUBO_INTERNAL auto TestsOf(const TestAt& testAt) {
    std::array<decltype(testAt(0)), C> tests{};
    for (std::size_t k = 0; k < C; ++k) {
        tests[k] = testAt(k);
    }
    return tests;
}

/// Flags `count` pixels of `stride` samples each under `Rule`; `testAt(k)` is the test of
/// channel k. Strides 1 to 4, the common channel counts and one or two complex channels,
/// run branch-free loops; wider pixels are scanned channel by channel.
template <BkgdRule Rule, class T, class TestAt>
KUBO_INTERNAL void FlagPixels(const T* samples, unsigned char* flags, std::size_t count,
                              std::size_t stride, const TestAt& testAt) {
    CheckFlagBuffers(samples, flags, count);
    switch (stride) {
        case 1:
            return FlagFixedStride<Rule>(samples, flags, count, TestsOf<1>(testAt));
        case 2:
            return FlagFixedStride<Rule>(samples, flags, count, TestsOf<2>(testAt));
        case 3:
            return FlagFixedStride<Rule>(samples, flags, count, TestsOf<3>(testAt));
        case 4:
            return FlagFixedStride<Rule>(samples, flags, count, TestsOf<4>(testAt));
        default:
            for (std::size_t i = 0; i < count; ++i) {
                flags[i] = ScanPixel<Rule>(samples + i * stride, stride, testAt, i + 1 < count);
            }
    }
}

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_PIXELFLAGS_H
