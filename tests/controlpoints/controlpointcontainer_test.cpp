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
using kubo_test::CRSLedger;
using kubo_test::SerialOf;

class ControlPointContainerTest : public ::testing::Test {
protected:
    // Every CRS object created in a test is destroyed exactly once by its end.
    void TearDown() override {
        for (const auto& ledger : {m_ledger, m_flatLedger}) {
            EXPECT_EQ(ledger->Alive(), 0u);
            EXPECT_TRUE(ledger->NoneDestroyedTwice());
        }
    }

    ControlPointContainer Filled() {
        ControlPointContainer container;
        container.SetControlPoints({ControlPoint(1), ControlPoint(2)});
        container.SetDescription("survey");
        container.GetKVPMetadata()["Sensor"] = "frame";
        container.SetHistory({HistoryEvent(1, "2020-01-01 00:00", "created")});
        container.SetCRS(CountingCRS(m_ledger));
        return container;
    }

    static void ExpectSetCRSFailure(const std::optional<kora::ParameterException>& failure) {
        ASSERT_TRUE(failure);
        EXPECT_EQ(failure->GetParameterName(), "oCRS");
        EXPECT_EQ(static_cast<int>(failure->GetType()), 1);
        EXPECT_EQ(failure->GetReceived(), "Dimension = 2");
        EXPECT_EQ(failure->GetExpected(), "Dimension = 3");
        kubo_test::ExpectReport(*failure,
                                "ControlPointContainer::SetCRS(): CRS must be 3-dimensional",
                                "vrkframework/basic/kubo/controlpoints/controlpointcontainer",
                                "void __cdecl kora::kubo::ControlPointContainer::SetCRS(const "
                                "class kora::ogc::cs::ICRS &)",
                                128);
    }

    std::shared_ptr<CRSLedger> m_ledger = std::make_shared<CRSLedger>();
    std::shared_ptr<CRSLedger> m_flatLedger =
        std::make_shared<CRSLedger>(CRSLedger{2, {}});  // two-dimensional CRSs
};

TEST_F(ControlPointContainerTest, DefaultIsEmptyWithoutCRS) {
    const ControlPointContainer container;
    EXPECT_EQ(container.GetCRS(), nullptr);
    EXPECT_TRUE(container.GetControlPoints().empty());
    EXPECT_EQ(container.GetDescription(), "");
    EXPECT_TRUE(container.GetHistory().empty());
    EXPECT_TRUE(container.GetKVPMetadata().empty());
}

TEST_F(ControlPointContainerTest, HoldsItsOwnCloneOfTheCRS) {
    ControlPointContainer container;
    {
        const CountingCRS given(m_ledger);
        container.SetCRS(given);
        EXPECT_NE(container.GetCRS(), &given);
    }
    ASSERT_NE(container.GetCRS(), nullptr);
    EXPECT_EQ(SerialOf(container.GetCRS()), 1u);
    EXPECT_EQ(container.GetCRS()->GetDimension(), 3u);  // intact after the original went
    EXPECT_EQ(m_ledger->Alive(), 1u);

    container.SetCRS(CountingCRS(m_ledger));  // replacing destroys the held clone
    EXPECT_EQ(SerialOf(container.GetCRS()), 3u);
    EXPECT_EQ(m_ledger->destructions[1], 1);
}

TEST_F(ControlPointContainerTest, RefusesTwoDimensionsAndDropsTheHeldCRS) {
    ControlPointContainer container;
    container.SetCRS(CountingCRS(m_ledger));
    ExpectSetCRSFailure(kubo_test::Catch<kora::ParameterException>(
        [&] { container.SetCRS(CountingCRS(m_flatLedger)); }));
    EXPECT_EQ(container.GetCRS(), nullptr);
    EXPECT_EQ(m_ledger->Alive(), 0u);
    EXPECT_EQ(m_flatLedger->Created(), 1u);  // a refused CRS is not cloned
}

TEST_F(ControlPointContainerTest, AcceptsEveryDimensionButTwo) {
    ControlPointContainer container;
    for (unsigned int dimension : {0u, 1u, 4u}) {
        m_ledger->dimension = dimension;
        container.SetCRS(CountingCRS(m_ledger));
        ASSERT_NE(container.GetCRS(), nullptr);
        EXPECT_EQ(container.GetCRS()->GetDimension(), dimension);
    }
}

TEST_F(ControlPointContainerTest, SettingTheHeldCRSReplacesItByAFreshClone) {
    ControlPointContainer container;
    container.SetCRS(CountingCRS(m_ledger));
    container.SetCRS(*container.GetCRS());
    EXPECT_EQ(SerialOf(container.GetCRS()), 2u);
    EXPECT_EQ(m_ledger->destructions[1], 1);
    EXPECT_EQ(m_ledger->Alive(), 1u);
}

TEST_F(ControlPointContainerTest, CopyConstructionCopiesAllButTheHistory) {
    const ControlPointContainer source = Filled();
    const ControlPointContainer copy(source);
    EXPECT_EQ(copy.GetControlPoints(), source.GetControlPoints());
    EXPECT_EQ(copy.GetDescription(), "survey");
    EXPECT_EQ(copy.GetKVPMetadata(), source.GetKVPMetadata());
    ASSERT_NE(copy.GetCRS(), nullptr);
    EXPECT_NE(SerialOf(copy.GetCRS()), SerialOf(source.GetCRS()));
    EXPECT_TRUE(copy.GetHistory().empty());
    EXPECT_EQ(m_ledger->Alive(), 2u);
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
    ASSERT_EQ(target.GetHistory().size(), 1u);
    EXPECT_EQ(target.GetHistory()[0].GetMessage(), "kept");
    EXPECT_NE(SerialOf(target.GetCRS()), SerialOf(source.GetCRS()));
}

TEST_F(ControlPointContainerTest, MoveConstructionHandsOverEverything) {
    ControlPointContainer source = Filled();
    const std::size_t held = SerialOf(source.GetCRS());
    const ControlPointContainer moved(std::move(source));
    EXPECT_EQ(SerialOf(moved.GetCRS()), held);
    EXPECT_EQ(source.GetCRS(), nullptr);  // NOLINT(bugprone-use-after-move)
    EXPECT_EQ(moved.GetHistory().size(), 1u);
    EXPECT_EQ(moved.GetDescription(), "survey");
    EXPECT_EQ(m_ledger->Created(), 2u);
}

TEST_F(ControlPointContainerTest, SourceWithoutCRSLeavesTheTargetsCRS) {
    ControlPointContainer target = Filled();
    const std::size_t held = SerialOf(target.GetCRS());
    target = ControlPointContainer();
    ASSERT_NE(target.GetCRS(), nullptr);
    EXPECT_EQ(SerialOf(target.GetCRS()), held);
    EXPECT_TRUE(target.GetControlPoints().empty());
    EXPECT_TRUE(target.GetKVPMetadata().empty());
    EXPECT_EQ(target.GetHistory().size(), 1u);  // assigning a temporary keeps the history
}

TEST_F(ControlPointContainerTest, SelfAssignmentKeepsEverythingAndReclonesTheCRS) {
    ControlPointContainer container = Filled();
    const std::size_t held = SerialOf(container.GetCRS());
    const ControlPointContainer& self = container;
    container = self;
    EXPECT_EQ(container.GetControlPoints().size(), 2u);
    EXPECT_EQ(container.GetDescription(), "survey");
    EXPECT_EQ(container.GetKVPMetadata().at("sensor"), "frame");
    EXPECT_EQ(container.GetHistory().size(), 1u);
    EXPECT_NE(SerialOf(container.GetCRS()), held);
    EXPECT_EQ(m_ledger->destructions[held], 1);
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
