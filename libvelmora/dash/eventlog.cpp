#include "libvelmora/dash/eventlog.h"

#include "libvelmora/http/httpserver.h"

#include <charconv>
#include <random>
#include <string_view>

namespace velmora {

DashEventLog::DashEventLog() : m_run(std::to_string(std::random_device()())) {}

std::string DashEventLog::add(std::string const& data)
{
    std::lock_guard const lock(m_mutex);
    m_events.push_back(data);
    m_bytes += data.size();
    while (m_bytes > mostBytes) {
        m_bytes -= m_events.front().size();
        m_events.pop_front();
    }
    return idOf(m_next++);
}

std::string DashEventLog::last() const
{
    std::lock_guard const lock(m_mutex);
    return idOf(m_next - 1);
}

std::optional<std::string> DashEventLog::since(std::string const& id) const
{
    std::size_t const dash = id.find('-');
    if (dash == std::string::npos || std::string_view(id).substr(0, dash) != m_run) {
        return std::nullopt;
    }
    std::uint64_t number = 0;
    auto const [end, error] = std::from_chars(id.data() + dash + 1, id.data() + id.size(), number);
    std::lock_guard const lock(m_mutex);
    std::uint64_t const first = m_next - m_events.size(); // that is kept
    if (error != std::errc() || end != id.data() + id.size() || number >= m_next || number + 1 < first) {
        return std::nullopt;
    }
    std::string events;
    for (std::uint64_t each = number + 1; each < m_next; ++each) {
        events += HttpServer::event("values", m_events[each - first], idOf(each));
    }
    return events;
}

} // namespace velmora
