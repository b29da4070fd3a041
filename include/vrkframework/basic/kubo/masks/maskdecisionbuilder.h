// Masks derived from pixel values by a no-data decision.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKDECISIONBUILDER_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKDECISIONBUILDER_H

#include <memory>  // std::shared_ptr
#include <vector>

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/masks/bkgdrule.h"
#include "vrkframework/basic/kubo/masks/imaskbuilder.h"
#include "vrkframework/basic/kubo/masks/imaskdecision.h"

namespace kora::kubo {

class RasterInfo;

/// Builds masks with a no-data decision. Copies share one decision (what one copy binds,
/// the others see); it is released by the last builder that holds it.
class KUBO_API MaskDecisionBuilder : public IMaskBuilder {
public:
    /// One value `v` for every channel of `info` under the any-channel rule; bound to
    /// `info` at once.
    MaskDecisionBuilder(const RasterInfo& info, double v);
    /// One value `v` for every channel of the first raster met, under rule `r`.
    MaskDecisionBuilder(double v, BkgdRule r);
    /// Value `v` for each listed channel (counted from 1) under rule `r`; an empty list
    /// marks every pixel valid.
    MaskDecisionBuilder(double v, BkgdRule r, const std::vector<unsigned int>& c);
    /// Value `d[i]` for channel i + 1 under rule `r`.
    MaskDecisionBuilder(const std::vector<double>& d, BkgdRule r);
    /// Value `d[i]` for channel `c[i]` (counted from 1) under rule `r`.
    MaskDecisionBuilder(const std::vector<double>& d, BkgdRule r,
                        const std::vector<unsigned int>& c);
    /// Uses a clone of `decision` (not taken over; null gives masks with every pixel
    /// background).
    explicit MaskDecisionBuilder(const IMaskDecision* decision);

    /// @name Copying
    ///@{

    /// Copies share the decision; the last holder releases it. Moving hands the share
    /// over and leaves `other` without a decision (its masks are all background).
    MaskDecisionBuilder(const MaskDecisionBuilder&) = default;
    MaskDecisionBuilder& operator=(const MaskDecisionBuilder&) = default;
    MaskDecisionBuilder(MaskDecisionBuilder&&) = default;
    MaskDecisionBuilder& operator=(MaskDecisionBuilder&&) = default;
    ///@}

    ~MaskDecisionBuilder() override;

    /// A new mask of the raster's full extent (the caller deletes it), or null when the
    /// memory for it cannot be had.
    /// @throws kora::OutOfBoundsException as the Mask constructor does, before any work.
    Mask* BuildMask(const Raster& raster) const override;

    /// The decision the builder and its copies share.
    const IMaskDecision* GetDecision() const { return m_decision.get(); }

private:
    std::shared_ptr<IMaskDecision> m_decision;
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKDECISIONBUILDER_H
