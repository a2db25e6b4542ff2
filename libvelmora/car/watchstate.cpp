#include "libvelmora/car/watchstate.h"

#include <utility>

namespace velmora {

WatchState::WatchState(std::vector<std::string> sensors, Car::OnReading onReading, Car::OnLink onLink)
    : m_sensors(std::move(sensors)), m_onReading(std::move(onReading)), m_onLink(std::move(onLink))
{}

void WatchState::tell(Reading const& reading)
{
    std::lock_guard const lock(m_calling);
    if (!m_ended && m_onReading) {
        m_onReading(reading);
    }
}

void WatchState::tell(LinkState state)
{
    std::lock_guard const lock(m_calling);
    if (!m_ended && m_onLink) {
        m_onLink(state);
    }
}

void WatchState::end()
{
    m_ended = true;
    std::lock_guard const lock(m_calling);
}

} // namespace velmora
