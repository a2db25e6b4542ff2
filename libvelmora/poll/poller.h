#pragma once

#include "libvelmora/poll/pollcycle.h"

#include <atomic>
#include <thread>

namespace velmora {

// How many bytes of data a PID has, as far as these modules can be told: nothing where only the reply tells it.
PidLength pidLengths(std::vector<PollSource> const& sources);

// Reads live values on a thread of its own, straight through the library's proxy, for as long as it lives. It goes on
// over failed requests; whether the link still stands is for its owner to find out.
class Poller
{
public:
    // sink is called on the poller's thread for everything that was read; it must not destroy the poller. channel, by
    // which one module can be asked alone, must outlive it; null where there is none.
    Poller(std::shared_ptr<obd::IObdProxy> const& proxy, std::vector<PollSource> const& sources, PollPace const& pace,
           Units units, PollCycle::Sink sink, IChannelControl* channel = nullptr);
    // Ends the thread; a request that is on its way is waited for.
    ~Poller();
    Poller(Poller const&) = delete;
    Poller& operator=(Poller const&) = delete;

    std::vector<PollRate> rates() { return m_cycle.rates(); }

private:
    void run();

    PollCycle m_cycle;
    std::atomic<bool> m_stop{false};
    std::thread m_thread;
};

} // namespace velmora
