#include "vrkframework/basic/kubo/controlpoints/historyevent.h"

#include <gtest/gtest.h>

#include <string>

#include "vrkframework/platform/imptime.h"

namespace {

using kora::kubo::HistoryEvent;

TEST(HistoryEvent, TakesIdTimestampAndMessageInThatOrder) {
    const HistoryEvent event(4, "2024-01-02 03:04", "Point added");
    EXPECT_EQ(event.GetId(), 4u);
    EXPECT_EQ(event.GetTimestamp(), "2024-01-02 03:04");
    EXPECT_EQ(event.GetMessage(), "Point added");
}

TEST(HistoryEvent, CutsMessagesTo64AndTimestampsTo16Characters) {
    const std::string message(100, 'm');
    HistoryEvent event(1, "2024-01-02 03:04:05.6", message);
    EXPECT_EQ(event.GetMessage(), message.substr(0, 64));
    EXPECT_EQ(event.GetTimestamp(), "2024-01-02 03:04");
    event.SetMessage(std::string(65, 'x'));
    EXPECT_EQ(event.GetMessage(), std::string(64, 'x'));
    event.SetMessage("short");
    EXPECT_EQ(event.GetMessage(), "short");
}

TEST(HistoryEvent, StampsWithTheFrameworkClockInFormat13) {
    char before[64];
    IMPTime(before, 13);
    const HistoryEvent event(2, std::string(70, 'a'));
    char after[64];
    IMPTime(after, 13);
    EXPECT_TRUE(event.GetTimestamp() == before || event.GetTimestamp() == after)
        << event.GetTimestamp();
    EXPECT_EQ(event.GetTimestamp().size(), 16u);
    EXPECT_EQ(event.GetMessage(), std::string(64, 'a'));
    EXPECT_EQ(event.GetId(), 2u);
}

TEST(HistoryEvent, EqualityIgnoresCaseIdAndTimestamp) {
    const HistoryEvent a(1, "2020-01-01 00:00", "Point added");
    const HistoryEvent b(2, "2021-06-06 12:00", "POINT ADDED");
    EXPECT_EQ(a, b);
    EXPECT_NE(a, HistoryEvent(1, "2020-01-01 00:00", "Point added!"));
    EXPECT_NE(a, HistoryEvent(1, "2020-01-01 00:00", "Point"));
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
