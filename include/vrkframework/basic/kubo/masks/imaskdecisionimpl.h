// The typed per-pixel no-data kernels and the factory that chooses one.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_IMASKDECISIONIMPL_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_IMASKDECISIONIMPL_H

#include <cstddef>  // std::size_t
#include <cstdint>  // std::uint64_t
#include <vector>

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/masks/bkgdrule.h"
#include "vrkframework/basic/kubo/raster/datatype.h"

namespace kora::kubo {

/// A kernel that flags pixels of one sample type and channel layout: 1 valid, 0 background.
class KUBO_API IMaskDecisionImpl {
public:
    /// `samples` holds `count` pixels of the kernel's stride of samples each, interleaved
    /// by pixel; writes `count` flag bytes. Allocates nothing.
    virtual void Evaluate(const void* samples, unsigned char* flags, std::size_t count) = 0;
    /// A new kernel of the same class with the same fields; the caller deletes it.
    virtual IMaskDecisionImpl* Clone() const = 0;
    virtual ~IMaskDecisionImpl();

protected:
    IMaskDecisionImpl() = default;

    /// @name Copying
    ///@{

    /// Only implementations copy; the interface holds no data.
    IMaskDecisionImpl(const IMaskDecisionImpl&) = default;
    IMaskDecisionImpl& operator=(const IMaskDecisionImpl&) = default;
    IMaskDecisionImpl(IMaskDecisionImpl&&) = default;
    IMaskDecisionImpl& operator=(IMaskDecisionImpl&&) = default;
    ///@}
};

/// Builds the kernel for samples of `type` with `channelCount` channels under `rule`;
/// entry i of `noData` is the no-data value of channel `channels[i]` (counted from 1).
///
/// An empty channel list (or no no-data value at all) gives a kernel that marks every
/// pixel valid. Complex samples are tested as two channels each (real, imaginary; the
/// imaginary no-data value is 0 and the any-channel rule becomes the pair rule). One
/// channel is tested alone whatever the rule and list. Channel numbers outside
/// 1..channelCount are ignored.
///
/// Returns a new kernel the caller deletes, or null for a sample type without a native
/// code of the ten component types, or a rule other than the three defined.
KUBO_API IMaskDecisionImpl* GetMaskDecisionImpl(DataType type, std::uint64_t channelCount,
                                                BkgdRule rule, std::vector<double> noData,
                                                std::vector<unsigned int> channels);

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_IMASKDECISIONIMPL_H
