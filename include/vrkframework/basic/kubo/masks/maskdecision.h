// The no-data decision: no-data values, tested channels and a rule, bound lazily to the
// sample type and channel count of the rasters it meets.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKDECISION_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKDECISION_H

#include <cstddef>  // std::size_t
#include <cstdint>  // std::uint64_t
#include <memory>   // std::unique_ptr
#include <vector>

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/masks/bkgdrule.h"
#include "vrkframework/basic/kubo/masks/imaskdecision.h"
#include "vrkframework/basic/kubo/masks/imaskdecisionimpl.h"
#include "vrkframework/basic/kubo/raster/rasterinfo.h"

namespace kora::kubo {

/// Decides validity with a kernel from `GetMaskDecisionImpl`, made for the sample type and
/// channel count of the last raster met and rebuilt when either changes.
///
/// Unless `expanded` is set, the lists hold a single no-data value that the first raster
/// widens to one value per channel, testing channels 1..N; the lists are then fixed for
/// good. Until a kernel exists (and for a sample type or rule without one) every pixel is
/// flagged background.
class KUBO_API MaskDecision : public IMaskDecision {
public:
    /// `noData[i]` is the value of channel `channels[i]` (counted from 1). Makes no kernel.
    MaskDecision(BkgdRule rule, std::vector<double> noData, std::vector<unsigned int> channels,
                 bool expanded);

    /// @name Copying
    ///@{

    /// A copy holds every field and a clone of the kernel. Assignment builds the copy before
    /// it replaces anything. Moving takes the kernel and the lists over and leaves `other`
    /// fit only to be assigned to or destroyed.
    MaskDecision(const MaskDecision& other);
    MaskDecision& operator=(const MaskDecision& other);
    MaskDecision(MaskDecision&&) noexcept;
    MaskDecision& operator=(MaskDecision&&) noexcept;
    ///@}

    ~MaskDecision() override;

    /// Binds to the raster description: widens the lists on the first call unless they are
    /// final, and makes a new kernel when there is none or the channel count or sample type
    /// changed (a change of width or height alone keeps the kernel).
    void Update(const RasterInfo& info);

    /// Runs the current kernel on `count` pixels without binding.
    void Evaluate(const void* samples, unsigned char* flags, std::size_t count) override;
    /// Binds to the raster, then flags its full extent.
    void Evaluate(const Raster& raster, unsigned char* flags) override;
    /// Binds to the raster, then flags pixels first .. first + count - 1 of its full extent
    /// (row-major, margins included) into `flags`: a large raster can be worked through in
    /// cache-sized pieces with the same flags as a whole-raster pass. Pixels whose samples
    /// would lie past the raster's buffer (no buffer, or a kernel reading more samples per
    /// pixel than the raster has) are flagged background without being read. Under the pair
    /// rule with an odd number of samples per pixel, a pixel's last sample pairs with the
    /// first of the next pixel; the buffer's last pixel has none, and its half pair does
    /// not match.
    void EvaluateRange(const Raster& raster, std::uint64_t first, std::size_t count,
                       unsigned char* flags);
    /// 1 when the pixel at `pixel` is valid under the current kernel, else 0.
    unsigned char IsValid(const void* pixel) override;
    /// A new `MaskDecision` equal to this one; the caller deletes it.
    IMaskDecision* Clone() const override;

    /// The current kernel, or null before the first binding or when none exists.
    const IMaskDecisionImpl* GetImpl() const { return m_impl.get(); }
    /// The rule.
    BkgdRule GetRule() const { return m_rule; }
    /// True once the lists are final: one no-data value per tested channel.
    bool IsExpanded() const { return m_expanded; }
    /// The no-data values; entry i belongs to channel GetChannels()[i].
    const std::vector<double>& GetNoData() const { return m_noData; }
    /// The tested channels, counted from 1.
    const std::vector<unsigned int>& GetChannels() const { return m_channels; }

private:
    std::unique_ptr<IMaskDecisionImpl> m_impl;
    RasterInfo m_bound;           // width, height, channels and type the kernel was made for
    std::uint64_t m_pixelStride;  // samples the kernel reads per pixel
    bool m_reachesNextPixel;      // the kernel pairs the last sample with the next pixel's first
    BkgdRule m_rule;
    bool m_expanded;
    std::vector<double> m_noData;
    std::vector<unsigned int> m_channels;
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKDECISION_H
