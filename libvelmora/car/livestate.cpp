#include "libvelmora/car/livestate.h"

#include <obd/ivelmorasettings.h>
#include <velmora/error.h>

#include <utility>

namespace velmora {

LiveState::LiveState(Session& session, LiveWish const& wish)
    : m_session(&session), m_choice(std::make_unique<LiveChoice>(session, wish)), m_feed(m_choice->feed())
{}

void LiveState::drop()
{
    if (std::shared_ptr<LiveFeed> const now = feed()) {
        now->stop();
    }
    {
        std::lock_guard const lock(m_mutex);
        m_timer.reset();
    }
    m_choice.reset();
    m_session = nullptr;
}

LiveChoice& LiveState::choice() const
{
    if (m_choice == nullptr) {
        throw Error(ErrorKind::LinkLost, "The link to the adapter is lost", {"read live again once it is back"});
    }
    return *m_choice;
}

Session& LiveState::session() const
{
    choice();
    return *m_session;
}

void LiveState::restart()
{
    LiveChoice& chosen = choice();
    feed()->stop();
    std::shared_ptr<LiveFeed> next = chosen.feed();
    std::lock_guard const lock(m_mutex);
    m_feed = std::move(next);
}

void LiveState::beginRuns()
{
    auto timer = std::make_unique<PerformanceTimer>(choice().chooseForRuns(), *session().obd().getSettings());
    {
        std::lock_guard const lock(m_mutex);
        m_timer = std::move(timer);
    }
    restart();
}

void LiveState::endRuns()
{
    choice().restore();
    {
        std::lock_guard const lock(m_mutex);
        m_timer.reset();
    }
    restart();
}

std::shared_ptr<LiveFeed> LiveState::feed() const
{
    std::lock_guard const lock(m_mutex);
    return m_feed;
}

void LiveState::time(Reading const& reading) const
{
    std::lock_guard const lock(m_mutex);
    if (m_timer != nullptr) {
        m_timer->take(reading);
    }
}

PerformanceRun LiveState::run() const
{
    std::lock_guard const lock(m_mutex);
    return m_timer != nullptr ? m_timer->run() : PerformanceRun();
}

} // namespace velmora
