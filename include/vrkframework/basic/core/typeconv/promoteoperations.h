// The conversion operations shared by the four element-type conversion families.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_PROMOTEOPERATIONS_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_PROMOTEOPERATIONS_H

#include "vrkframework/basic/core/typeconv/ipromote.h"
#include "vrkframework/basic/kubo/kuboapi.h"

namespace typeconv {

/// How a family walks its buffers.
enum class SampleLayout {
    kReal,           ///< count values in, count values out
    kComplex,        ///< 2 * count values in and out, every component converted
    kRealToComplex,  ///< count values in, 2 * count out: (rule(x), 0)
    kComplexToReal   ///< 2 * count values in, count out: the real components
};

/// Implements IPromote for source component A, destination component B and a layout, for
/// the ten component types (instantiated inside the library). The public families derive
/// from it with the component types their parameters stand for; `Promote<A, B>` cannot declare a
/// member function with its own name, so every family inherits its `Promote` override from here and
/// clients call it through IPromote.
template <class A, class B, SampleLayout Layout>
class KUBO_API PromoteOperations : public IPromote {
public:
    /// Converts `count` samples by the per-value rules; `count` 0 writes nothing.
    void Promote(const void* src, void* dst, unsigned int count) override;
    /// Bits of A (8, 16, 32 or 64), also for complex sources.
    unsigned int GetInputBits() const override;
    /// Bits of B (8, 16, 32 or 64), also for complex destinations.
    unsigned int GetOutputBits() const override;
};

}  // namespace typeconv

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_PROMOTEOPERATIONS_H
