#include "vrkframework/basic/kubo/controlpoints/historyevent.h"

#include <gtest/gtest.h>

#include <string>

#include "vrkframework/platform/imptime.h"

namespace {

using kora::kubo::HistoryEvent;

TEST(HistoryEvent, KeepsIdTimestampAndMessageCutTo16And64CharactersAndCopiesThem) {
    const std::string message(100, 'm');
    HistoryEvent event(4, "2024-01-02 03:04:05.6", message);
    HistoryEvent assigned(1, "x", "y");
    assigned = event;
    for (const HistoryEvent& copy : {event, HistoryEvent(event), assigned}) {
        EXPECT_EQ(copy.GetId(), 4u);
        EXPECT_EQ(copy.GetTimestamp(), "2024-01-02 03:04");
        EXPECT_EQ(copy.GetMessage(), message.substr(0, 64));
    }
    event.SetMessage("Point added");
    EXPECT_EQ(event.GetMessage(), "Point added");
    event.SetMessage(std::string(65, 'x'));
    EXPECT_EQ(event.GetMessage(), std::string(64, 'x'));
}

TEST(HistoryEvent, StampsWithTheFrameworkClockInFormat13) {
    char before[64];
    IMPTime(before, 13);
    const HistoryEvent event(2, std::string(70, 'a'));
    char after[64];
    IMPTime(after, 13);
    EXPECT_TRUE(event.GetTimestamp() == before || event.GetTimestamp() == after)
        << event.GetTimestamp();
    EXPECT_EQ(event.GetMessage(), std::string(64, 'a'));
    EXPECT_EQ(event.GetId(), 2u);
}

TEST(HistoryEvent, EqualityComparesMessagesIgnoringCase) {
    const HistoryEvent a(1, "2020-01-01 00:00", "Point added");
    EXPECT_EQ(a, HistoryEvent(2, "2021-06-06 12:00", "POINT ADDED"));
    EXPECT_NE(a, HistoryEvent(1, "2020-01-01 00:00", "Point added!"));
    EXPECT_NE(a, HistoryEvent(1, "2020-01-01 00:00", "Point_added"));
}

}  // namespace
