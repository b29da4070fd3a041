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
template <class A, class B = void>
struct Probe : IProbe {
    const std::type_info& First() const override { return typeid(A); }
    const std::type_info& Second() const override { return typeid(B); }
};
template <class A>
using OneProbe = Probe<A>;

template <class Candidates, class List = ComponentTypes>
using One =
    kora::typedispatch::ExtendDispatchTypes<kora::typedispatch::Factory1Template<OneProbe, IProbe>,
                                            1, List, Candidates, NullDataType>;
using Two =
    kora::typedispatch::ExtendDispatchTypes<kora::typedispatch::Factory2Template<Probe, IProbe>, 2,
                                            ComponentTypes, ComponentTypes, NullDataType>;

struct Candidate {
    DataType real;
    DataType complex;
    const std::type_info& type;
};
// The candidates in search order, written out independently of the traits.
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

TEST(ExtendDispatchTypes, CreatesTheInstanceOfTheMatchingTypes) {
    for (const Candidate& from : kCandidates) {
        std::unique_ptr<IProbe> one(One<ComponentTypes>::Dispatch({from.complex}, true));
        EXPECT_EQ(one->First(), from.type);
        for (const Candidate& to : kCandidates) {
            // A third descriptor is ignored by a two-position dispatch.
            std::unique_ptr<IProbe> two(Two::Dispatch({from.real, to.complex, DataType()}, true));
            EXPECT_EQ(two->First(), from.type);
            EXPECT_EQ(two->Second(), to.type);
        }
    }
    // Descriptors come from type traits, so other lists work, `long long` included.
    using LongLong = TypeList<long long, NullDataType>;
    std::unique_ptr<IProbe> custom(One<LongLong, LongLong>::Dispatch({DataType::Type64S}, false));
    EXPECT_EQ(custom->First(), typeid(long long));
}

void ExpectFailure(const std::optional<kora::Exception>& failure, const char* message,
                   unsigned int line, const char* inFunction = "Dispatch") {
    ASSERT_TRUE(failure);
    EXPECT_EQ(failure->GetMessage(), message);
    EXPECT_EQ(failure->GetSourceFile(), "vrkframework/basic/core/typedispatch/extendtypedispatch");
    EXPECT_EQ(failure->GetLine(), line);
    EXPECT_NE(failure->GetFunction().find(inFunction), std::string::npos) << failure->GetFunction();
}

constexpr char kInvalid[] = "Invalid type requested.";
constexpr char kShort[] = "Not enough type in the vector for the dispatcher you are using.";

template <class Action>
std::optional<kora::Exception> Fails(Action action) {
    return kubo_test::Catch<kora::Exception>(action);
}

TEST(ExtendDispatchTypes, UnmatchedDescriptorsAreInvalid) {
    for (const DataType& type : {DataType(), DataType(32, true, true, 24, 8, false),
                                 DataType(12, false, false, 12, 0, false), DataType::Type1U}) {
        ExpectFailure(Fails([&] { One<ComponentTypes>::Dispatch({type}, true); }), kInvalid, 175);
    }
    // Complex descriptors match only when accepted, at either position.
    ExpectFailure(Fails([] { One<ComponentTypes>::Dispatch({DataType::TypeC16S}, false); }),
                  kInvalid, 175);
    ExpectFailure(Fails([] {
                      Two::Dispatch({DataType::Type8U, DataType::TypeC16S}, false);
                  }),
                  kInvalid, 175);
    // Position 1 is resolved first: with both invalid the two-position level fails.
    ExpectFailure(Fails([] {
                      Two::Dispatch({DataType(), DataType()}, false);
                  }),
                  kInvalid, 175, "N = 2");
    ExpectFailure(Fails([] {
                      Two::Dispatch({DataType(), DataType::Type8U}, false);
                  }),
                  kInvalid, 175, "N = 1");
}

TEST(ExtendDispatchTypes, ShortVectorsAreRejected) {
    ExpectFailure(Fails([] { One<ComponentTypes>::Dispatch({}, true); }), kShort, 114);
    ExpectFailure(Fails([] { Two::Dispatch({DataType::Type8U}, true); }), kShort, 114);
    // Found where only the last candidate is left, the failure reports its own line.
    using LastOnly = One<TypeList<std::uint64_t, NullDataType>>;
    ExpectFailure(Fails([] { LastOnly::Dispatch({}, false); }), kShort, 163);
    ExpectFailure(Fails([] { LastOnly::Dispatch({DataType::Type8U}, false); }), kInvalid, 175);
}

}  // namespace
