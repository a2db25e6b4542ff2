#include "libvelmora/live/livefeed.h"

#include <utility>

namespace velmora {

LiveFeed::LiveFeed(obd::IObdVelmora const& obd, DispatchLoop& loop, std::vector<PollChoice> const& choices,
                   PollWill const& will, Units units, IChannelControl& channel, std::vector<PollSource> const& guests)
    : m_poller(pollVehicle(
          obd, choices, will, units,
          [this, &loop](PollResult const& result) {
              {
                  std::lock_guard const lock(m_mutex);
                  m_results.push_back(result);
              }
              loop.wake();
          },
          &channel, guests))
{}

bool LiveFeed::hasNew() const
{
    std::lock_guard const lock(m_mutex);
    return !m_results.empty();
}

std::vector<PollResult> LiveFeed::take()
{
    std::lock_guard const lock(m_mutex);
    return std::exchange(m_results, {});
}

} // namespace velmora
