// The choice of a converter from two sample descriptors.
#include "vrkframework/basic/kubo/raster/promotefactory.h"

#include <memory>
#include <vector>

#include "vrkframework/basic/core/typeconv/complex2realpromote.h"
#include "vrkframework/basic/core/typeconv/complexpromote.h"
#include "vrkframework/basic/core/typeconv/promote.h"
#include "vrkframework/basic/core/typeconv/real2complexpromote.h"
#include "vrkframework/basic/core/typedispatch/extendtypedispatch.h"
#include "vrkframework/basic/kubo/raster/promotefactory_impl.h"
#include "vrkframework/platform/exception.h"

namespace kora::kubo {

#define KUBO_DETAIL_INSTANTIATE_INNER_FACTORY(T)     \
    template class PromoteFactory::PackedFactory<T>; \
    template class PromoteFactory::InnerFactory<T>;
KUBO_FOR_EACH_COMPONENT_TYPE(KUBO_DETAIL_INSTANTIATE_INNER_FACTORY)
#undef KUBO_DETAIL_INSTANTIATE_INNER_FACTORY

namespace {

using typeconv::priv::ComponentTypes;
using typeconv::priv::NullDataType;

template <template <class, class> class Family>
using PairDispatch =
    typedispatch::ExtendDispatchTypes<typedispatch::Factory2Template<Family, typeconv::IPromote>, 2,
                                      ComponentTypes, ComponentTypes, NullDataType>;

using InnerFactoryDispatch = typedispatch::ExtendDispatchTypes<
    typedispatch::Factory1Template<PromoteFactory::InnerFactory, IPromoteFactory>, 1,
    ComponentTypes, ComponentTypes, NullDataType>;

/// The family chosen by the two complex flags, created for (from, to).
typeconv::IPromote* CreateFamily(const DataType& from, const DataType& to) {
    const std::vector<DataType> types = {from, to};
    if (!from.isComplex && !to.isComplex) {
        return PairDispatch<typeconv::Promote>::Dispatch(types, false);
    }
    if (from.isComplex && to.isComplex) {
        return PairDispatch<typeconv::ComplexPromote>::Dispatch(types, true);
    }
    if (to.isComplex) {
        return PairDispatch<typeconv::Real2ComplexPromote>::Dispatch(types, true);
    }
    return PairDispatch<typeconv::Complex2RealPromote>::Dispatch(types, true);
}

/// The packed converter between an N-bit side and the whole-byte `element` type.
typeconv::IPromote* CreatePacked(const DataType& element, const DataType& from,
                                 const DataType& to) {
    const std::unique_ptr<IPromoteFactory> inner(InnerFactoryDispatch::Dispatch({element}, false));
    return inner->Create(from, to);
}

bool IsPacked(const DataType& type) { return type.bits % 8 != 0; }

}  // namespace

PromoteFactory::PromoteFactory() = default;
PromoteFactory::PromoteFactory(const PromoteFactory&) = default;
PromoteFactory& PromoteFactory::operator=(const PromoteFactory&) = default;
PromoteFactory::~PromoteFactory() = default;

typeconv::IPromote* PromoteFactory::Create(const DataType& from, const DataType& to) const {
    if (from == to) {
        return nullptr;
    }
    std::unique_ptr<typeconv::IPromote> result;
    try {
        result.reset(CreateFamily(from, to));
    } catch (const kora::Exception&) {
        // A descriptor that is no component type: the packed paths below may still apply.
    }
    // A packed descriptor never matches a component type, so `result` is null whenever
    // one of these two paths is taken; their failures reach the caller.
    if (IsPacked(from) && !IsPacked(to) && !from.isFloat) {
        return CreatePacked(to, from, to);
    }
    if (!IsPacked(from) && IsPacked(to) && !to.isFloat) {
        return CreatePacked(from, from, to);
    }
    return result.release();
}

}  // namespace kora::kubo
