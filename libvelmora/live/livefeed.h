#pragma once

#include "libvelmora/live/ratetext.h"
#include "libvelmora/poll/vehiclepoll.h"
#include "libvelmora/session/dispatchloop.h"

#include <memory>
#include <mutex>
#include <vector>

namespace velmora {

// What a poller reads, for the thread of the session to take, whose loop it wakes.
class LiveFeed
{
public:
    // Polls from here on; library, loop and channel must outlive it.
    LiveFeed(obd::IObdVelmora const& obd, DispatchLoop& loop, std::vector<PollChoice> const& choices,
             PollWill const& will, Units units, IChannelControl& channel, std::vector<PollSource> const& guests);

    bool hasNew() const;
    std::vector<PollResult> take();
    // The rates that were asked for with those reached; see reachedRates and missedRates.
    std::string reached() const { return reachedRates(m_poller->rates()); }
    std::string missed() const { return missedRates(m_poller->rates()); }

private:
    mutable std::mutex m_mutex;
    std::vector<PollResult> m_results; // protected by m_mutex
    std::unique_ptr<Poller> m_poller;  // ends before what it hands over to
};

} // namespace velmora
