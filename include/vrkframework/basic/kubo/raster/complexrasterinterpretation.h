// Complex rasters read as real 32R rasters through a per-type worker chosen at run time.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_COMPLEXRASTERINTERPRETATION_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_COMPLEXRASTERINTERPRETATION_H

#include <memory>  // std::shared_ptr

#include "vrkframework/basic/core/typeconv/typelist.h"  // KUBO_FOR_EACH_COMPONENT_TYPE
#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/raster/datatype.h"
#include "vrkframework/basic/kubo/raster/irasterinterpretation.h"
#include "vrkframework/platform/interpretation.h"

namespace kora::kubo {
/// Applies an interpretation function f(real, imaginary) to every (real, imaginary) pair of
/// a complex raster, margins included, and stores the results as 32-bit floats.
///
/// The worker for the input's sample type is cached: it is reused while the type stays the
/// same and replaced when it changes. Copies share the worker (it is released by its last
/// holder). The cache makes one object unsafe to share between threads, even through const
/// access.
class KUBO_API ComplexInterpretation : public IRasterInterpretation {
public:
    /// The worker for one component type T of the dispatch list (or any type with its
    /// traits): reads each component as T (sign extension for signed integers, zero
    /// extension for unsigned ones, widening for float) and converts it to double. A null
    /// raster is left alone (the new-raster overload returns null for it);
    /// ComplexInterpretation checks the rest.
    /// @throws kora::DataException when the input's buffer (none, or fewer bytes than its
    ///   extent) or the output's does not hold the input's samples, before writing.
    template <class T>
    class InnerProcessor;
    /// The worker of the component type T (one of the ten) that InnerProcessor<T> is for
    /// every type with T's traits.
    template <class T>
    class ComponentProcessor;

    /// No worker yet.
    ComplexInterpretation();
    /// Shares `other`'s worker.
    ComplexInterpretation(const ComplexInterpretation& other);
    /// Shares `other`'s worker; the worker held before goes once its last holder does.
    ComplexInterpretation& operator=(const ComplexInterpretation& other);
    /// Takes over `other`'s worker; `other` is left without one.
    ComplexInterpretation(ComplexInterpretation&& other) noexcept;
    /// Takes over `other`'s worker, `other` is left without one; the worker held before
    /// goes once its last holder does.
    ComplexInterpretation& operator=(ComplexInterpretation&& other) noexcept;
    ~ComplexInterpretation() override;

    /// Writes f(real, imaginary) of each of the (height + 2 yMargin) x (width + 2 xMargin) x
    /// channels samples of `in` as consecutive floats from the start of `out`'s buffer.
    /// `out`'s geometry is not compared with `in`'s: it must hold at least as many samples.
    /// @throws kora::Exception, in this order of checks: "This raster is NULL." (`in` null),
    ///   "This out raster is NULL.", "The out raster must be 32R.", "This raster
    ///   interpretation class can only interpret complex rasters."; the dispatcher's failure
    ///   for a complex type it does not know; FindInterpretation's for an unknown code.
    ///   kora::DataException when `in`'s buffer does not hold its extent (no buffer, or fewer
    ///   bytes than its description needs) or `out`'s does not hold as many samples.
    ///   Nothing is written to `out` when it throws.
    void InterpretRaster(const Raster* in, Raster* out,
                         kora::core::KORAInterpretationTypes type) const override;
    /// Returns a new 32R raster with `in`'s size, channels and context (margins included),
    /// holding the interpretation of `in`'s whole buffer; the caller deletes it.
    /// @throws kora::Exception "This raster is NULL." or "This raster interpretation class
    ///   can only interpret complex rasters.", then as the other overload.
    Raster* InterpretRaster(const Raster* in,
                            kora::core::KORAInterpretationTypes type) const override;

    /// The cached worker (null before the first successful choice), shared with copies.
    const IRasterInterpretation* GetProcessor() const;

private:
    const IRasterInterpretation& Processor(const DataType& type) const;

    mutable std::shared_ptr<IRasterInterpretation> m_processor;
    mutable DataType m_processorType;
};

template <class T>
class KUBO_API ComplexInterpretation::ComponentProcessor : public IRasterInterpretation {
public:
    /// See InnerProcessor.
    void InterpretRaster(const Raster* in, Raster* out,
                         kora::core::KORAInterpretationTypes type) const override;
    /// See InnerProcessor.
    Raster* InterpretRaster(const Raster* in,
                            kora::core::KORAInterpretationTypes type) const override;
};

template <class T>
class KUBO_API ComplexInterpretation::InnerProcessor
    : public ComponentProcessor<typeconv::priv::Component<T>> {};

#define KUBO_DETAIL_EXTERN_INNER_PROCESSOR(T)                                    \
    extern template class KUBO_API ComplexInterpretation::ComponentProcessor<T>; \
    extern template class KUBO_API ComplexInterpretation::InnerProcessor<T>;
KUBO_FOR_EACH_COMPONENT_TYPE(KUBO_DETAIL_EXTERN_INNER_PROCESSOR)
#undef KUBO_DETAIL_EXTERN_INNER_PROCESSOR

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_COMPLEXRASTERINTERPRETATION_H
