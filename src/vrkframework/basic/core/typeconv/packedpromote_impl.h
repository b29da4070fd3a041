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
        // The samples before the samples' first cache line go in a call of their own.
        const detail::KernelSet& kernels = detail::ActiveKernels();
        if constexpr (S == 0) {
            const auto* packed = static_cast<const unsigned char*>(src);
            auto* samples = static_cast<T*>(dst);
            const std::size_t head = detail::SamplesBeforeLine(samples, sizeof(T), count, N);
            if (head != 0) {
                kernels.unpack[kIndex](packed, samples, head, N);
            }
            kernels.unpack[kIndex](packed + head * N / 8, samples + head, count - head, N);
        } else {
            const auto* samples = static_cast<const T*>(src);
            auto* packed = static_cast<unsigned char*>(dst);
            const std::size_t head = detail::SamplesBeforeLine(samples, sizeof(T), count, N);
            if (head != 0) {
                kernels.pack[kIndex](samples, packed, head, N);
            }
            kernels.pack[kIndex](samples + head, packed + head * N / 8, count - head, N);
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
