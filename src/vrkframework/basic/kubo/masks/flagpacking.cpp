// Flag bytes to mask bits, eight at a time.
#include "vrkframework/basic/kubo/masks/flagpacking.h"

namespace kora::kubo::detail {
namespace {

unsigned char PackEight(const unsigned char* flags, std::size_t n) {
    unsigned int byte = 0;
    for (std::size_t k = 0; k < n; ++k) {
        byte |= static_cast<unsigned int>(flags[k] != 0) << (7 - k);
    }
    return static_cast<unsigned char>(byte);
}

}  // namespace

KUBO_VECTOR_CLONES void PackFlags(const unsigned char* __restrict flags,
                                  unsigned char* __restrict bits, std::size_t count) {
    const std::size_t whole = count / 8;
    for (std::size_t i = 0; i < whole; ++i) {
        bits[i] = PackEight(flags + 8 * i, 8);
    }
    if (count % 8 != 0) {
        bits[whole] = PackEight(flags + 8 * whole, count % 8);
    }
}

}  // namespace kora::kubo::detail
