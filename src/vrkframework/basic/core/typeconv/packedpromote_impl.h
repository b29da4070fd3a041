// Member bodies of the packed conversion operations.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDPROMOTE_IMPL_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDPROMOTE_IMPL_H

#include "vrkframework/basic/core/typeconv/conversionkernels.h"
#include "vrkframework/basic/core/typeconv/packedoperations.h"

namespace typeconv {

template <unsigned int N, class T, unsigned int S>
void PackedOperations<N, T, S>::Promote(const void* src, void* dst, unsigned int count) {
    static_assert(S <= 1, "direction 0 unpacks, 1 packs");
    constexpr std::size_t kIndex = detail::ComponentIndexOf<T>();
    if constexpr (N > detail::kBitsOf<T>) {
        if constexpr (S == 0) {
            detail::ThrowUnpackBitsTooWide(N, detail::kComponentTypeNames[kIndex]);
        } else {
            detail::ThrowPackBitsTooWide(N, detail::kComponentTypeNames[kIndex]);
        }
    } else if (detail::IsPackedCountPositive(count)) {
        detail::CheckBuffers(src, dst, count);
        if constexpr (S == 0) {
            detail::ActiveKernels().unpack[kIndex](static_cast<const unsigned char*>(src), dst,
                                                   count, N);
        } else {
            detail::ActiveKernels().pack[kIndex](src, static_cast<unsigned char*>(dst), count, N);
        }
    }
}

template <unsigned int N, class T, unsigned int S>
unsigned int PackedOperations<N, T, S>::GetInputBits() const {
    return S == 0 ? N : detail::kBitsOf<T>;
}

template <unsigned int N, class T, unsigned int S>
unsigned int PackedOperations<N, T, S>::GetOutputBits() const {
    return S == 0 ? detail::kBitsOf<T> : N;
}

}  // namespace typeconv

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDPROMOTE_IMPL_H
