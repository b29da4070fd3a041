#include "vrkframework/basic/kubo/raster/complexrasterinterpretation.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
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

// Each component type with the complex descriptor that selects it.
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

// Integers: all ones (-1 signed, 2^n - 1 unsigned) and the top bit alone (-2^(n-1) signed,
// 2^(n-1) unsigned) show sign and zero extension.
TYPED_TEST(InnerProcessorReading, ReadsEachComponentWithItsOwnExtension) {
    using T = typename TypeParam::Type;
    std::vector<T> pair(2);
    double expected[2] = {1.5, -0.25};
    if constexpr (std::is_floating_point_v<T>) {
        pair = {T(1.5), T(-0.25)};
    } else {
        using U = std::make_unsigned_t<T>;
        constexpr int kBits = sizeof(T) * 8;
        const U patterns[2] = {U(~U{0}), static_cast<U>(U{1} << (kBits - 1))};
        std::memcpy(pair.data(), patterns, sizeof patterns);
        const bool isSigned = std::is_signed_v<T>;
        expected[0] = isSigned ? -1.0 : std::ldexp(1.0, kBits) - 1.0;
        expected[1] = (isSigned ? -1.0 : 1.0) * std::ldexp(1.0, kBits - 1);
    }
    const Raster in = MakeRaster(TypeParam::Descriptor(), pair);
    const ComplexInterpretation interpretation;
    const std::unique_ptr<Raster> real(interpretation.InterpretRaster(&in, INTERPRETATION_REAL));
    Raster imaginary(RasterInfo(1, 1, 1, DataType::Type32R), RasterContext());
    interpretation.InterpretRaster(&in, &imaginary, INTERPRETATION_IMAGINARY);
    EXPECT_EQ(Floats(*real)[0], static_cast<float>(expected[0]));
    EXPECT_EQ(Floats(imaginary)[0], static_cast<float>(expected[1]));
    EXPECT_NE(dynamic_cast<const ComplexInterpretation::InnerProcessor<T>*>(
                  interpretation.GetProcessor()),
              nullptr);
}

TEST(ComplexInterpretation, AppliesEachInterpretationToRealThenImaginary) {
    const Raster in = MakeRaster(DataType::TypeC32R, std::vector<float>{3, 4});
    const struct {
        KORAInterpretationTypes type;
        double value;
    } cases[] = {{INTERPRETATION_REAL, 3},       {INTERPRETATION_IMAGINARY, 4},
                 {INTERPRETATION_AMPLITUDE, 5},  {INTERPRETATION_PHASE, 0.9272952180016122},
                 {INTERPRETATION_INTENSITY, 25}, {INTERPRETATION_DB, 13.979400086720377}};
    const ComplexInterpretation interpretation;
    for (const auto& entry : cases) {
        const std::unique_ptr<Raster> out(interpretation.InterpretRaster(&in, entry.type));
        EXPECT_FLOAT_EQ(Floats(*out)[0], static_cast<float>(entry.value)) << entry.type;
    }
}

TEST(ComplexInterpretation, NewRasterKeepsGeometryAndConvertsTheMarginsToo) {
    // C16S, 3 x 2, 2 channels, margins 1 and 2: (3 + 2) x (2 + 4) x 2 = 60 samples (i, -i).
    std::vector<short> components;
    for (short i = 0; i < 60; ++i) {
        components.insert(components.end(), {i, static_cast<short>(-i)});
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
    const std::vector<float> values = Floats(*out);
    ASSERT_EQ(values.size(), 60u);
    for (unsigned int i = 0; i < 60; ++i) {
        EXPECT_EQ(values[i], -static_cast<float>(i)) << i;
    }
}

TEST(ComplexInterpretation, ExistingRasterTakesTheInputsSampleCountWhateverItsGeometry) {
    const Raster in =
        MakeRaster(DataType::TypeC8U, std::vector<unsigned char>{1, 9, 2, 8, 3, 7}, 3, 1);
    Raster out(RasterInfo(2, 2, 1, DataType::Type32R), RasterContext());
    std::memset(out.data, 0xEE, out.byteSize);
    ComplexInterpretation().InterpretRaster(&in, &out, INTERPRETATION_REAL);
    float untouched;
    std::memset(&untouched, 0xEE, sizeof untouched);
    EXPECT_EQ(Floats(out), std::vector<float>({1, 2, 3, untouched}));

    // An owned output smaller than the input takes what it holds and no more.
    Raster small(RasterInfo(2, 1, 1, DataType::Type32R), RasterContext());
    ComplexInterpretation().InterpretRaster(&in, &small, INTERPRETATION_IMAGINARY);
    EXPECT_EQ(Floats(small), std::vector<float>({9, 8}));
}

TEST(ComplexInterpretation, ReusesTheWorkerWhileTheTypeStaysAndReplacesItWhenItChanges) {
    const Raster c32r = MakeRaster(DataType::TypeC32R, std::vector<float>{1, 2});
    const Raster c16u = MakeRaster(DataType::TypeC16U, std::vector<unsigned short>{65535, 2});
    const Raster c16s = MakeRaster(DataType::TypeC16S, std::vector<short>{-1, 2});
    ComplexInterpretation interpretation;
    EXPECT_EQ(interpretation.GetProcessor(), nullptr);
    delete interpretation.InterpretRaster(&c32r, INTERPRETATION_REAL);
    const IRasterInterpretation* worker = interpretation.GetProcessor();
    EXPECT_NE(dynamic_cast<const ComplexInterpretation::InnerProcessor<float>*>(worker), nullptr);
    delete interpretation.InterpretRaster(&c32r, INTERPRETATION_PHASE);
    EXPECT_EQ(interpretation.GetProcessor(), worker);

    // Same width, other signedness: a new worker reads the other extension.
    delete interpretation.InterpretRaster(&c16s, INTERPRETATION_REAL);
    std::unique_ptr<Raster> out(interpretation.InterpretRaster(&c16u, INTERPRETATION_REAL));
    EXPECT_EQ(Floats(*out)[0], 65535.0f);
    EXPECT_NE(dynamic_cast<const ComplexInterpretation::InnerProcessor<unsigned short>*>(
                  interpretation.GetProcessor()),
              nullptr);
}

TEST(ComplexInterpretation, CopiesShareTheWorkerAndEachReleasesItsOwnShare) {
    const Raster c32r = MakeRaster(DataType::TypeC32R, std::vector<float>{1, 2});
    const Raster c8s = MakeRaster(DataType::TypeC8S, std::vector<char>{-3, 4});
    auto original = std::make_unique<ComplexInterpretation>();
    delete original->InterpretRaster(&c32r, INTERPRETATION_REAL);
    const ComplexInterpretation copy(*original);
    ComplexInterpretation assigned;
    delete assigned.InterpretRaster(&c8s, INTERPRETATION_REAL);
    assigned = copy;
    EXPECT_EQ(copy.GetProcessor(), original->GetProcessor());
    EXPECT_EQ(assigned.GetProcessor(), original->GetProcessor());

    // The original moves on and goes; the copies keep the shared worker alive.
    delete original->InterpretRaster(&c8s, INTERPRETATION_REAL);
    EXPECT_NE(original->GetProcessor(), copy.GetProcessor());
    original.reset();
    const std::unique_ptr<Raster> out(copy.InterpretRaster(&c32r, INTERPRETATION_IMAGINARY));
    EXPECT_EQ(Floats(*out)[0], 2.0f);
    EXPECT_EQ(assigned.GetProcessor(), copy.GetProcessor());
}

TEST(ComplexInterpretation, ChecksInOrderAndWritesNothingOnFailure) {
    const Raster c32r = MakeRaster(DataType::TypeC32R, std::vector<float>{1, 2});
    const Raster real32 = MakeRaster(DataType::Type32R, std::vector<float>{7});
    Raster out = MakeRaster(DataType::Type32R, std::vector<float>{-5});
    Raster out16 = MakeRaster(DataType::Type16S, std::vector<short>{-5});
    const ComplexInterpretation interpretation;
    const struct {
        const Raster* in;
        Raster* out;
        const char* message;
        unsigned int line;
    } cases[] = {
        {nullptr, nullptr, "This raster is NULL.", 34},
        {&real32, nullptr, "This out raster is NULL.", 39},
        {&real32, &out16, "The out raster must be 32R.", 45},
        {&real32, &out, "This raster interpretation class can only interpret complex rasters.", 52},
    };
    for (const auto& entry : cases) {
        const auto failure = kubo_test::Catch<kora::Exception>(
            [&] { interpretation.InterpretRaster(entry.in, entry.out, INTERPRETATION_REAL); });
        ASSERT_TRUE(failure.has_value()) << entry.message;
        kubo_test::ExpectReport(*failure, entry.message, kSource, kIntoSignature, entry.line);
    }
    EXPECT_EQ(Floats(out)[0], -5.0f);
    EXPECT_EQ(interpretation.GetProcessor(), nullptr);

    auto failure = kubo_test::Catch<kora::Exception>(
        [&] { delete interpretation.InterpretRaster(nullptr, INTERPRETATION_REAL); });
    ASSERT_TRUE(failure.has_value());
    kubo_test::ExpectReport(*failure, "This raster is NULL.", kSource, kNewSignature, 83);
    failure = kubo_test::Catch<kora::Exception>(
        [&] { delete interpretation.InterpretRaster(&real32, INTERPRETATION_REAL); });
    ASSERT_TRUE(failure.has_value());
    kubo_test::ExpectReport(*failure,
                            "This raster interpretation class can only interpret complex rasters.",
                            kSource, kNewSignature, 90);
}

TEST(ComplexInterpretation, DispatcherFailureKeepsThePreviousWorkerUsable) {
    const Raster c32r = MakeRaster(DataType::TypeC32R, std::vector<float>{1, 2});
    Raster packed(RasterInfo(1, 1, 1, DataType(12, false, false, 12, 0, true)), RasterContext());
    Raster out = MakeRaster(DataType::Type32R, std::vector<float>{-5});
    ComplexInterpretation interpretation;
    interpretation.InterpretRaster(&c32r, &out, INTERPRETATION_REAL);
    const IRasterInterpretation* worker = interpretation.GetProcessor();
    out.data[0] = 0x55;
    const auto failure = kubo_test::Catch<kora::Exception>(
        [&] { interpretation.InterpretRaster(&packed, &out, INTERPRETATION_REAL); });
    ASSERT_TRUE(failure.has_value());
    EXPECT_EQ(failure->GetMessage(), "Invalid type requested.");
    EXPECT_EQ(failure->GetSourceFile(), "vrkframework/basic/core/typedispatch/extendtypedispatch");
    EXPECT_EQ(failure->GetLine(), 175u);
    EXPECT_EQ(out.data[0], 0x55);
    EXPECT_EQ(interpretation.GetProcessor(), worker);
    interpretation.InterpretRaster(&c32r, &out, INTERPRETATION_IMAGINARY);
    EXPECT_EQ(Floats(out)[0], 2.0f);
}

TEST(ComplexInterpretation, WorkersLeaveNullRastersAlone) {
    const ComplexInterpretation::InnerProcessor<float> worker;
    Raster out = MakeRaster(DataType::Type32R, std::vector<float>{-5});
    worker.InterpretRaster(nullptr, &out, INTERPRETATION_REAL);
    EXPECT_EQ(Floats(out)[0], -5.0f);
    EXPECT_EQ(worker.InterpretRaster(nullptr, INTERPRETATION_REAL), nullptr);
}

TEST(ComplexInterpretation, UnknownInterpretationCodeFailsWithoutLeaking) {
    const Raster c32r = MakeRaster(DataType::TypeC32R, std::vector<float>{1, 2});
    const auto unknown = static_cast<KORAInterpretationTypes>(7);
    EXPECT_THROW(delete ComplexInterpretation().InterpretRaster(&c32r, unknown), kora::Exception);
}

}  // namespace
