#include "libvelmora/dash/dashdesk.h"

#include <algorithm>

namespace velmora {

namespace {

constexpr std::size_t mostAsks = 16;

} // namespace

std::shared_ptr<void> DashDesk::listen(Listener listener)
{
    std::lock_guard const lock(m_listenersMutex);
    void* const mine = m_listeners.emplace_back(std::make_unique<Listener>(std::move(listener))).get();
    // Whoever lets go waits for a call that is under way.
    return {mine, [this](void* gone) {
                std::lock_guard const last(m_listenersMutex);
                std::erase_if(m_listeners,
                              [gone](std::unique_ptr<Listener> const& each) { return each.get() == gone; });
            }};
}

bool DashDesk::ask(DashAsk ask)
{
    std::lock_guard const lock(m_asksMutex);
    bool const waits = std::ranges::any_of(
        m_asks, [&ask](DashAsk const& each) { return each.topic == ask.topic && each.text == ask.text; });
    if (waits) {
        return true;
    }
    if (m_asks.size() >= mostAsks) {
        return false;
    }
    m_asks.push_back(std::move(ask));
    return true;
}

std::optional<DashAsk> DashDesk::next()
{
    std::lock_guard const lock(m_asksMutex);
    if (m_asks.empty()) {
        return std::nullopt;
    }
    DashAsk first = std::move(m_asks.front());
    m_asks.pop_front();
    return first;
}

void DashDesk::drop()
{
    std::lock_guard const lock(m_asksMutex);
    m_asks.clear();
}

template <typename Member, typename Value>
void DashDesk::hand(Member member, Value const& value)
{
    std::lock_guard const lock(m_listenersMutex);
    for (std::unique_ptr<Listener> const& each : m_listeners) {
        if ((*each).*member) {
            ((*each).*member)(value);
        }
    }
}

void DashDesk::tell(Reading const& reading)
{
    m_runs.take(reading);
    hand(&Listener::reading, reading);
}

void DashDesk::tell(DashLine const& line)
{
    hand(&Listener::line, line);
}

void DashDesk::tell(DashAnswer const& answer)
{
    hand(&Listener::answer, answer);
}

void DashDesk::tell(DashVehicle const& vehicle)
{
    hand(&Listener::vehicle, vehicle);
}

} // namespace velmora
