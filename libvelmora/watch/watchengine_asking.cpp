#include "libvelmora/watch/watchengine.h"

#include <utility>

namespace velmora {

void WatchEngine::ask(WatchTime const& now)
{
    if (!std::exchange(m_asking, true)) {
        m_lastReading = now.steady;
        m_car.startAsking();
    }
    for (Reading const& each : m_car.readings()) {
        take(each, now);
    }
    m_car.check(); // a link that broke brings no readings, which a silent car does neither
    watchSilence(now);
    lookAtVoltage(now);
    // Not before what was read meanwhile: a look at the codes takes its time. Without a link nobody knows whether the
    // car still runs, so this is no matter of time alone.
    m_judge.onTime(now.steady);
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
    if (now.steady - m_lastReading < m_rules.silence) {
        return;
    }
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
    m_looked = true;
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

} // namespace velmora
