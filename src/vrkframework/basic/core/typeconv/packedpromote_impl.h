// Member bodies of the bit-depth kernels and of SpecialPromote.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDPROMOTE_IMPL_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDPROMOTE_IMPL_H

#include "vrkframework/basic/core/typeconv/bitdepthpromote.h"
#include "vrkframework/basic/core/typeconv/kernels.h"
#include "vrkframework/basic/core/typeconv/packedpromote.h"

namespace typeconv {

template <unsigned int N, class T>
void BitDepthPromote<N, T, 0, 0>::Promote(const unsigned char* packed, T* samples,
                                          unsigned int count) {
    constexpr std::size_t kIndex = detail::ComponentIndexOf<T>();
    if constexpr (N > detail::kBitsOf<T>) {
        detail::ThrowUnpackBitsTooWide(N, detail::kComponentTypeNames[kIndex]);
    } else if (detail::IsPackedCountPositive(count)) {
        detail::ActiveKernels().unpack[kIndex](packed, samples, count, N);
    }
}

template <unsigned int N, class T>
void BitDepthPromote<N, T, 0, 0>::Pack(const T* samples, unsigned char* packed,
                                       unsigned int count) {
    constexpr std::size_t kIndex = detail::ComponentIndexOf<T>();
    if constexpr (N > detail::kBitsOf<T>) {
        detail::ThrowPackBitsTooWide(N, detail::kComponentTypeNames[kIndex]);
    } else if (detail::IsPackedCountPositive(count)) {
        detail::ActiveKernels().pack[kIndex](samples, packed, count, N);
    }
}

template <unsigned int N, class T, unsigned int S>
void SpecialPromote<N, T, S>::Promote(const void* src, void* dst, unsigned int count) {
    static_assert(S <= 1, "direction 0 unpacks, 1 packs");
    if constexpr (S == 0) {
        BitDepthPromote<N, T, 0, 0>::Promote(static_cast<const unsigned char*>(src),
                                             static_cast<T*>(dst), count);
    } else {
        BitDepthPromote<N, T, 0, 0>::Pack(static_cast<const T*>(src),
                                          static_cast<unsigned char*>(dst), count);
    }
}

template <unsigned int N, class T, unsigned int S>
unsigned int SpecialPromote<N, T, S>::GetInputBits() const {
    return S == 0 ? N : detail::kBitsOf<T>;
}

template <unsigned int N, class T, unsigned int S>
unsigned int SpecialPromote<N, T, S>::GetOutputBits() const {
    return S == 0 ? detail::kBitsOf<T> : N;
}

}  // namespace typeconv

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_PACKEDPROMOTE_IMPL_H
