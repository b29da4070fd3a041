// The branch-free loops of the no-data kernels and the packing of their flags, as one table
// per kernel variant, and the table in use (private to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKLOOPS_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKLOOPS_H

#include <array>
#include <cstddef>  // std::size_t

#include "vrkframework/basic/core/typeconv/componenttraits.h"

namespace kora::kubo::detail {

/// Flags `count` pixels of C samples each: `tests` points at the C per-channel tests the
/// table entry was made for.
using FlagLoop = void (*)(const void* samples, unsigned char* flags, std::size_t count,
                          const void* tests);
/// Writes (count + 7) / 8 bytes: bit 7 - i % 8 of byte i / 8 is (flags[i] != 0); the bits
/// after the last flag are 0.
using PackLoop = void (*)(const unsigned char* flags, unsigned char* bits, std::size_t count);

/// The loops of one kernel variant; a null entry is taken from the variant before it.
struct MaskLoops {
    /// [rule][samples per pixel - 1][component index][0 plain tests, 1 channel tests].
    std::array<
        std::array<std::array<std::array<FlagLoop, 2>, typeconv::detail::kComponentCount>, 4>, 3>
        flag;
    PackLoop pack;
};

/// Replaces every null loop of `loops` by the one of `before`.
void FillGaps(MaskLoops& loops, const MaskLoops& before);

/// The mask loops of the kernel variant in use.
const MaskLoops& ActiveMaskLoops();

/// Packs `count` flags into mask bits with the loop of the variant in use.
inline void PackFlags(const unsigned char* flags, unsigned char* bits, std::size_t count) {
    ActiveMaskLoops().pack(flags, bits, count);
}

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKLOOPS_H
