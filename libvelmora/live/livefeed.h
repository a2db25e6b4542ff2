#pragma once

#include "libvelmora/poll/vehiclepoll.h"

#include <chrono>
#include <condition_variable>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

namespace velmora {

// What a poller reads, for another thread to take. Any thread.
class LiveFeed
{
public:
    // Polls from here on, until stop; library and channel must outlive that.
    LiveFeed(obd::IObdVelmora const& obd, std::vector<PollChoice> const& choices, PollWill const& will, Units units,
             IChannelControl& channel, std::vector<PollSource> const& guests);

    void stop();
    // Until something has come or the time is over; whether it has.
    bool wait(std::chrono::milliseconds time);
    std::vector<PollResult> take();
    // Those of the end, once it has been stopped.
    std::vector<PollRate> rates() const;

private:
    std::mutex m_mutex;
    std::condition_variable m_wake;
    std::vector<PollResult> m_results; // protected by m_mutex
    mutable std::mutex m_pollerMutex;  // never taken by the poller's thread
    std::vector<PollRate> m_lastRates; // protected by m_pollerMutex
    std::unique_ptr<Poller> m_poller;  // protected by m_pollerMutex; ends before what it hands over to
};

} // namespace velmora
