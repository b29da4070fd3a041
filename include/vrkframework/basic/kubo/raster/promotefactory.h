// The entry point of sample conversion: the converter between any two sample types.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_PROMOTEFACTORY_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_PROMOTEFACTORY_H

#include <cstdint>  // std::int64_t, std::uint64_t

#include "vrkframework/basic/core/typeconv/typelist.h"
#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/raster/ipromotefactory.h"

namespace kora::kubo {
/// Chooses, creates and returns the converter between two sample types. Holds no data.
class KUBO_API PromoteFactory : public IPromoteFactory {
public:
    /// The inner factory of the component type T (one of the ten): creates the packed
    /// converters between N-bit streams and T (typeconv::SpecialPromote<N, T, S>); float
    /// and double create none.
    template <class T>
    class PackedFactory;
    /// The inner factory of any sample type T with the traits of a component type: the
    /// PackedFactory of that component type.
    template <class T>
    class InnerFactory;

    PromoteFactory();

    /// @name Copying
    ///@{

    /// Factories hold no data: any copy is interchangeable with its source.
    PromoteFactory(const PromoteFactory& other);
    PromoteFactory& operator=(const PromoteFactory& other);
    PromoteFactory(PromoteFactory&&) = default;
    PromoteFactory& operator=(PromoteFactory&&) = default;
    ///@}

    ~PromoteFactory() override;

    /// Null when `from` equals `to`. Otherwise the family chosen by the complex flags
    /// (Promote, ComplexPromote, Real2ComplexPromote, Complex2RealPromote) for the
    /// component types of the two descriptors; failing that, when exactly one side is a
    /// packed integer descriptor (bits not a multiple of 8) and the other a whole-byte
    /// one, the packed converter of that bit count and the whole side's element type;
    /// null for anything else (packed to packed, packed floating descriptors, unknown
    /// types). The caller deletes the result.
    /// @throws kora::Exception "Invalid type requested." when a packed side meets a
    /// whole-byte side that is no real component type (a complex type, for instance).
    typeconv::IPromote* Create(const DataType& from, const DataType& to) const override;
};

template <class T>
class KUBO_API PromoteFactory::PackedFactory : public IPromoteFactory {
public:
    /// n = from.bits, unpacking, unless `from` is whole-byte and `to` a packed integer
    /// descriptor: then n = to.bits, packing. Returns new SpecialPromote<n, T, 0 or 1>
    /// for n in 1..31 except 8 and 16; null otherwise and always for float and double.
    typeconv::IPromote* Create(const DataType& from, const DataType& to) const override;
};

template <class T>
class KUBO_API PromoteFactory::InnerFactory : public PackedFactory<typeconv::priv::Component<T>> {};

#define KUBO_DETAIL_EXTERN_INNER_FACTORY(T)                          \
    extern template class KUBO_API PromoteFactory::PackedFactory<T>; \
    extern template class KUBO_API PromoteFactory::InnerFactory<T>;
KUBO_FOR_EACH_COMPONENT_TYPE(KUBO_DETAIL_EXTERN_INNER_FACTORY)
#undef KUBO_DETAIL_EXTERN_INNER_FACTORY

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_PROMOTEFACTORY_H
