#include "vrkframework/basic/kubo/controlpoints/controlpointcontainer.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <memory>
#include <optional>
#include <utility>
#include <vector>

#include "support/expectfailure.h"
#include "vrkframework/platform/crs.h"

namespace {

using kora::kubo::ControlPoint;
using kora::kubo::ControlPointContainer;
using kora::kubo::HistoryEvent;

// What a CRS and all its clones share: the dimension they report and the number of times
// each was destroyed, by serial number (the order of creation).
struct CRSLedger {
    unsigned int dimension = 3;
    std::vector<int> destructions;
};

class CountingCRS : public kora::ogc::cs::ICRS {
public:
    explicit CountingCRS(std::shared_ptr<CRSLedger> family)
        : ledger(std::move(family)), serial(ledger->destructions.size()) {
        ledger->destructions.push_back(0);
    }
    CountingCRS(const CountingCRS&) = delete;
    CountingCRS& operator=(const CountingCRS&) = delete;
    ~CountingCRS() override { ++ledger->destructions[serial]; }
    unsigned int GetDimension() const override { return ledger->dimension; }
    ICRS* Clone() const override { return new CountingCRS(ledger); }

    const std::shared_ptr<CRSLedger> ledger;
    const std::size_t serial;
};

std::size_t SerialOf(const kora::ogc::cs::ICRS* crs) {
    return crs ? dynamic_cast<const CountingCRS&>(*crs).serial : SIZE_MAX;
}

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
        EXPECT_EQ(m_ledger->destructions, std::vector<int>(m_ledger->destructions.size(), 1));
    }

    // Serial 0 is the temporary given to SetCRS, serial 1 the container's clone.
    ControlPointContainer Filled() {
        ControlPointContainer container;
        container.SetControlPoints({ControlPoint(1), ControlPoint(2)});
        container.SetDescription("survey");
        container.SetKVPMetadata({{"Sensor", "frame"}, {"SENSOR", "pushbroom"}});
        container.SetHistory({HistoryEvent(1, "2020-01-01 00:00", "created")});
        container.SetCRS(CountingCRS(m_ledger));
        return container;
    }

    std::shared_ptr<CRSLedger> m_ledger = std::make_shared<CRSLedger>();
};

TEST_F(ControlPointContainerTest, HoldsItsOwnCloneOfAnyDimensionButTwo) {
    ControlPointContainer container;
    EXPECT_EQ(container.GetCRS(), nullptr);
    EXPECT_TRUE(container.GetHistory().empty());
    container.SetCRS(CountingCRS(m_ledger));
    EXPECT_EQ(SerialOf(container.GetCRS()), 1u);
    EXPECT_EQ(container.GetCRS()->GetDimension(), 3u);  // intact after the original went
    for (unsigned int dimension : {0u, 1u, 4u}) {
        m_ledger->dimension = dimension;
        container.SetCRS(CountingCRS(m_ledger));  // replacing destroys the held clone
    }
    container.SetCRS(*container.GetCRS());  // the held CRS is cloned before it goes
    EXPECT_EQ(m_ledger->destructions, (std::vector<int>{1, 1, 1, 1, 1, 1, 1, 1, 0}));
    // A refused CRS is not cloned, and the held one goes all the same.
    m_ledger->dimension = 2;
    ExpectSetCRSFailure(kubo_test::Catch<kora::ParameterException>(
        [&] { container.SetCRS(CountingCRS(m_ledger)); }));
    EXPECT_EQ(container.GetCRS(), nullptr);
    EXPECT_EQ(m_ledger->destructions.size(), 10u);
}

TEST_F(ControlPointContainerTest, CopiesCarryAllButTheHistoryAndCheckTheDimensionAgain) {
    const ControlPointContainer source = Filled();
    const ControlPointContainer copy(source);
    ControlPointContainer assigned;
    assigned.SetDescription("old");
    assigned.GetKVPMetadata()["Stale"] = "1";
    assigned.SetHistory({HistoryEvent(7, "2019-01-01 00:00", "kept")});
    assigned = source;
    for (const ControlPointContainer* target :
         {&copy, static_cast<const ControlPointContainer*>(&assigned)}) {
        EXPECT_EQ(target->GetControlPoints(), source.GetControlPoints());
        EXPECT_EQ(target->GetDescription(), "survey");
        EXPECT_EQ(target->GetKVPMetadata(), source.GetKVPMetadata());
    }
    ASSERT_EQ(source.GetKVPMetadata().size(), 1u);  // Sensor and SENSOR are one key
    EXPECT_EQ(source.GetKVPMetadata().at("sensor"), "frame");
    EXPECT_EQ(SerialOf(copy.GetCRS()), 2u);
    EXPECT_EQ(SerialOf(assigned.GetCRS()), 3u);
    EXPECT_TRUE(copy.GetHistory().empty());
    ASSERT_EQ(assigned.GetHistory().size(), 1u);
    EXPECT_EQ(assigned.GetHistory()[0].GetMessage(), "kept");

    // A source without a CRS (here a temporary) leaves the target's.
    assigned = ControlPointContainer();
    EXPECT_EQ(SerialOf(assigned.GetCRS()), 3u);
    EXPECT_TRUE(assigned.GetControlPoints().empty());
    EXPECT_TRUE(assigned.GetKVPMetadata().empty());
    EXPECT_EQ(assigned.GetDescription(), "");
    EXPECT_EQ(assigned.GetHistory().size(), 1u);

    m_ledger->dimension = 2;
    ExpectSetCRSFailure(
        kubo_test::Catch<kora::ParameterException>([&] { ControlPointContainer failed(source); }));
    ExpectSetCRSFailure(kubo_test::Catch<kora::ParameterException>([&] { assigned = source; }));
    EXPECT_EQ(assigned.GetCRS(), nullptr);
}

TEST_F(ControlPointContainerTest, SelfAssignmentKeepsEverythingAndMovesHandItOver) {
    ControlPointContainer container = Filled();
    const ControlPointContainer& self = container;
    container = self;
    EXPECT_EQ(container.GetControlPoints().size(), 2u);
    EXPECT_EQ(container.GetDescription(), "survey");
    EXPECT_EQ(container.GetKVPMetadata().size(), 1u);
    EXPECT_EQ(container.GetHistory().size(), 1u);
    EXPECT_EQ(SerialOf(container.GetCRS()), 2u);  // recloned
    const ControlPointContainer moved(std::move(container));
    EXPECT_EQ(container.GetCRS(), nullptr);  // NOLINT(bugprone-use-after-move)
    EXPECT_EQ(SerialOf(moved.GetCRS()), 2u);
    EXPECT_EQ(moved.GetHistory().size(), 1u);
}

}  // namespace
