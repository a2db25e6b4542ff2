// The link of a car: connecting, finding out that it is lost, and coming back.

#include "libvelmora/car/carcore.h"
#include "libvelmora/car/sessionend.h"
#include "libvelmora/read/sensorchoice.h"
#include "libvelmora/record/recorderparts.h"

#include <obd/itroublecodeservice.h>
#include <velmora/recorder.h>

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

constexpr std::chrono::seconds silence{3};
constexpr std::chrono::seconds longestPause{16};

} // namespace

void CarCore::connect()
{
    auto session = std::make_unique<Session>(SessionOptions(m_options));
    {
        std::lock_guard const lock(m_mutex);
        m_session = std::move(session);
        if (m_stop || m_options.stop.stop_requested()) {
            m_session->interrupt();
        }
    }
    if (m_options.recorder != nullptr) {
        m_options.recorder->m_parts->opening();
        m_session->record(m_options.recorder->m_parts->recorder);
    }
    if (m_options.onTraffic) {
        m_traffic = std::make_unique<TrafficTap>(m_options.onTraffic);
    }
    m_session->connect();
    m_lastReading = Clock::now();
}

void CarCore::disconnect()
{
    for (std::shared_ptr<WatchState> const& watch : m_watches) {
        watch->setPoller(nullptr);
    }
    for (std::weak_ptr<LiveState> const& each : std::exchange(m_lives, {})) {
        if (std::shared_ptr<LiveState> const state = each.lock()) {
            state->drop();
        }
    }
    m_asking.reset();
    m_traffic.reset();
    noteEnd();
    std::unique_ptr<Session> session;
    {
        std::lock_guard const lock(m_mutex);
        session = std::move(m_session);
    }
}

// What only the session knows, before it ends.
void CarCore::noteEnd() const
{
    if (m_session == nullptr) {
        return;
    }
    if (m_options.recorder != nullptr) {
        auto const adapter = m_session->adapter();
        m_options.recorder->m_parts->closing(adapter != nullptr ? adapter->device() : std::string());
    }
    tellUnwritten(*m_session, m_options);
}

// Without any sensor it asks once for the lamp: from its first request on the library keeps an idle connection up, by
// one every five seconds.
void CarCore::keepAsking(std::vector<std::string> const& sensors)
{
    call([this, &sensors](Session& session) {
        if (!session.options().module) {
            session.select(*session.proxy()->firstEcu()); // a reading of all modules leaves the last one selected
        }
        if (sensors.empty()) {
            obd::TroubleCodeServiceBuilder::createTroubleCodeService()->askMilStatus();
            return;
        }
        m_asking = obd::SensorServiceBuilder::createSensorService();
        m_asking->startUpdates(chooseSensors(sensors, offeredSensors(*m_asking)));
    });
}

void CarCore::check()
{
    onThread([this] {
        if (m_session == nullptr) {
            openSession();
        }
        m_session->check();
    });
}

std::string CarCore::trouble()
{
    return onThread([this] { return m_session != nullptr ? m_session->trouble() : std::string(); });
}

std::string CarCore::port()
{
    return onThread([this] { return m_session != nullptr ? m_session->port() : m_options.port; });
}

void CarCore::superviseLink()
{
    if (m_watches.empty() || m_options.stop.stop_requested()) {
        return; // the next call finds out
    }
    if (m_session == nullptr) {
        comeBack();
    } else if (isLinkLost()) {
        disconnect();
        m_nextTry = Clock::now();
        m_pause = std::chrono::seconds(1);
        for (std::shared_ptr<WatchState> const& watch : m_watches) {
            watch->tell(LinkState::Lost);
        }
    }
}

// An adapter that has gone quiet is asked whether it is there.
bool CarCore::isLinkLost()
{
    if (m_session->lost()) {
        return true;
    }
    if (Clock::now() - m_lastReading < silence) {
        return false;
    }
    m_lastReading = Clock::now();
    return m_session->adapterSilent() || !m_session->proxy()->isConnected();
}

void CarCore::comeBack()
{
    if (Clock::now() < m_nextTry) {
        return;
    }
    try {
        connect();
        for (std::shared_ptr<WatchState> const& watch : m_watches) {
            startWatch(watch);
        }
    } catch (Error const&) {
        disconnect();
        m_nextTry = Clock::now() + m_pause;
        m_pause = std::min(2 * m_pause, longestPause);
        return;
    }
    for (std::shared_ptr<WatchState> const& watch : m_watches) {
        watch->tell(LinkState::Returned);
    }
}

void CarCore::reconnect()
{
    onThread([this] {
        disconnect();
        connect();
        for (std::shared_ptr<WatchState> const& watch : m_watches) {
            startWatch(watch);
        }
    });
}

} // namespace velmora
