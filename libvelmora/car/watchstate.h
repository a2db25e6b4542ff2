#pragma once

#include "libvelmora/poll/poller.h"

#include <velmora/car.h>

#include <atomic>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

namespace velmora {

// One watch of a car. The car's thread calls; any thread may end it.
class WatchState
{
public:
    WatchState(std::vector<std::string> sensors, Car::OnReading onReading, Car::OnLink onLink);

    std::vector<std::string> const& sensors() const { return m_sensors; }

    // The car's thread.
    void tell(Reading const& reading);
    void tell(LinkState state);
    void setPoller(std::unique_ptr<Poller> poller) { m_poller = std::move(poller); }
    bool ended() const { return m_ended; }

    // Once it has returned, no callback is running, unless this is one.
    void end();

private:
    std::vector<std::string> const m_sensors;
    Car::OnReading const m_onReading;
    Car::OnLink const m_onLink;
    std::unique_ptr<Poller> m_poller; // the car's thread alone
    std::atomic<bool> m_ended{false};
    std::recursive_mutex m_calling; // held while a callback runs; a callback may end its own watch
};

} // namespace velmora
