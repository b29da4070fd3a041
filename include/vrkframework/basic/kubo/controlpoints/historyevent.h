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
    static constexpr std::size_t kMaxTimestampLength = 16;  ///< longest timestamp kept
    static constexpr std::size_t kMaxMessageLength = 64;    ///< longest message kept

    /// Stamps the event with the current local time ("YYYY-MM-DD HH:MM").
    HistoryEvent(unsigned int id, const std::string& message);
    /// Takes `timestamp` as given, cut like the message.
    HistoryEvent(unsigned int id, const std::string& timestamp, const std::string& message);

    /// @name Copying
    ///@{

    /// Copies the id, the timestamp and the message; moving takes them over.
    HistoryEvent(const HistoryEvent& other);
    HistoryEvent& operator=(const HistoryEvent& other);
    HistoryEvent(HistoryEvent&& other) noexcept = default;
    HistoryEvent& operator=(HistoryEvent&& other) noexcept = default;
    ///@}

    ~HistoryEvent() = default;

    /// Events are equal when their messages are, ignoring letter case (as classified by
    /// the global locale); ids and timestamps take no part.
    bool operator==(const HistoryEvent& other) const;
    /// Negation of operator==.
    bool operator!=(const HistoryEvent& other) const { return !(*this == other); }

    /// The id given at construction.
    unsigned int GetId() const { return m_id; }
    /// The message.
    std::string GetMessage() const { return m_message; }
    /// Replaces the message by the first kMaxMessageLength characters of `message`.
    void SetMessage(const std::string& message) {
        m_message = message.substr(0, kMaxMessageLength);
    }
    /// The timestamp.
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
