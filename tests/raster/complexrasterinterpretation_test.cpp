#include "vrkframework/basic/kubo/raster/complexrasterinterpretation.h"

#include <gtest/gtest.h>

#include <cstring>
#include <limits>
#include <memory>
#include <type_traits>
#include <vector>

#include "support/expectfailure.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace {

using namespace kora::kubo;
using namespace kora::core;

constexpr char kSource[] = "vrkframework/basic/kubo/raster/complexrasterinterpretation";
constexpr char kIntoSignature[] =
    "void __cdecl kora::kubo::ComplexInterpretation::InterpretRaster(const class "
    "kora::kubo::Raster *,class kora::kubo::Raster *,enum kora::core::KORAInterpretationTypes) "
    "const";
constexpr char kNewSignature[] =
    "class kora::kubo::Raster *__cdecl kora::kubo::ComplexInterpretation::InterpretRaster(const "
    "class kora::kubo::Raster *,enum kora::core::KORAInterpretationTypes) const";
constexpr char kNotComplex[] =
    "This raster interpretation class can only interpret complex rasters.";

template <class T>
Raster MakeRaster(const DataType& type, const std::vector<T>& components, unsigned int width = 1,
                  unsigned int height = 1, unsigned int channels = 1,
                  const RasterContext& context = RasterContext()) {
    Raster raster(RasterInfo(width, height, channels, type), context);
    EXPECT_EQ(raster.byteSize, components.size() * sizeof(T));
    std::memcpy(raster.data, components.data(), raster.byteSize);
    return raster;
}

std::vector<float> Floats(const Raster& raster) {
    std::vector<float> values(raster.byteSize / sizeof(float));
    std::memcpy(values.data(), raster.data, values.size() * sizeof(float));
    return values;
}

template <class T, const DataType* kType>
struct Component {
    using Type = T;
    static const DataType& Descriptor() { return *kType; }
};
using ComponentCases = ::testing::Types<
    Component<char, &DataType::TypeC8S>, Component<unsigned char, &DataType::TypeC8U>,
    Component<short, &DataType::TypeC16S>, Component<unsigned short, &DataType::TypeC16U>,
    Component<int, &DataType::TypeC32S>, Component<unsigned int, &DataType::TypeC32U>,
    Component<float, &DataType::TypeC32R>, Component<double, &DataType::TypeC64R>,
    Component<std::int64_t, &DataType::TypeC64S>, Component<std::uint64_t, &DataType::TypeC64U>>;
template <class C>
class InnerProcessorReading : public ::testing::Test {};
TYPED_TEST_SUITE(InnerProcessorReading, ComponentCases);

// Integers all ones (-1 or 2^n - 1) and top bit alone (-2^(n-1) or 2^(n-1)) show the
// extension and the width read; both overloads read the real part first.
TYPED_TEST(InnerProcessorReading, ReadsEachComponentWithItsOwnExtension) {
    using T = typename TypeParam::Type;
    using Limits = std::numeric_limits<T>;
    std::vector<T> pair = {T(1.5), T(-0.25)};
    if constexpr (Limits::is_integer) {
        pair = {T(~T{0}), Limits::is_signed ? Limits::lowest() : T(Limits::max() / 2 + 1)};
    }
    const Raster in = MakeRaster(TypeParam::Descriptor(), pair);
    const ComplexInterpretation interpretation;
    const std::unique_ptr<Raster> real(interpretation.InterpretRaster(&in, INTERPRETATION_REAL));
    Raster imaginary(RasterInfo(1, 1, 1, DataType::Type32R), RasterContext());
    interpretation.InterpretRaster(&in, &imaginary, INTERPRETATION_IMAGINARY);
    EXPECT_EQ(Floats(*real)[0], static_cast<float>(static_cast<double>(pair[0])));
    EXPECT_EQ(Floats(imaginary)[0], static_cast<float>(static_cast<double>(pair[1])));
    EXPECT_NE(dynamic_cast<const ComplexInterpretation::InnerProcessor<T>*>(
                  interpretation.GetProcessor()),
              nullptr);
}

TEST(ComplexInterpretation, ConvertsTheWholeBufferMarginsIncluded) {
    // C16S, 3 x 2, 2 channels, margins 1 and 2: (3 + 2) x (2 + 4) x 2 = 60 samples (i, -i).
    std::vector<short> components;
    std::vector<float> real(61, -5.0f);
    std::vector<float> imaginary;
    for (short i = 0; i < 60; ++i) {
        components.insert(components.end(), {i, static_cast<short>(-i)});
        real[static_cast<std::size_t>(i)] = i;
        imaginary.push_back(-i);
    }
    const Raster in =
        MakeRaster(DataType::TypeC16S, components, 3, 2, 2, RasterContext(1, 2, 5, 6));
    const std::unique_ptr<Raster> out(
        ComplexInterpretation().InterpretRaster(&in, INTERPRETATION_IMAGINARY));
    EXPECT_EQ(out->dataType, DataType::Type32R);
    EXPECT_EQ(std::vector<unsigned int>({out->width, out->height, out->channels, out->xMargin,
                                         out->yMargin, out->xOffset, out->yOffset}),
              std::vector<unsigned int>({3, 2, 2, 1, 2, 5, 6}));
    ASSERT_TRUE(out->ownsData);
    EXPECT_EQ(Floats(*out), imaginary);
    // An existing output takes the input's sample count whatever its own geometry.
    Raster longer = MakeRaster(DataType::Type32R, std::vector<float>(61, -5.0f), 61, 1);
    ComplexInterpretation().InterpretRaster(&in, &longer, INTERPRETATION_REAL);
    EXPECT_EQ(Floats(longer), real);
}

// Buffers that cannot hold the samples are reported before anything is written: an output
// smaller than the input, an input without a buffer or with fewer bytes than its extent.
TEST(ComplexInterpretation, RejectsBuffersThatDoNotHoldTheSamples) {
    const Raster in = MakeRaster(DataType::TypeC16S, std::vector<short>(12), 3, 2);
    Raster shorter = MakeRaster(DataType::Type32R, std::vector<float>(5, -5.0f), 5, 1);
    Raster noBuffer;
    noBuffer.width = noBuffer.height = noBuffer.channels = 1;
    noBuffer.dataType = DataType::TypeC32R;
    Raster shortBuffer = MakeRaster(DataType::TypeC16S, std::vector<short>(12), 3, 2);
    shortBuffer.byteSize = 23;
    const ComplexInterpretation interpretation;
    const struct {
        const Raster* in;
        Raster* out;
        const char* message;
    } cases[] = {
        {&in, &shorter, "The out raster buffer does not hold the input's samples."},
        {&noBuffer, &shorter, "The raster buffer does not hold its samples."},
        {&shortBuffer, &shorter, "The raster buffer does not hold its samples."},
        {&noBuffer, nullptr, "The raster buffer does not hold its samples."},
    };
    for (const auto& c : cases) {
        const auto failure = kubo_test::Catch<kora::DataException>([&] {
            if (c.out != nullptr) {
                interpretation.InterpretRaster(c.in, c.out, INTERPRETATION_REAL);
            } else {
                delete interpretation.InterpretRaster(c.in, INTERPRETATION_REAL);
            }
        });
        ASSERT_TRUE(failure.has_value()) << c.message;
        kubo_test::ExpectReport(*failure, c.message, kSource,
                                c.out != nullptr ? kIntoSignature : kNewSignature, 0);
    }
    EXPECT_EQ(Floats(shorter), std::vector<float>(5, -5.0f));
}

TEST(ComplexInterpretation, CachesOneWorkerPerTypeAndCopiesShareIt) {
    const Raster c32r = MakeRaster(DataType::TypeC32R, std::vector<float>{1, 2});
    const Raster c16s = MakeRaster(DataType::TypeC16S, std::vector<short>{-1, 2});
    const Raster c16u = MakeRaster(DataType::TypeC16U, std::vector<unsigned short>{65535, 2});
    auto original = std::make_unique<ComplexInterpretation>();
    EXPECT_EQ(original->GetProcessor(), nullptr);
    delete original->InterpretRaster(&c32r, INTERPRETATION_REAL);
    const IRasterInterpretation* worker = original->GetProcessor();
    delete original->InterpretRaster(&c32r, INTERPRETATION_PHASE);
    EXPECT_EQ(original->GetProcessor(), worker);
    const ComplexInterpretation copy(*original);
    ComplexInterpretation assigned;
    delete assigned.InterpretRaster(&c16s, INTERPRETATION_REAL);
    assigned = copy;
    EXPECT_EQ(copy.GetProcessor(), worker);
    EXPECT_EQ(assigned.GetProcessor(), worker);
    // Same width, other signedness: a new worker reads the other extension. The original
    // then goes; the copies keep the shared worker alive.
    delete original->InterpretRaster(&c16s, INTERPRETATION_REAL);
    const std::unique_ptr<Raster> c16uOut(original->InterpretRaster(&c16u, INTERPRETATION_REAL));
    EXPECT_EQ(Floats(*c16uOut)[0], 65535.0f);
    original.reset();
    const std::unique_ptr<Raster> out(copy.InterpretRaster(&c32r, INTERPRETATION_IMAGINARY));
    EXPECT_EQ(Floats(*out)[0], 2.0f);
    EXPECT_EQ(assigned.GetProcessor(), worker);
}

// A complex type the dispatcher does not know fails there and keeps the previous worker.
TEST(ComplexInterpretation, ChecksInOrderAndWritesNothingOnFailure) {
    const Raster real32 = MakeRaster(DataType::Type32R, std::vector<float>{7});
    const Raster c32r = MakeRaster(DataType::TypeC32R, std::vector<float>{1, 2});
    const Raster packed(RasterInfo(1, 1, 1, DataType(12, false, false, 12, 0, true)),
                        RasterContext());
    Raster out = MakeRaster(DataType::Type32R, std::vector<float>{-5});
    Raster out16 = MakeRaster(DataType::Type16S, std::vector<short>{-5});
    const struct {
        bool intoExisting;
        const Raster* in;
        Raster* out;
        const char* message;
        unsigned int line;
    } cases[] = {
        {true, nullptr, nullptr, "This raster is NULL.", 34},
        {true, &real32, nullptr, "This out raster is NULL.", 39},
        {true, &real32, &out16, "The out raster must be 32R.", 45},
        {true, &real32, &out, kNotComplex, 52},
        {false, nullptr, nullptr, "This raster is NULL.", 83},
        {false, &real32, nullptr, kNotComplex, 90},
    };
    const ComplexInterpretation interpretation;
    delete interpretation.InterpretRaster(&c32r, INTERPRETATION_REAL);
    const IRasterInterpretation* worker = interpretation.GetProcessor();
    for (const auto& c : cases) {
        const auto failure = kubo_test::Catch<kora::Exception>([&] {
            if (c.intoExisting) {
                interpretation.InterpretRaster(c.in, c.out, INTERPRETATION_REAL);
            } else {
                delete interpretation.InterpretRaster(c.in, INTERPRETATION_REAL);
            }
        });
        ASSERT_TRUE(failure.has_value()) << c.line;
        kubo_test::ExpectReport(*failure, c.message, kSource,
                                c.intoExisting ? kIntoSignature : kNewSignature, c.line);
    }
    const auto failure = kubo_test::Catch<kora::Exception>(
        [&] { interpretation.InterpretRaster(&packed, &out, INTERPRETATION_REAL); });
    ASSERT_TRUE(failure.has_value());
    EXPECT_EQ(failure->GetMessage(), "Invalid type requested.");
    EXPECT_EQ(Floats(out)[0], -5.0f);
    EXPECT_EQ(interpretation.GetProcessor(), worker);
    interpretation.InterpretRaster(&c32r, &out, INTERPRETATION_IMAGINARY);
    EXPECT_EQ(Floats(out)[0], 2.0f);
}

TEST(ComplexInterpretation, WorkersLeaveNullRastersAloneAndUnknownCodesLeakNothing) {
    const ComplexInterpretation::InnerProcessor<float> worker;
    Raster out = MakeRaster(DataType::Type32R, std::vector<float>{-5});
    worker.InterpretRaster(nullptr, &out, INTERPRETATION_REAL);
    EXPECT_EQ(Floats(out)[0], -5.0f);
    EXPECT_EQ(worker.InterpretRaster(nullptr, INTERPRETATION_REAL), nullptr);
    const Raster c32r = MakeRaster(DataType::TypeC32R, std::vector<float>{1, 2});
    const auto unknown = static_cast<KORAInterpretationTypes>(7);
    EXPECT_THROW(delete ComplexInterpretation().InterpretRaster(&c32r, unknown), kora::Exception);
}

}  // namespace
