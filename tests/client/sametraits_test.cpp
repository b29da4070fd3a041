// A client's view of the conversion templates: any arithmetic type with the traits of a
// component type (`long long` where std::int64_t is `long`, `signed char`) instantiates and
// links them, converting exactly as the component type does. Built as C++17 and as C++20.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <memory>
#include <vector>

#include "vrkframework/basic/kubo/kubo.h"

namespace {

using kora::kubo::DataType;

template <class B, class A>
std::vector<B> Converted(typeconv::IPromote&& promote, const std::vector<A>& input,
                         unsigned int samples) {
    std::vector<B> output(input.size(), B(77));
    promote.Promote(input.data(), output.data(), samples);
    return output;
}

TEST(SameTraitTypes, ConvertAsTheirComponentType) {
    const std::vector<long long> wide = {-200, 1000, -(1LL << 40), (1LL << 40) + 3};
    const std::vector<std::int64_t> canonical(wide.begin(), wide.end());
    EXPECT_EQ((Converted<int>(typeconv::Promote<long long, int>(), wide, 4)),
              (Converted<int>(typeconv::Promote<std::int64_t, int>(), canonical, 4)));
    EXPECT_EQ((Converted<signed char>(typeconv::Promote<long long, signed char>(), wide, 4)),
              (std::vector<signed char>{56, 127, 0, 127}));
    const std::vector<unsigned long long> pairs = {1ULL << 63, 5};
    EXPECT_EQ((Converted<float>(typeconv::ComplexPromote<unsigned long long, float>(), pairs, 1)),
              (std::vector<float>{9.223372036854775808e18f, 5.0f}));
}

TEST(SameTraitTypes, PackAndUnpackAsTheirComponentType) {
    const unsigned char stream[] = {0xAB, 0xC1, 0x23};
    EXPECT_EQ((Converted<long long>(typeconv::SpecialPromote<12, long long, 0>(),
                                    std::vector<unsigned char>(stream, stream + 3), 2)),
              (std::vector<long long>{0xABC, 0x123, 77}));
    const long long samples[] = {0xABC, 0x123};
    unsigned char packed[3] = {};
    typeconv::BitDepthPromote<12, long long, 0, 0>::Pack(samples, packed, 2);
    EXPECT_EQ(std::vector<unsigned char>(packed, packed + 3),
              std::vector<unsigned char>(stream, stream + 3));
}

TEST(SameTraitTypes, FactoriesAndWorkersInstantiate) {
    const kora::kubo::PromoteFactory::InnerFactory<long long> inner;
    const std::unique_ptr<typeconv::IPromote> unpack(
        inner.Create(DataType(12, false, false, 12, 0, false), DataType::Type64S));
    using Unpack12 = typeconv::SpecialPromote<12, std::int64_t, 0>;
    EXPECT_NE(dynamic_cast<Unpack12*>(unpack.get()), nullptr);

    kora::kubo::Raster in(kora::kubo::RasterInfo(1, 1, 1, DataType::TypeC64S),
                          kora::kubo::RasterContext());
    const long long pair[] = {3, -4};
    std::copy(reinterpret_cast<const unsigned char*>(pair),
              reinterpret_cast<const unsigned char*>(pair) + sizeof pair, in.data);
    const kora::kubo::ComplexInterpretation::InnerProcessor<long long> worker;
    const std::unique_ptr<kora::kubo::Raster> amplitude(
        worker.InterpretRaster(&in, kora::core::INTERPRETATION_AMPLITUDE));
    float value = 0;
    std::copy(amplitude->data, amplitude->data + sizeof value,
              reinterpret_cast<unsigned char*>(&value));
    EXPECT_EQ(value, 5.0f);
}

}  // namespace
