#pragma once

#include "libvelmora/live/livechoice.h"

#include <velmora/live.h>

#include <memory>
#include <mutex>

namespace velmora {

// What a LiveReader has of a session, until that ends. The car's thread, but for what says otherwise.
class LiveState
{
public:
    LiveState(Session& session, LiveWish const& wish);

    // The session ends: nothing of it is touched from then on. Once more does nothing.
    void drop();

    // Throws Error if it was dropped.
    LiveChoice& choice() const;
    Session& session() const;
    // Afresh. The poller is gone before the next one begins.
    void restart();
    void beginRuns();
    void endRuns();

    // Any thread, from here on.
    std::shared_ptr<LiveFeed> feed() const;
    void time(Reading const& reading) const;
    PerformanceRun run() const;

private:
    Session* m_session; // null once it was dropped
    std::unique_ptr<LiveChoice> m_choice;
    mutable std::mutex m_mutex;
    std::shared_ptr<LiveFeed> m_feed;          // protected by m_mutex
    std::unique_ptr<PerformanceTimer> m_timer; // protected by m_mutex; null while no runs are timed
};

} // namespace velmora
