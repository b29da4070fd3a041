#include "vrkframework/basic/kubo/controlpoints/controlpointcontainer.h"

#include <gtest/gtest.h>

#include <memory>
#include <optional>
#include <utility>

#include "support/countingcrs.h"
#include "support/expectfailure.h"

namespace {

using kora::kubo::ControlPoint;
using kora::kubo::ControlPointContainer;
using kora::kubo::HistoryEvent;
using kubo_test::CountingCRS;
using kubo_test::SerialOf;

void ExpectSetCRSFailure(const std::optional<kora::ParameterException>& failure) {
    ASSERT_TRUE(failure);
    EXPECT_EQ(failure->GetParameterName(), "oCRS");
    EXPECT_EQ(static_cast<int>(failure->GetType()), 1);
    EXPECT_EQ(failure->GetReceived(), "Dimension = 2");
    EXPECT_EQ(failure->GetExpected(), "Dimension = 3");
    kubo_test::ExpectReport(*failure, "ControlPointContainer::SetCRS(): CRS must be 3-dimensional",
                            "vrkframework/basic/kubo/controlpoints/controlpointcontainer",
                            "void __cdecl kora::kubo::ControlPointContainer::SetCRS(const class "
                            "kora::ogc::cs::ICRS &)",
                            128);
}

class ControlPointContainerTest : public ::testing::Test {
protected:
    // Every CRS created in a test, original or clone, is destroyed exactly once by its end.
    void TearDown() override {
        EXPECT_EQ(m_ledger->Alive(), 0u);
        EXPECT_TRUE(m_ledger->NoneDestroyedTwice());
    }

    // Serial 0 is the temporary given to SetCRS, serial 1 the container's clone.
    ControlPointContainer Filled() {
        ControlPointContainer container;
        container.SetControlPoints({ControlPoint(1), ControlPoint(2)});
        container.SetDescription("survey");
        container.GetKVPMetadata()["Sensor"] = "frame";
        container.SetHistory({HistoryEvent(1, "2020-01-01 00:00", "created")});
        container.SetCRS(CountingCRS(m_ledger));
        return container;
    }

    std::shared_ptr<kubo_test::CRSLedger> m_ledger = std::make_shared<kubo_test::CRSLedger>();
};

TEST_F(ControlPointContainerTest, DefaultIsEmptyWithoutCRS) {
    const ControlPointContainer container;
    EXPECT_EQ(container.GetCRS(), nullptr);
    EXPECT_TRUE(container.GetControlPoints().empty());
    EXPECT_EQ(container.GetDescription(), "");
    EXPECT_TRUE(container.GetHistory().empty());
    EXPECT_TRUE(container.GetKVPMetadata().empty());
}

TEST_F(ControlPointContainerTest, HoldsItsOwnCloneOfAnyDimensionButTwo) {
    ControlPointContainer container;
    {
        const CountingCRS given(m_ledger);
        container.SetCRS(given);
        EXPECT_NE(container.GetCRS(), &given);
    }
    EXPECT_EQ(SerialOf(container.GetCRS()), 1u);
    EXPECT_EQ(container.GetCRS()->GetDimension(), 3u);  // intact after the original went
    for (unsigned int dimension : {0u, 1u, 4u}) {
        m_ledger->dimension = dimension;
        container.SetCRS(CountingCRS(m_ledger));  // replacing destroys the held clone
        EXPECT_EQ(container.GetCRS()->GetDimension(), dimension);
    }
    EXPECT_EQ(m_ledger->Alive(), 1u);
}

TEST_F(ControlPointContainerTest, RefusesTwoDimensionsAndDropsTheHeldCRS) {
    ControlPointContainer container;
    container.SetCRS(CountingCRS(m_ledger));
    m_ledger->dimension = 2;
    ExpectSetCRSFailure(kubo_test::Catch<kora::ParameterException>(
        [&] { container.SetCRS(CountingCRS(m_ledger)); }));
    EXPECT_EQ(container.GetCRS(), nullptr);
    EXPECT_EQ(m_ledger->Created(), 3u);  // the refused CRS was not cloned
}

TEST_F(ControlPointContainerTest, SettingTheHeldCRSReplacesItByAFreshClone) {
    ControlPointContainer container;
    container.SetCRS(CountingCRS(m_ledger));
    container.SetCRS(*container.GetCRS());
    EXPECT_EQ(SerialOf(container.GetCRS()), 2u);
    EXPECT_EQ(m_ledger->Alive(), 1u);
}

TEST_F(ControlPointContainerTest, CopyConstructionCopiesAllButTheHistory) {
    const ControlPointContainer source = Filled();
    const ControlPointContainer copy(source);
    EXPECT_EQ(copy.GetControlPoints(), source.GetControlPoints());
    EXPECT_EQ(copy.GetDescription(), "survey");
    EXPECT_EQ(copy.GetKVPMetadata(), source.GetKVPMetadata());
    EXPECT_EQ(SerialOf(copy.GetCRS()), 2u);
    EXPECT_TRUE(copy.GetHistory().empty());
}

TEST_F(ControlPointContainerTest, AssignmentReplacesAllButTheTargetsHistory) {
    const ControlPointContainer source = Filled();
    ControlPointContainer target;
    target.SetDescription("old");
    target.GetKVPMetadata()["Stale"] = "1";
    target.SetHistory({HistoryEvent(7, "2019-01-01 00:00", "kept")});
    target = source;
    EXPECT_EQ(target.GetControlPoints(), source.GetControlPoints());
    EXPECT_EQ(target.GetDescription(), "survey");
    EXPECT_EQ(target.GetKVPMetadata(), source.GetKVPMetadata());
    EXPECT_EQ(SerialOf(target.GetCRS()), 2u);
    ASSERT_EQ(target.GetHistory().size(), 1u);
    EXPECT_EQ(target.GetHistory()[0].GetMessage(), "kept");
}

TEST_F(ControlPointContainerTest, SourceWithoutCRSLeavesTheTargetsCRS) {
    ControlPointContainer target = Filled();
    target = ControlPointContainer();  // a temporary follows the copy rules too
    EXPECT_EQ(SerialOf(target.GetCRS()), 1u);
    EXPECT_TRUE(target.GetControlPoints().empty());
    EXPECT_TRUE(target.GetKVPMetadata().empty());
    EXPECT_EQ(target.GetHistory().size(), 1u);
}

TEST_F(ControlPointContainerTest, MoveConstructionHandsOverEverything) {
    ControlPointContainer source = Filled();
    const ControlPointContainer moved(std::move(source));
    EXPECT_EQ(source.GetCRS(), nullptr);  // NOLINT(bugprone-use-after-move)
    EXPECT_EQ(SerialOf(moved.GetCRS()), 1u);
    EXPECT_EQ(moved.GetHistory().size(), 1u);
    EXPECT_EQ(moved.GetDescription(), "survey");
}

TEST_F(ControlPointContainerTest, SelfAssignmentKeepsEverythingAndReclonesTheCRS) {
    ControlPointContainer container = Filled();
    const ControlPointContainer& self = container;
    container = self;
    EXPECT_EQ(container.GetControlPoints().size(), 2u);
    EXPECT_EQ(container.GetDescription(), "survey");
    EXPECT_EQ(container.GetKVPMetadata().at("sensor"), "frame");
    EXPECT_EQ(container.GetHistory().size(), 1u);
    EXPECT_EQ(SerialOf(container.GetCRS()), 2u);
}

TEST_F(ControlPointContainerTest, CopyingChecksTheDimensionAgain) {
    const ControlPointContainer source = Filled();
    ControlPointContainer target = Filled();
    m_ledger->dimension = 2;
    ExpectSetCRSFailure(
        kubo_test::Catch<kora::ParameterException>([&] { ControlPointContainer copy(source); }));
    ExpectSetCRSFailure(kubo_test::Catch<kora::ParameterException>([&] { target = source; }));
    EXPECT_EQ(target.GetCRS(), nullptr);
}

TEST_F(ControlPointContainerTest, MetadataKeysIgnoreCase) {
    ControlPointContainer container;
    ControlPointContainer::KVPMetadata metadata;
    metadata["Sensor"] = "frame";
    metadata["SENSOR"] = "pushbroom";
    container.SetKVPMetadata(metadata);
    ASSERT_EQ(container.GetKVPMetadata().size(), 1u);
    EXPECT_EQ(container.GetKVPMetadata().at("sensor"), "pushbroom");
}

}  // namespace
