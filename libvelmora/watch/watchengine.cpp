#include "libvelmora/watch/watchengine.h"

#include <velmora/error.h>

#include <fmt/format.h>

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
    // Without a link nobody knows whether the car still runs.
    if (m_connected || m_judge.state() != SleepJudge::State::Asking) {
        m_judge.onTime(now.steady);
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
    return m_asking ? askingStep : restingStep;
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
    m_lastReading = now.steady;
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
    m_nextAttempt = now.steady + m_backoff.next();
    m_state = "no link";
}

void WatchEngine::work(WatchTime const& now)
{
    followJudge(now);
    if (m_judge.state() == SleepJudge::State::Asking) {
        if (m_connected) {
            ask(now);
        }
    } else {
        stopAsking(now);
        park(now);
    }
}

void WatchEngine::ask(WatchTime const& now)
{
    if (!std::exchange(m_asking, true)) {
        m_lastReading = now.steady;
        m_car.startAsking();
    }
    for (Reading const& each : m_car.readings()) {
        take(each, now);
    }
    watchSilence(now);
    followJudge(now);
    if (m_asking && m_nextCodes && now.steady >= *m_nextCodes) {
        lookAtCodes(now);
    }
    m_state = m_running ? "running" : "asking";
}

void WatchEngine::take(Reading const& reading, WatchTime const& now)
{
    m_lastReading = now.steady;
    setIgnition(true, now);
    double const* const number = std::get_if<double>(&reading.value);
    if (number != nullptr) {
        std::string const& sensor = reading.sensor;
        if (sensor == "RPM") {
            m_judge.onEngineSpeed(*number, now.steady);
            m_trips.onEngineSpeed(*number, now);
        } else if (sensor == "SPEED") {
            m_judge.onVehicleSpeed(*number, now.steady);
            m_trips.onVehicleSpeed(*number, now);
        } else if (sensor == "MODULE_VOLTAGE") {
            m_judge.onVolts(*number, now.steady);
        } else if (reading.unit == "l/h") {
            m_trips.onFuelRate(*number, now);
        } else if (sensor == "COOLANT_TEMP") {
            m_trips.onCoolant(*number);
        } else if (sensor == "CLEAR_DISTANCE") {
            m_trips.onOdometer(*number);
        }
    }
    m_sink(reading);
}

void WatchEngine::watchSilence(WatchTime const& now)
{
    if (now.steady - m_lastReading < m_rules.silence || now.steady - m_lastCheck < m_rules.silence) {
        return;
    }
    m_lastCheck = now.steady;
    m_car.check();
    setIgnition(false, now);
    if (now.steady - m_lastReading >= m_rules.silentCar) {
        m_judge.sleep(now.steady);
    }
}

void WatchEngine::setIgnition(bool on, WatchTime const& now)
{
    if (std::exchange(m_ignition, on) != on) {
        tell(on ? "ignition_on" : "ignition_off", on ? "The car answers" : "The car no longer answers", now);
    }
}

void WatchEngine::lookAtCodes(WatchTime const& now)
{
    m_nextCodes = now.steady + m_rules.codesEvery;
    for (CodeLook const& look : m_car.lookAtCodes()) {
        for (Record& each : m_codes.take(look, now.wall)) {
            m_sink(std::move(each));
        }
    }
}

void WatchEngine::followJudge(WatchTime const& now)
{
    if (std::exchange(m_running, m_judge.running()) != m_judge.running()) {
        tell(m_running ? "engine_start" : "engine_stop", m_running ? "The engine runs" : "The engine stands", now);
        if (m_running) {
            m_nextCodes = now.steady;
        }
    }
    if (std::exchange(m_lowTold, m_judge.low()) != m_judge.low()) {
        tell(m_lowTold ? "voltage_low" : "voltage_good", m_lowTold ? "The battery is low" : "The battery has recovered",
             now);
    }
}

void WatchEngine::stopAsking(WatchTime const& now)
{
    if (std::exchange(m_asking, false)) {
        m_car.stopAsking();
        setIgnition(false, now);
        tell("asleep", "The car is parked: nothing is asked of it any more", now);
    }
}

void WatchEngine::park(WatchTime const& now)
{
    bool const settling = m_judge.state() == SleepJudge::State::Settling;
    m_state = settling ? "settling" : "parked";
    if (settling) {
        return;
    }
    if (m_rules.battery.adapterSleep && !m_sleepless) {
        nap(now);
    } else {
        lookAtVoltage(now);
    }
    followJudge(now);
    if (m_judge.state() == SleepJudge::State::Asking) {
        tell("awake", "The car seems to wake up", now);
    }
}

void WatchEngine::lookAtVoltage(WatchTime const& now)
{
    if (m_judge.wantsVolts(now.steady)) {
        std::optional<double> const volts = m_car.volts();
        onLinkBack(now);
        volts ? m_judge.onVolts(*volts, now.steady) : m_judge.onNoVolts(now.steady);
    }
    if (m_judge.wantsProbe(now.steady)) {
        ++m_probes;
        m_judge.onProbe(m_car.probe(), now.steady);
    }
}

// An adapter that sleeps tells no voltage; one that does not know how to goes on telling it.
void WatchEngine::nap(WatchTime const& now)
{
    if (!m_napping) {
        m_connected = false;
        m_napping = m_car.startNap();
        m_sleepless = !m_napping;
        onLinkBack(now);
        m_napping ? tell("adapter_asleep", "The adapter sleeps until its own triggers wake it", now)
                  : tell("adapter_awake", "The adapter knows no sleep: it is asked for the voltage", now);
    } else if (m_car.napIsOver()) {
        m_napping = false;
        m_judge.wake(now.steady);
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
