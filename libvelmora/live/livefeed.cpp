#include "libvelmora/live/livefeed.h"

#include <utility>

namespace velmora {

LiveFeed::LiveFeed(obd::IObdVelmora const& obd, std::vector<PollChoice> const& choices, PollWill const& will,
                   Units units, IChannelControl& channel, std::vector<PollSource> const& guests)
    : m_poller(pollVehicle(
          obd, choices, will, units,
          [this](PollResult const& result) {
              std::lock_guard const lock(m_mutex);
              m_results.push_back(result);
              m_wake.notify_all();
          },
          &channel, guests))
{}

void LiveFeed::stop()
{
    std::lock_guard const lock(m_pollerMutex);
    if (m_poller != nullptr) {
        m_lastRates = m_poller->rates();
        m_poller.reset();
    }
}

bool LiveFeed::wait(std::chrono::milliseconds time)
{
    std::unique_lock lock(m_mutex);
    return m_wake.wait_for(lock, time, [this] { return !m_results.empty(); });
}

std::vector<PollResult> LiveFeed::take()
{
    std::lock_guard const lock(m_mutex);
    return std::exchange(m_results, {});
}

std::vector<PollRate> LiveFeed::rates() const
{
    std::lock_guard const lock(m_pollerMutex);
    return m_poller != nullptr ? m_poller->rates() : m_lastRates;
}

} // namespace velmora
