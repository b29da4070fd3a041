// The interface of a no-data decision: which pixels of a buffer are valid.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_IMASKDECISION_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_IMASKDECISION_H

#include <cstddef>  // std::size_t

#include "vrkframework/basic/kubo/kuboapi.h"

namespace kora::kubo {

class Raster;

/// Flags pixels valid (1) or background (0) by their samples.
class KUBO_API IMaskDecision {
public:
    virtual ~IMaskDecision();
    /// Flags `count` pixels of `samples` as the decision is currently bound.
    virtual void Evaluate(const void* samples, unsigned char* flags, std::size_t count) = 0;
    /// Flags every pixel of the raster's full extent, margins included; `flags` holds
    /// (width + 2 x xMargin) x (height + 2 x yMargin) bytes.
    virtual void Evaluate(const Raster& raster, unsigned char* flags) = 0;
    /// The flag of the one pixel at `pixel`.
    virtual unsigned char IsValid(const void* pixel) = 0;
    /// A new copy; the caller deletes it.
    virtual IMaskDecision* Clone() const = 0;

protected:
    IMaskDecision() = default;

    /// @name Copying
    ///@{

    /// Only implementations copy; the interface holds no data.
    IMaskDecision(const IMaskDecision&) = default;
    IMaskDecision& operator=(const IMaskDecision&) = default;
    IMaskDecision(IMaskDecision&&) = default;
    IMaskDecision& operator=(IMaskDecision&&) = default;
    ///@}
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_IMASKDECISION_H
