// The interface of the factories of sample converters.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_IPROMOTEFACTORY_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_IPROMOTEFACTORY_H

#include "vrkframework/basic/kubo/kuboapi.h"

namespace typeconv {
class IPromote;
}  // namespace typeconv

namespace kora::kubo {

struct DataType;

/// Creates the converter between two sample types.
class KUBO_API IPromoteFactory {
public:
    virtual ~IPromoteFactory();
    /// A new converter from `from` samples to `to` samples that the caller deletes, or null
    /// when no conversion is needed or none exists.
    virtual typeconv::IPromote* Create(const DataType& from, const DataType& to) const = 0;

protected:
    IPromoteFactory() = default;

    /// @name Copying
    ///@{

    /// Only implementations copy; the interface holds no data.
    IPromoteFactory(const IPromoteFactory&) = default;
    IPromoteFactory& operator=(const IPromoteFactory&) = default;
    IPromoteFactory(IPromoteFactory&&) = default;
    IPromoteFactory& operator=(IPromoteFactory&&) = default;
    ///@}
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_IPROMOTEFACTORY_H
