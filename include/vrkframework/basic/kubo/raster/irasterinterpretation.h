// The interface of operations that turn a raster into a real 32R raster.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_IRASTERINTERPRETATION_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_IRASTERINTERPRETATION_H

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/platform/interpretation.h"

namespace kora::kubo {

class Raster;

/// Interprets every sample of a raster as one 32-bit float by an interpretation code.
class KUBO_API IRasterInterpretation {
public:
    virtual ~IRasterInterpretation();
    /// Writes the interpretation of `in` into the existing raster `out`.
    virtual void InterpretRaster(const Raster* in, Raster* out,
                                 kora::core::KORAInterpretationTypes type) const = 0;
    /// Returns a new 32R raster holding the interpretation of `in`; the caller deletes it.
    virtual Raster* InterpretRaster(const Raster* in,
                                    kora::core::KORAInterpretationTypes type) const = 0;

protected:
    IRasterInterpretation() = default;

    /// @name Copying
    ///@{

    /// Only implementations copy; the interface holds no data.
    IRasterInterpretation(const IRasterInterpretation&) = default;
    IRasterInterpretation& operator=(const IRasterInterpretation&) = default;
    IRasterInterpretation(IRasterInterpretation&&) = default;
    IRasterInterpretation& operator=(IRasterInterpretation&&) = default;
    ///@}
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_IRASTERINTERPRETATION_H
