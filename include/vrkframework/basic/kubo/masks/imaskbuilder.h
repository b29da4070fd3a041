// The interface of everything that makes validity masks.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_IMASKBUILDER_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_IMASKBUILDER_H

#include "vrkframework/basic/kubo/kuboapi.h"

namespace kora::kubo {

class Mask;
class Raster;

/// Makes the validity mask of a raster.
class KUBO_API IMaskBuilder {
public:
    virtual ~IMaskBuilder();
    /// A new mask of the raster's full extent; the caller deletes it.
    virtual Mask* BuildMask(const Raster& raster) const = 0;

protected:
    IMaskBuilder() = default;

    /// @name Copying
    ///@{

    /// Only implementations copy; the interface holds no data.
    IMaskBuilder(const IMaskBuilder&) = default;
    IMaskBuilder& operator=(const IMaskBuilder&) = default;
    IMaskBuilder(IMaskBuilder&&) = default;
    IMaskBuilder& operator=(IMaskBuilder&&) = default;
    ///@}
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_IMASKBUILDER_H
