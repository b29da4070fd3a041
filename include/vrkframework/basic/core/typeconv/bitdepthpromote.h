// Packing and unpacking of N-bit sample streams (N from 1 to 31, except 8 and 16).
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_BITDEPTHPROMOTE_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_BITDEPTHPROMOTE_H

#include "vrkframework/basic/core/typeconv/packedoperations.h"
#include "vrkframework/basic/core/typeconv/typelist.h"

namespace typeconv {

/// Static kernels between a packed stream of N-bit unsigned samples and samples of the
/// integer type T (any type with the traits of an integer component type). Only the layout
/// <N, T, 0, 0> exists; its stream layout and rules are those of
/// PackedOperations<N, T, S>.
template <unsigned int N, class T, unsigned int BitOrder, unsigned int Extension>
struct BitDepthPromote;

/// The only layout: most significant bit first, no sign extension.
template <unsigned int N, class T>
struct BitDepthPromote<N, T, 0, 0> {
    /// Unpacks `count` samples into `samples`, zero-extended whatever the sign of T.
    /// @throws kora::Exception (line 390) when N exceeds the bits of T.
    static void Promote(const unsigned char* packed, T* samples, unsigned int count) {
        PackedOperations<N, priv::Component<T>, 0>().Promote(packed, samples, count);
    }
    /// Clears the (count * N + 7) / 8 bytes of the stream, then ORs the samples in.
    /// @throws kora::Exception (line 395) when N exceeds the bits of T.
    static void Pack(const T* samples, unsigned char* packed, unsigned int count) {
        PackedOperations<N, priv::Component<T>, 1>().Promote(samples, packed, count);
    }
};

}  // namespace typeconv

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_BITDEPTHPROMOTE_H
