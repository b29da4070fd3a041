// How the no-data kernels flag pixels: one flag byte per pixel (1 valid, 0 background)
// from the pixel's samples and one test per channel (private to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_PIXELFLAGS_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_PIXELFLAGS_H

#include <array>
#include <cstddef>  // std::size_t

#include "vrkframework/basic/core/typeconv/componenttraits.h"
#include "vrkframework/basic/kubo/masks/bkgdrule.h"
#include "vrkframework/basic/kubo/masks/maskloops.h"
#include "vrkframework/basic/kubo/masks/nodatastorage.h"
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
unsigned char ScanPixel(const T* pixel, std::size_t stride, const TestAt& testAt, bool hasNext) {
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

template <std::size_t C, class TestAt>
auto TestsOf(const TestAt& testAt) {
    std::array<decltype(testAt(0)), C> tests{};
    for (std::size_t k = 0; k < C; ++k) {
        tests[k] = testAt(k);
    }
    return tests;
}

/// Flags `count` pixels of `stride` samples each under `Rule`; `testAt(k)` is the test of
/// channel k. Strides 1 to 4, the common channel counts and one or two complex channels,
/// run the branch-free loops of the kernel variant in use; wider pixels are scanned channel
/// by channel.
template <BkgdRule Rule, class T, class TestAt>
void FlagPixels(const T* samples, unsigned char* flags, std::size_t count, std::size_t stride,
                const TestAt& testAt) {
    CheckFlagBuffers(samples, flags, count);
    const auto loop = [&](auto tests) {
        using Test = typename decltype(tests)::value_type;
        ActiveMaskLoops().flag[Rule][tests.size() - 1][typeconv::detail::ComponentIndexOf<T>()]
                              [IsChannelTest<Test>::value](samples, flags, count, tests.data());
    };
    switch (stride) {
        case 1:
            return loop(TestsOf<1>(testAt));
        case 2:
            return loop(TestsOf<2>(testAt));
        case 3:
            return loop(TestsOf<3>(testAt));
        case 4:
            return loop(TestsOf<4>(testAt));
        default:
            for (std::size_t i = 0; i < count; ++i) {
                flags[i] = ScanPixel<Rule>(samples + i * stride, stride, testAt, i + 1 < count);
            }
    }
}

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_PIXELFLAGS_H
