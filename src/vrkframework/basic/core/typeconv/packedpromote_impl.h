// Member bodies of the packed conversion operations.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDPROMOTE_IMPL_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDPROMOTE_IMPL_H

#include "vrkframework/basic/core/typeconv/conversionkernels.h"
#include "vrkframework/basic/core/typeconv/packedoperations.h"

namespace typeconv::detail {

template <unsigned int N, class T, unsigned int S>
void PackedOperations<N, T, S>::Promote(const void* src, void* dst, unsigned int count) {
    static_assert(S <= 1, "direction 0 unpacks, 1 packs");
    constexpr std::size_t kIndex = ComponentIndexOf<T>();
    if constexpr (N > kBitsOf<T>) {
        if constexpr (S == 0) {
            ThrowUnpackBitsTooWide(N, kComponentTypeNames[kIndex]);
        } else {
            ThrowPackBitsTooWide(N, kComponentTypeNames[kIndex]);
        }
    } else if (IsPackedCountPositive(count)) {
        CheckBuffers(src, dst, count);
        if constexpr (S == 0) {
            ActiveKernels().unpack[kIndex](static_cast<const unsigned char*>(src), dst, count, N);
        } else {
            ActiveKernels().pack[kIndex](src, static_cast<unsigned char*>(dst), count, N);
        }
    }
}

template <unsigned int N, class T, unsigned int S>
unsigned int PackedOperations<N, T, S>::GetInputBits() const {
    return S == 0 ? N : kBitsOf<T>;
}

template <unsigned int N, class T, unsigned int S>
unsigned int PackedOperations<N, T, S>::GetOutputBits() const {
    return S == 0 ? kBitsOf<T> : N;
}

}  // namespace typeconv::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDPROMOTE_IMPL_H
