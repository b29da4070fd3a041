#include "vrkframework/basic/core/typedispatch/extendtypedispatch.h"

#include <gtest/gtest.h>

#include <memory>
#include <typeinfo>

#include "support/expectfailure.h"

namespace {

using kora::kubo::DataType;
using typeconv::priv::ComponentTypes;
using typeconv::priv::NullDataType;
using typeconv::priv::TypeList;

struct IProbe {
    virtual ~IProbe() = default;
    virtual const std::type_info& First() const = 0;
    virtual const std::type_info& Second() const = 0;
};

template <class T>
struct OneProbe : IProbe {
    const std::type_info& First() const override { return typeid(T); }
    const std::type_info& Second() const override { return typeid(void); }
};

template <class A, class B>
struct TwoProbe : IProbe {
    const std::type_info& First() const override { return typeid(A); }
    const std::type_info& Second() const override { return typeid(B); }
};

using One =
    kora::typedispatch::ExtendDispatchTypes<kora::typedispatch::Factory1Template<OneProbe, IProbe>,
                                            1, ComponentTypes, ComponentTypes, NullDataType>;
using Two =
    kora::typedispatch::ExtendDispatchTypes<kora::typedispatch::Factory2Template<TwoProbe, IProbe>,
                                            2, ComponentTypes, ComponentTypes, NullDataType>;

struct Candidate {
    DataType real;
    DataType complex;
    const std::type_info& type;
};

// The documented table of candidates, written out independently of the traits.
const Candidate kCandidates[] = {
    {DataType::Type8S, DataType::TypeC8S, typeid(char)},
    {DataType::Type8U, DataType::TypeC8U, typeid(unsigned char)},
    {DataType::Type16S, DataType::TypeC16S, typeid(short)},
    {DataType::Type16U, DataType::TypeC16U, typeid(unsigned short)},
    {DataType::Type32S, DataType::TypeC32S, typeid(int)},
    {DataType::Type32U, DataType::TypeC32U, typeid(unsigned int)},
    {DataType::Type32R, DataType::TypeC32R, typeid(float)},
    {DataType::Type64R, DataType::TypeC64R, typeid(double)},
    {DataType::Type64S, DataType::TypeC64S, typeid(std::int64_t)},
    {DataType::Type64U, DataType::TypeC64U, typeid(std::uint64_t)},
};

TEST(ExtendDispatchTypes, OnePositionCreatesTheMatchingInstance) {
    for (const Candidate& candidate : kCandidates) {
        std::unique_ptr<IProbe> probe(One::Dispatch({candidate.real}, false));
        EXPECT_EQ(probe->First(), candidate.type) << candidate.type.name();
        probe.reset(One::Dispatch({candidate.complex}, true));
        EXPECT_EQ(probe->First(), candidate.type) << candidate.type.name();
        probe.reset(One::Dispatch({candidate.real}, true));
        EXPECT_EQ(probe->First(), candidate.type) << candidate.type.name();
    }
}

TEST(ExtendDispatchTypes, TwoPositionsCoverEveryPairInOrder) {
    for (const Candidate& from : kCandidates) {
        for (const Candidate& to : kCandidates) {
            std::unique_ptr<IProbe> probe(Two::Dispatch({from.real, to.complex}, true));
            EXPECT_EQ(probe->First(), from.type);
            EXPECT_EQ(probe->Second(), to.type);
        }
    }
}

TEST(ExtendDispatchTypes, ExtraDescriptorsAreIgnored) {
    std::unique_ptr<IProbe> probe(
        Two::Dispatch({DataType::Type16S, DataType::Type32R, DataType()}, false));
    EXPECT_EQ(probe->First(), typeid(short));
    EXPECT_EQ(probe->Second(), typeid(float));
}

void ExpectInvalidType(const std::optional<kora::Exception>& failure) {
    ASSERT_TRUE(failure);
    EXPECT_EQ(failure->GetMessage(), "Invalid type requested.");
    EXPECT_EQ(failure->GetSourceFile(), "vrkframework/basic/core/typedispatch/extendtypedispatch");
    EXPECT_EQ(failure->GetLine(), 175u);
    EXPECT_NE(failure->GetFunction().find("Dispatch"), std::string::npos);
}

TEST(ExtendDispatchTypes, UnmatchedDescriptorsAreInvalid) {
    const DataType unmatched[] = {
        DataType(),
        DataType(32, true, true, 24, 8, false),  // 32R but for the mantissa
        DataType(12, false, false, 12, 0, false),
        DataType::Type1U,
        DataType(128, true, true, 128, 0, false),
    };
    for (const DataType& type : unmatched) {
        ExpectInvalidType(kubo_test::Catch<kora::Exception>([&] { One::Dispatch({type}, true); }));
    }
}

TEST(ExtendDispatchTypes, ComplexDescriptorsNeedAcceptComplex) {
    ExpectInvalidType(
        kubo_test::Catch<kora::Exception>([] { One::Dispatch({DataType::TypeC16S}, false); }));
    ExpectInvalidType(kubo_test::Catch<kora::Exception>([] {
        Two::Dispatch({DataType::TypeC16S, DataType::Type8U}, false);
    }));
    ExpectInvalidType(kubo_test::Catch<kora::Exception>([] {
        Two::Dispatch({DataType::Type8U, DataType::TypeC16S}, false);
    }));
}

TEST(ExtendDispatchTypes, PositionOneIsResolvedFirst) {
    // Both invalid: the failure comes from the two-position level, before position 0.
    const auto both = kubo_test::Catch<kora::Exception>([] {
        Two::Dispatch({DataType(), DataType()}, false);
    });
    ExpectInvalidType(both);
    EXPECT_NE(both->GetFunction().find("N = 2"), std::string::npos) << both->GetFunction();
    // Only position 0 invalid: it fails one level down.
    const auto first = kubo_test::Catch<kora::Exception>([] {
        Two::Dispatch({DataType(), DataType::Type8U}, false);
    });
    ExpectInvalidType(first);
    EXPECT_NE(first->GetFunction().find("N = 1"), std::string::npos) << first->GetFunction();
}

void ExpectNotEnough(const std::optional<kora::Exception>& failure, unsigned int line) {
    ASSERT_TRUE(failure);
    EXPECT_EQ(failure->GetMessage(),
              "Not enough type in the vector for the dispatcher you are using.");
    EXPECT_EQ(failure->GetSourceFile(), "vrkframework/basic/core/typedispatch/extendtypedispatch");
    EXPECT_EQ(failure->GetLine(), line);
}

TEST(ExtendDispatchTypes, ShortVectorsAreRejected) {
    ExpectNotEnough(kubo_test::Catch<kora::Exception>([] { One::Dispatch({}, true); }), 114);
    ExpectNotEnough(kubo_test::Catch<kora::Exception>([] { Two::Dispatch({}, true); }), 114);
    ExpectNotEnough(
        kubo_test::Catch<kora::Exception>([] { Two::Dispatch({DataType::Type8U}, true); }), 114);
}

TEST(ExtendDispatchTypes, ShortVectorAtTheLastCandidateReportsItsOwnLine) {
    using LastOnly = kora::typedispatch::ExtendDispatchTypes<
        kora::typedispatch::Factory1Template<OneProbe, IProbe>, 1, ComponentTypes,
        TypeList<std::uint64_t, NullDataType>, NullDataType>;
    ExpectNotEnough(kubo_test::Catch<kora::Exception>([] { LastOnly::Dispatch({}, false); }), 163);
    std::unique_ptr<IProbe> probe(LastOnly::Dispatch({DataType::Type64U}, false));
    EXPECT_EQ(probe->First(), typeid(std::uint64_t));
    ExpectInvalidType(
        kubo_test::Catch<kora::Exception>([] { LastOnly::Dispatch({DataType::Type8U}, false); }));
}

TEST(ExtendDispatchTypes, CandidateListsAreOpenToOtherTypes) {
    // Descriptors come from type traits, so `long long` is a 64-bit signed candidate.
    using Custom = kora::typedispatch::ExtendDispatchTypes<
        kora::typedispatch::Factory1Template<OneProbe, IProbe>, 1,
        TypeList<long long, NullDataType>, TypeList<long long, NullDataType>, NullDataType>;
    std::unique_ptr<IProbe> probe(Custom::Dispatch({DataType::TypeC64S}, true));
    EXPECT_EQ(probe->First(), typeid(long long));
}

}  // namespace
