#pragma once

#include <cstdint>
#include <deque>
#include <mutex>
#include <optional>
#include <string>

namespace velmora {

// The last events of values, numbered, so that a browser whose stream broke gets what it missed. Any thread.
class DashEventLog
{
public:
    static constexpr std::size_t mostBytes = 512 * 1024;

    DashEventLog();

    // Gives the event's id.
    std::string add(std::string const& data);
    // That of the last one; of none yet, too.
    std::string last() const;
    // The events behind the one with that id, as they are sent; nothing for an id that is not known, or was too long
    // ago.
    std::optional<std::string> since(std::string const& id) const;

private:
    std::string idOf(std::uint64_t number) const { return m_run + "-" + std::to_string(number); }

    std::string const m_run; // another one each time that the program starts
    mutable std::mutex m_mutex;
    std::deque<std::string> m_events; // protected by m_mutex, as what follows
    std::size_t m_bytes = 0;
    std::uint64_t m_next = 1; // number of the event to come
};

} // namespace velmora
