// History events: time stamping and case-blind comparison.
#include "vrkframework/basic/kubo/controlpoints/historyevent.h"

#include <algorithm>  // std::equal
#include <locale>     // std::locale, std::ctype

#include "vrkframework/platform/imptime.h"

namespace kora::kubo {

HistoryEvent::HistoryEvent(unsigned int id, const std::string& message) : m_id(id) {
    char buffer[64];  // IMPTime writes at most 64 characters
    SetTimestamp(IMPTime(buffer, kIMPTimeDateMinutes));
    SetMessage(message);
}

HistoryEvent::HistoryEvent(unsigned int id, const std::string& timestamp,
                           const std::string& message)
    : m_id(id) {
    SetTimestamp(timestamp);
    SetMessage(message);
}

HistoryEvent::HistoryEvent(const HistoryEvent& other) : m_id(other.m_id) { Copy(other); }

HistoryEvent& HistoryEvent::operator=(const HistoryEvent& other) {
    Copy(other);
    return *this;
}

void HistoryEvent::Copy(const HistoryEvent& other) {
    m_id = other.m_id;
    m_timestamp = other.m_timestamp;
    m_message = other.m_message;
}

bool HistoryEvent::operator==(const HistoryEvent& other) const {
    // Lowering case maps one character to one, so equal lengths are necessary and the
    // texts can be compared in place instead of lowering copies.
    const auto& ctype = std::use_facet<std::ctype<char>>(std::locale());
    return std::equal(m_message.begin(), m_message.end(), other.m_message.begin(),
                      other.m_message.end(),
                      [&ctype](char a, char b) { return ctype.tolower(a) == ctype.tolower(b); });
}

}  // namespace kora::kubo
