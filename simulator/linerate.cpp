#include "simulator/linerate.h"

#include <algorithm>

namespace obdsim {

namespace {

std::optional<Time> earlier(std::optional<Time> a, std::optional<Time> b)
{
    if (!a || !b) {
        return a ? a : b;
    }
    return std::min(*a, *b);
}

} // namespace

LineRate::LineRate(std::shared_ptr<IPeer> inner, int baud) : m_inner(std::move(inner)), m_baud(baud) {}

void LineRate::receive(std::string_view bytes)
{
    while (!bytes.empty()) {
        auto const end = bytes.find('\r');
        std::string_view const part = bytes.substr(0, end == std::string_view::npos ? end : end + 1);
        m_toPeer.push(std::max(now(), m_toPeer.end(now())) + duration(part.size()), std::string(part));
        bytes.remove_prefix(part.size());
    }
}

std::optional<Time> LineRate::nextOutput() const
{
    return earlier(m_toHost.next(), earlier(m_toPeer.next(), m_inner->nextOutput()));
}

std::string LineRate::advanceTo(Time time)
{
    for (auto next = earlier(m_toPeer.next(), m_inner->nextOutput()); next && *next <= time;
         next = earlier(m_toPeer.next(), m_inner->nextOutput())) {
        Time const at = std::max(*next, now());
        std::string const said = m_inner->advanceTo(at);
        m_toHost.push(m_toHost.end(at) + duration(said.size()), said);
        m_inner->receive(m_toPeer.take(at));
    }
    m_inner->advanceTo(time);
    return m_toHost.take(now());
}

Time LineRate::now() const
{
    return m_inner->now();
}

void LineRate::connect()
{
    m_toPeer.clear();
    m_toHost.clear();
    m_inner->connect();
}

bool LineRate::linkIsUp() const
{
    return m_inner->linkIsUp() || m_toHost.next();
}

Time LineRate::duration(std::size_t characters) const
{
    constexpr Time::rep bits = 10;
    return Time(static_cast<Time::rep>(characters) * bits * 1'000'000 / m_baud);
}

} // namespace obdsim
