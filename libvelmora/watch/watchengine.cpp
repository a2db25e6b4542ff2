#include "libvelmora/watch/watchengine.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <cmath>
#include <utility>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds askingStep{100};
constexpr std::chrono::milliseconds restingStep{1000};

} // namespace

WatchEngine::WatchEngine(IWatchedCar& car, WatchRules rules, Sink sink, WatchTime const& now)
    : m_car(car), m_rules(std::move(rules)), m_sink(std::move(sink)), m_judge(m_rules.battery, now.steady),
      m_trips(m_rules.vehicle, m_rules.trips), m_codes(m_rules.vehicle), m_backoff(m_rules.seed),
      m_nextAttempt(now.steady)
{}

void WatchEngine::tell(std::string const& kind, std::string const& text, WatchTime const& now)
{
    m_sink(Event{now.wall, m_rules.vehicle, kind, {}, text});
}

std::chrono::milliseconds WatchEngine::step(WatchTime const& now)
{
    if (m_metStranger) {
        return restingStep;
    }
    watchClock(now);
    if (std::optional<std::chrono::milliseconds> const pause = std::exchange(m_pause, std::nullopt)) {
        m_nextAttempt = now.steady + *pause; // the attempt took its time, too
    }
    if (std::exchange(m_looked, false)) {
        m_lastReading = now.steady;
    }
    if (m_judge.state() != SleepJudge::State::Asking) {
        m_judge.onTime(now.steady);
    } else if (std::exchange(m_fresh, false)) {
        m_judge.wake(now.steady); // on a slow bus it took minutes to get here
    }
    try {
        if (now.steady >= m_nextAttempt) {
            if (!m_connected && m_judge.state() == SleepJudge::State::Asking) {
                connect(now);
            }
            work(now);
        }
    } catch (Error const& error) {
        if (error.kind() == ErrorKind::Interrupted) {
            throw;
        }
        onLost(error, now);
    }
    tellTrip(m_trips.onTime(now));
    if (m_pause) {
        return std::chrono::milliseconds(0);
    }
    return m_asking ? askingStep : restingStep;
}

// What is written from now on has other times, and what was written before may be wrong.
void WatchEngine::watchClock(WatchTime const& now)
{
    if (now.steady < m_nextClockLook) {
        return;
    }
    m_nextClockLook = now.steady + restingStep;
    std::int64_t const step = m_clock.look(m_rules.clocks());
    if (step != 0) {
        m_trips.onClockSet(std::chrono::milliseconds(step));
        tell("clock_set",
             fmt::format("The clock was set {} by {:.1f} s", step > 0 ? "forward" : "back",
                         std::abs(static_cast<double>(step)) / 1000.0),
             now);
    }
    bool const never = m_clock.trust() == ClockJudge::Trust::Never;
    if (std::exchange(m_unsureTold, never) != never && never) {
        tell("clock_unsure", "The clock was not set since the machine's start, and can't be right", now);
    }
}

void WatchEngine::connect(WatchTime const& now)
{
    m_state = "connecting";
    try {
        m_car.connect();
    } catch (Error const& error) {
        if (error.kind() != ErrorKind::VehicleSilent) {
            throw;
        }
        // The adapter works: that is how a sleeping car looks.
        onLinkBack(now);
        m_trouble = error.what();
        m_car.disconnect();
        m_judge.sleep(now.steady);
        return;
    }
    if (m_rules.isStranger(m_car.vin())) {
        m_metStranger = true;
        m_car.disconnect();
        return;
    }
    m_connected = true;
    onConnected(now);
}

void WatchEngine::onConnected(WatchTime const& now)
{
    onLinkBack(now);
    if (!m_everConnected) {
        for (ModuleInfo const& each : m_car.modules()) {
            m_sink(each);
        }
    }
    m_everConnected = true;
    m_sink(m_car.sensors());
    m_judge.wake(now.steady);
    m_fresh = true;
    lookAtCodes(now);
}

void WatchEngine::onLinkBack(WatchTime const& now)
{
    m_backoff.reset();
    m_trouble.clear();
    if (std::exchange(m_lost, false)) {
        tell("link_back", "The link is back", now);
    }
}

void WatchEngine::onLost(Error const& error, WatchTime const& now)
{
    if (m_everConnected && !std::exchange(m_lost, true)) {
        ++m_losses;
        tell("link_lost", error.what(), now);
    }
    m_trouble = error.what();
    m_asking = false;
    m_connected = false;
    m_napping = false;
    m_car.disconnect();
    m_pause = m_backoff.next();
    m_state = "no link";
}

void WatchEngine::work(WatchTime const& now)
{
    followJudge(now);
    if (m_judge.state() == SleepJudge::State::Asking && m_connected) {
        ask(now);
    }
    if (m_judge.state() != SleepJudge::State::Asking) {
        stopAsking(now);
        park(now);
    }
}

void WatchEngine::tellTrip(std::optional<Trip> const& trip)
{
    if (!trip) {
        return;
    }
    m_sink(*trip);
    m_sink(Event{trip->end,
                 m_rules.vehicle,
                 trip->engineRun ? "engine_run" : "trip",
                 {},
                 fmt::format("{:.1f} km in {:.0f} min", trip->distanceKm, trip->durationS / 60.0)});
}

void WatchEngine::finish(WatchTime const& now)
{
    if (std::exchange(m_asking, false)) {
        for (Reading const& each : m_car.readings()) {
            take(each, now);
        }
        m_car.stopAsking();
    }
    tellTrip(m_trips.finish());
    m_car.disconnect();
}

Health WatchEngine::health() const
{
    Health health;
    health.linkUp = m_connected && m_asking;
    health.state = m_state;
    health.trouble = m_trouble;
    health.requests = m_car.requests();
    health.errors = m_car.errors();
    health.linkLosses = m_losses;
    health.wakeRequests = m_probes;
    return health;
}

} // namespace velmora
