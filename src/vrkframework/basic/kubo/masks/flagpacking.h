// Packing of flag bytes into mask bits.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_FLAGPACKING_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_FLAGPACKING_H

#include <cstddef>  // std::size_t

#include "vrkframework/basic/kubo/masks/vectorclones.h"

namespace kora::kubo::detail {

/// Writes (count + 7) / 8 bytes: bit 7 - i % 8 of byte i / 8 is (flags[i] != 0); the bits
/// after the last flag are 0.
KUBO_INTERNAL void PackFlags(const unsigned char* flags, unsigned char* bits, std::size_t count);

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_FLAGPACKING_H
