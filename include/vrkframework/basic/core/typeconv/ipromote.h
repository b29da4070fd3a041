// The interface of every sample conversion kernel.
#ifndef VRKFRAMEWORK_BASIC_CORE_TYPECONV_IPROMOTE_H
#define VRKFRAMEWORK_BASIC_CORE_TYPECONV_IPROMOTE_H

#include "vrkframework/basic/kubo/kuboapi.h"

/// The sample conversion kernels and their type lists.
namespace typeconv {

/// A stateless converter of sample buffers. Converters are created with new (by
/// kora::kubo::PromoteFactory) and deleted by their owner through this interface; one
/// converter serves any number of buffers. Source and destination must not overlap.
class KUBO_API IPromote {
public:
    virtual ~IPromote();
    /// Converts `count` samples (complex samples for a complex side) from `src` to `dst`.
    virtual void Promote(const void* src, void* dst, unsigned int count) = 0;
    /// Bits of one source component (of the packed sample for a packed source).
    virtual unsigned int GetInputBits() const = 0;
    /// Bits of one destination component (of the packed sample for a packed destination).
    virtual unsigned int GetOutputBits() const = 0;

protected:
    IPromote() = default;

    /// @name Copying
    ///@{

    /// For implementations: converters hold no data.
    IPromote(const IPromote&) = default;
    IPromote& operator=(const IPromote&) = default;
    IPromote(IPromote&&) = default;
    IPromote& operator=(IPromote&&) = default;
    ///@}
};

}  // namespace typeconv

#endif  // VRKFRAMEWORK_BASIC_CORE_TYPECONV_IPROMOTE_H
