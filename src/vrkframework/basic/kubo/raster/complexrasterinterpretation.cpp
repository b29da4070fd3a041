// Complex-to-real interpretation: the argument checks, the cached per-type worker and the
// per-sample loop every component type shares.
#include "vrkframework/basic/kubo/raster/complexrasterinterpretation.h"

#include <cstdint>  // std::uint64_t
#include <cstring>  // std::memcpy
#include <utility>  // std::move

#include "vrkframework/basic/core/typedispatch/extendtypedispatch.h"
#include "vrkframework/basic/kubo/raster/bufferextent.h"
#include "vrkframework/basic/kubo/raster/raster.h"
#include "vrkframework/platform/exception.h"

namespace kora::kubo {
namespace {

using kora::core::InterpretationFunction;
using kora::core::KORAInterpretationTypes;

constexpr char kSourcePath[] = "vrkframework/basic/kubo/raster/complexrasterinterpretation";
constexpr char kIntoSignature[] =
    "void __cdecl kora::kubo::ComplexInterpretation::InterpretRaster(const class "
    "kora::kubo::Raster *,class kora::kubo::Raster *,enum kora::core::KORAInterpretationTypes) "
    "const";
constexpr char kNewSignature[] =
    "class kora::kubo::Raster *__cdecl kora::kubo::ComplexInterpretation::InterpretRaster(const "
    "class kora::kubo::Raster *,enum kora::core::KORAInterpretationTypes) const";
constexpr char kNullInput[] = "This raster is NULL.";
constexpr char kNotComplex[] =
    "This raster interpretation class can only interpret complex rasters.";

using Dispatcher = kora::typedispatch::ExtendDispatchTypes<
    kora::typedispatch::Factory1Template<ComplexInterpretation::InnerProcessor,
                                         IRasterInterpretation>,
    1, typeconv::priv::ComponentTypes, typeconv::priv::ComponentTypes,
    typeconv::priv::NullDataType>;

// Samples of the whole buffer, margins included.
std::uint64_t SampleCount(const Raster& raster) {
    return detail::SaturatingProduct(detail::BufferPixels(raster, raster), raster.channels);
}

// Converts every sample of `in` into the 32-bit floats of `out`, after checking that both
// buffers hold them: a raster without a buffer or with fewer bytes than its extent, or an
// output too small, is reported before anything is written.
template <class T>
void Interpret(InterpretationFunction function, const Raster& in, Raster& out,
               const char* signature) {
    constexpr std::size_t kPairBytes = 2 * sizeof(T);
    const std::uint64_t count = SampleCount(in);
    if (detail::BufferBytes(in) / kPairBytes < count) {
        throw kora::DataException("The raster buffer does not hold its samples.", kSourcePath,
                                  signature, 0);
    }
    if (detail::BufferBytes(out) / sizeof(float) < count) {
        throw kora::DataException("The out raster buffer does not hold the input's samples.",
                                  kSourcePath, signature, 0);
    }
    const unsigned char* source = in.data;
    unsigned char* target = out.data;
    // memcpy reads and writes whatever the buffer's alignment; each compiles to one move.
    for (std::uint64_t i = 0; i < count; ++i) {
        T pair[2];
        std::memcpy(pair, source + i * kPairBytes, kPairBytes);
        const auto value = static_cast<float>(
            function(static_cast<double>(pair[0]), static_cast<double>(pair[1])));
        std::memcpy(target + i * sizeof(float), &value, sizeof(float));
    }
}

}  // namespace

IRasterInterpretation::~IRasterInterpretation() = default;

ComplexInterpretation::ComplexInterpretation() = default;
ComplexInterpretation::ComplexInterpretation(const ComplexInterpretation& other) = default;
ComplexInterpretation& ComplexInterpretation::operator=(const ComplexInterpretation& other) =
    default;
ComplexInterpretation::ComplexInterpretation(ComplexInterpretation&& other) noexcept = default;
ComplexInterpretation& ComplexInterpretation::operator=(ComplexInterpretation&& other) noexcept =
    default;
ComplexInterpretation::~ComplexInterpretation() = default;

void ComplexInterpretation::InterpretRaster(const Raster* in, Raster* out,
                                            KORAInterpretationTypes type) const {
    if (in == nullptr) {
        throw kora::Exception(kNullInput, kSourcePath, kIntoSignature, 34);
    }
    if (out == nullptr) {
        throw kora::Exception("This out raster is NULL.", kSourcePath, kIntoSignature, 39);
    }
    if (out->dataType != DataType::Type32R) {
        throw kora::Exception("The out raster must be 32R.", kSourcePath, kIntoSignature, 45);
    }
    if (!in->dataType.isComplex) {
        throw kora::Exception(kNotComplex, kSourcePath, kIntoSignature, 52);
    }
    Processor(in->dataType).InterpretRaster(in, out, type);
}

Raster* ComplexInterpretation::InterpretRaster(const Raster* in,
                                               KORAInterpretationTypes type) const {
    if (in == nullptr) {
        throw kora::Exception(kNullInput, kSourcePath, kNewSignature, 83);
    }
    if (!in->dataType.isComplex) {
        throw kora::Exception(kNotComplex, kSourcePath, kNewSignature, 90);
    }
    return Processor(in->dataType).InterpretRaster(in, type);
}

const IRasterInterpretation* ComplexInterpretation::GetProcessor() const {
    return m_processor.get();
}

const IRasterInterpretation& ComplexInterpretation::Processor(const DataType& type) const {
    if (m_processor == nullptr || m_processorType != type) {
        // Dispatch before touching the cache: a type the dispatcher rejects leaves the
        // previous worker in place and usable.
        std::shared_ptr<IRasterInterpretation> processor(Dispatcher::Dispatch({type}, true));
        m_processor = std::move(processor);
        m_processorType = type;
    }
    return *m_processor;
}

template <class T>
void ComplexInterpretation::ComponentProcessor<T>::InterpretRaster(
    const Raster* in, Raster* out, KORAInterpretationTypes type) const {
    const InterpretationFunction function = kora::core::FindInterpretation(type);
    if (in != nullptr && out != nullptr) {
        Interpret<T>(function, *in, *out, kIntoSignature);
    }
}

template <class T>
Raster* ComplexInterpretation::ComponentProcessor<T>::InterpretRaster(
    const Raster* in, KORAInterpretationTypes type) const {
    // The function is looked up before the allocation, so an unknown code leaks nothing.
    const InterpretationFunction function = kora::core::FindInterpretation(type);
    if (in == nullptr) {
        return nullptr;
    }
    auto out =
        std::make_unique<Raster>(RasterInfo(in->width, in->height, in->channels, DataType::Type32R),
                                 static_cast<const RasterContext&>(*in));
    Interpret<T>(function, *in, *out, kNewSignature);
    return out.release();
}

#define KUBO_DETAIL_INSTANTIATE_INNER_PROCESSOR(T)               \
    template class ComplexInterpretation::ComponentProcessor<T>; \
    template class ComplexInterpretation::InnerProcessor<T>;
KUBO_FOR_EACH_COMPONENT_TYPE(KUBO_DETAIL_INSTANTIATE_INNER_PROCESSOR)
#undef KUBO_DETAIL_INSTANTIATE_INNER_PROCESSOR

}  // namespace kora::kubo
