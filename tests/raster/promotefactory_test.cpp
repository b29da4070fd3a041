// Every branch of the promote factory, checked on the exact instance it creates.
#include "vrkframework/basic/kubo/raster/promotefactory.h"

#include <gtest/gtest.h>

#include <memory>
#include <typeinfo>
#include <vector>

#include "support/datatypes.h"
#include "support/expectfailure.h"
#include "vrkframework/basic/core/typeconv/complex2realpromote.h"
#include "vrkframework/basic/core/typeconv/complexpromote.h"
#include "vrkframework/basic/core/typeconv/packedpromote.h"
#include "vrkframework/basic/core/typeconv/promote.h"
#include "vrkframework/basic/core/typeconv/real2complexpromote.h"
#include "vrkframework/basic/kubo/raster/datatype.h"

namespace {

using kora::kubo::DataType;
using kora::kubo::PromoteFactory;
using typeconv::priv::ComplexDescriptor;
using typeconv::priv::RealDescriptor;

std::unique_ptr<typeconv::IPromote> Create(const DataType& from, const DataType& to) {
    return std::unique_ptr<typeconv::IPromote>(PromoteFactory().Create(from, to));
}

/// True when Create(from, to) makes an instance of exactly the class Expected.
template <class Expected>
bool Creates(const DataType& from, const DataType& to) {
    const std::unique_ptr<typeconv::IPromote> promote = Create(from, to);
    if (!promote) {
        return false;
    }
    const typeconv::IPromote& object = *promote;
    return typeid(object) == typeid(Expected) && dynamic_cast<Expected*>(promote.get()) != nullptr;
}

DataType Packed(unsigned int bits) { return DataType(bits, false, false, bits, 0, false); }

TEST(PromoteFactory, EqualTypesNeedNoConversion) {
    for (const DataType& type : kubo_test::kPredefinedTypes) {
        EXPECT_EQ(Create(type, type), nullptr);
    }
    EXPECT_EQ(Create(Packed(12), Packed(12)), nullptr);
    EXPECT_EQ(Create(DataType(), DataType()), nullptr);
}

template <class A, class B>
void CheckFamilies() {
    const DataType realA = RealDescriptor<A>();
    const DataType realB = RealDescriptor<B>();
    const DataType complexA = ComplexDescriptor<A>();
    const DataType complexB = ComplexDescriptor<B>();
    if (realA != realB) {
        EXPECT_TRUE((Creates<typeconv::Promote<A, B>>(realA, realB)));
        EXPECT_TRUE((Creates<typeconv::ComplexPromote<A, B>>(complexA, complexB)));
    }
    EXPECT_TRUE((Creates<typeconv::Real2ComplexPromote<A, B>>(realA, complexB)));
    EXPECT_TRUE((Creates<typeconv::Complex2RealPromote<A, B>>(complexA, realB)));
}

TEST(PromoteFactory, ChoosesTheFamilyByTheComplexFlagsForEveryPair) {
#define KUBO_TEST_FAMILIES(A, B) CheckFamilies<A, B>();
    KUBO_FOR_EACH_COMPONENT_PAIR(KUBO_TEST_FAMILIES)
#undef KUBO_TEST_FAMILIES
    EXPECT_TRUE((Creates<typeconv::Real2ComplexPromote<short, float>>(DataType::Type16S,
                                                                      DataType::TypeC32R)));
}

TEST(PromoteFactory, UnmatchedWholeByteTypesGiveNull) {
    const DataType unmatched[] = {
        DataType(),
        DataType(24, true, false, 24, 0, false),
        DataType(32, true, true, 24, 8, false),
        DataType(128, true, true, 128, 0, false),
        DataType(32, false, true, 23, 8, false),
    };
    for (const DataType& type : unmatched) {
        EXPECT_EQ(Create(type, DataType::Type8U), nullptr);
        EXPECT_EQ(Create(DataType::TypeC16S, type), nullptr);
    }
    // 24 bits is a whole number of bytes, so not packed, although SpecialPromote<24, ...>
    // exists; a 33-bit integer is packed but beyond 31 bits.
    EXPECT_EQ(Create(DataType(24, false, false, 24, 0, false), DataType::Type32S), nullptr);
    EXPECT_EQ(Create(Packed(33), DataType::Type64S), nullptr);
    EXPECT_EQ(Create(DataType::Type64S, Packed(33)), nullptr);
}

TEST(PromoteFactory, PackedSidesUseTheWholeSideElementType) {
    EXPECT_TRUE(
        (Creates<typeconv::SpecialPromote<12, unsigned short, 0>>(Packed(12), DataType::Type16U)));
    EXPECT_TRUE(
        (Creates<typeconv::SpecialPromote<12, unsigned short, 1>>(DataType::Type16U, Packed(12))));
    EXPECT_TRUE((Creates<typeconv::SpecialPromote<1, unsigned char, 0>>(DataType::Type1U,
                                                                        DataType::Type8U)));
    EXPECT_TRUE(
        (Creates<typeconv::SpecialPromote<31, std::int64_t, 1>>(DataType::Type64S, Packed(31))));
    // Signedness and the complex flag of the packed side are not looked at.
    EXPECT_TRUE((Creates<typeconv::SpecialPromote<5, int, 0>>(DataType(5, true, false, 5, 0, true),
                                                              DataType::Type32S)));
    // Created even when the element is too narrow; the conversion throws.
    EXPECT_TRUE(
        (Creates<typeconv::SpecialPromote<12, unsigned char, 1>>(DataType::Type8U, Packed(12))));
}

TEST(PromoteFactory, PackedPairsWithoutAConverterGiveNull) {
    EXPECT_EQ(Create(Packed(12), DataType::Type32R), nullptr);  // InnerFactory<float>
    EXPECT_EQ(Create(DataType::Type64R, Packed(12)), nullptr);  // InnerFactory<double>
    EXPECT_EQ(Create(Packed(12), Packed(4)), nullptr);
    const DataType packedFloat(12, true, true, 8, 3, false);
    EXPECT_EQ(Create(packedFloat, DataType::Type16U), nullptr);
    EXPECT_EQ(Create(DataType::Type16U, packedFloat), nullptr);
}

TEST(PromoteFactory, PackedSideWithAComplexOrUnknownWholeSideThrows) {
    const std::pair<DataType, DataType> pairs[] = {
        {Packed(12), DataType::TypeC16U},
        {DataType::TypeC8U, Packed(4)},
        {Packed(12), DataType(24, false, false, 24, 0, false)},
    };
    for (const auto& pair : pairs) {
        const auto failure =
            kubo_test::Catch<kora::Exception>([&] { Create(pair.first, pair.second); });
        ASSERT_TRUE(failure);
        EXPECT_EQ(failure->GetMessage(), "Invalid type requested.");
        EXPECT_EQ(failure->GetSourceFile(),
                  "vrkframework/basic/core/typedispatch/extendtypedispatch");
        EXPECT_EQ(failure->GetLine(), 175u);
    }
}

TEST(PromoteFactory, InnerFactoriesFollowTheirOwnRules) {
    // Packing only when `from` is whole-byte and `to` a packed integer; otherwise n =
    // from.bits, and 0, 8, 16 and anything above 31 give null.
    const PromoteFactory::InnerFactory<int> inner;
    const std::unique_ptr<typeconv::IPromote> promote(
        inner.Create(DataType(24, false, false, 24, 0, false), DataType::Type32S));
    EXPECT_TRUE((dynamic_cast<typeconv::SpecialPromote<24, int, 0>*>(promote.get()) != nullptr));
    const DataType packedFloat(12, true, true, 8, 3, false);
    for (const auto& [from, to] :
         std::vector<std::pair<DataType, DataType>>{{DataType::Type8U, DataType::Type32S},
                                                    {DataType::Type16U, packedFloat},
                                                    {DataType(), DataType::Type32S},
                                                    {Packed(33), DataType::Type32S},
                                                    {DataType::Type32S, Packed(40)}}) {
        EXPECT_EQ(std::unique_ptr<typeconv::IPromote>(inner.Create(from, to)), nullptr);
    }
    EXPECT_EQ(std::unique_ptr<typeconv::IPromote>(
                  PromoteFactory::InnerFactory<float>().Create(Packed(12), DataType::Type32R)),
              nullptr);
    EXPECT_EQ(std::unique_ptr<typeconv::IPromote>(
                  PromoteFactory::InnerFactory<double>().Create(DataType::Type64R, Packed(12))),
              nullptr);
}

TEST(PromoteFactory, IsAValueThroughItsInterface) {
    const PromoteFactory original;
    PromoteFactory copy(original);
    copy = original;
    const kora::kubo::IPromoteFactory& factory = copy;
    const std::unique_ptr<typeconv::IPromote> promote(
        factory.Create(DataType::Type8U, DataType::Type32R));
    ASSERT_TRUE((dynamic_cast<typeconv::Promote<unsigned char, float>*>(promote.get()) != nullptr));
    const unsigned char input[] = {0, 255};
    float output[2] = {};
    promote->Promote(input, output, 2);
    EXPECT_EQ(output[1], 255.0f);
}

}  // namespace
