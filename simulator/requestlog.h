#pragma once

#include "simulator/peer.h"

#include <deque>
#include <map>

namespace obdsim {

/// What a host has asked: commands and requests in capitals and without blanks.
class RequestLog
{
public:
    struct Entry
    {
        Time time{};
        std::string text;
    };

    static constexpr std::size_t mostEntries = 1000;
    static constexpr std::size_t mostTexts = 1000;

    void add(Time time, std::string const& text)
    {
        m_entries.push_back({time, text});
        if (m_entries.size() > mostEntries) {
            m_entries.pop_front();
        }
        auto const known = m_counts.find(text);
        if (known != m_counts.end() || m_counts.size() < mostTexts) {
            ++m_counts[text];
        }
        ++m_total;
    }

    /// The last ones, the newest at the end.
    std::deque<Entry> const& entries() const { return m_entries; }

    /// How often each of the first different texts was asked.
    std::map<std::string, std::uint64_t> const& counts() const { return m_counts; }

    std::uint64_t total() const { return m_total; }

private:
    std::deque<Entry> m_entries;
    std::map<std::string, std::uint64_t> m_counts;
    std::uint64_t m_total = 0;
};

} // namespace obdsim
