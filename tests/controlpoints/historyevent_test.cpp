#include "vrkframework/basic/kubo/controlpoints/historyevent.h"

#include <gtest/gtest.h>

#include <string>

#include "vrkframework/platform/imptime.h"

namespace {

using kora::kubo::HistoryEvent;

TEST(HistoryEvent, KeepsIdTimestampAndMessageCutTo16And64Characters) {
    const HistoryEvent event(4, "2024-01-02 03:04", "Point added");
    EXPECT_EQ(event.GetId(), 4u);
    EXPECT_EQ(event.GetTimestamp(), "2024-01-02 03:04");
    EXPECT_EQ(event.GetMessage(), "Point added");

    const std::string message(100, 'm');
    HistoryEvent cut(1, "2024-01-02 03:04:05.6", message);
    EXPECT_EQ(cut.GetMessage(), message.substr(0, 64));
    EXPECT_EQ(cut.GetTimestamp(), "2024-01-02 03:04");
    cut.SetMessage(std::string(65, 'x'));
    EXPECT_EQ(cut.GetMessage(), std::string(64, 'x'));
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

TEST(HistoryEvent, CopiesCarryIdTimestampAndMessage) {
    const HistoryEvent source(9, "2020-01-01 00:00", "moved");
    HistoryEvent assigned(1, "x", "y");
    assigned = source;
    for (const HistoryEvent& copy : {HistoryEvent(source), assigned}) {
        EXPECT_EQ(copy.GetId(), 9u);
        EXPECT_EQ(copy.GetTimestamp(), "2020-01-01 00:00");
        EXPECT_EQ(copy.GetMessage(), "moved");
    }
}

}  // namespace
