// One entry of a control point set's history: a time-stamped message with an id.
#ifndef VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_HISTORYEVENT_H
#define VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_HISTORYEVENT_H

#include <cstddef>  // std::size_t
#include <string>

#include "vrkframework/basic/kubo/kuboapi.h"

namespace kora::kubo {

/// A message of at most 64 characters stamped with a time text of at most 16; longer
/// texts are cut to those lengths.
class KUBO_API HistoryEvent {
public:
    static constexpr std::size_t kMaxTimestampLength = 16;
    static constexpr std::size_t kMaxMessageLength = 64;

    /// Stamps the event with the current local time ("YYYY-MM-DD HH:MM").
    HistoryEvent(unsigned int id, const std::string& message);
    HistoryEvent(unsigned int id, const std::string& timestamp, const std::string& message);
    HistoryEvent(const HistoryEvent& other);
    HistoryEvent& operator=(const HistoryEvent& other);
    HistoryEvent(HistoryEvent&& other) noexcept = default;
    HistoryEvent& operator=(HistoryEvent&& other) noexcept = default;
    ~HistoryEvent() = default;

    /// Events are equal when their messages are, ignoring letter case (as classified by
    /// the global locale); ids and timestamps take no part.
    bool operator==(const HistoryEvent& other) const;
    bool operator!=(const HistoryEvent& other) const { return !(*this == other); }

    unsigned int GetId() const { return m_id; }
    std::string GetMessage() const { return m_message; }
    void SetMessage(const std::string& message) {
        m_message = message.substr(0, kMaxMessageLength);
    }
    std::string GetTimestamp() const { return m_timestamp; }

private:
    void SetTimestamp(const std::string& timestamp) {
        m_timestamp = timestamp.substr(0, kMaxTimestampLength);
    }
    void Copy(const HistoryEvent& other);

    std::string m_timestamp;
    std::string m_message;
    unsigned int m_id;
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_HISTORYEVENT_H
