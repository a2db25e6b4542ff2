#include "libvelmora/watch/sleepjudge.h"

#include <cmath>

namespace velmora {

namespace {

constexpr double highest12 = 18.0; // V; above it a system of 24 V
constexpr double lowest24 = 16.0;  // below it surely none
constexpr double step = 0.1;       // adapters tell tenths of a volt

} // namespace

SleepJudge::SleepJudge(BatterySettings const& settings, SteadyTime now) : m_settings(settings)
{
    m_lastMove = now;
    enter(State::Asking, now);
}

void SleepJudge::enter(State state, SteadyTime now)
{
    m_state = state;
    m_since = now;
    m_lastSign = now;
    m_lastVolts = now;
    if (state != State::Asking) {
        m_running = m_engineTurns = m_moves = m_charges = false;
    }
    if (state == State::Parked) {
        m_volts.reset();
        m_lastVolts = now - m_settings.voltageEvery;
        m_lastProbe = now;
    }
}

// A sign is a value above 0 that came now: the last one of a sensor that has fallen silent is none.
void SleepJudge::sign(bool positive, SteadyTime now)
{
    m_running = m_engineTurns || m_moves || m_charges;
    if (positive) {
        m_lastSign = now;
    }
}

void SleepJudge::onEngineSpeed(double rpm, SteadyTime now)
{
    m_engineKnown = true;
    if (m_state == State::Asking) {
        m_engineTurns = rpm > 0.0;
        sign(m_engineTurns, now);
    }
}

void SleepJudge::onVehicleSpeed(double kmh, SteadyTime now)
{
    if (m_state != State::Asking) {
        return;
    }
    m_moves = kmh > 0.0;
    if (m_moves) {
        m_lastMove = now;
    }
    sign(m_moves, now);
}

void SleepJudge::onVolts(double volts, SteadyTime now)
{
    if (volts > highest12) {
        m_system = 2.0;
    } else if (volts < lowest24) {
        m_system = 1.0;
    }
    m_low = volts < scale(m_settings.lowVolts);
    m_lastVolts = now;
    if (m_state == State::Asking) {
        judgeAwake(volts, now);
    } else if (m_state == State::Parked) {
        judgeParked(volts, now);
    }
}

// The voltage of an alternator or a converter is a sign where the engine's speed is none.
void SleepJudge::judgeAwake(double volts, SteadyTime now)
{
    m_charges = goesByVolts() && volts >= scale(m_settings.runningVolts) && now - m_lastMove < m_settings.stillLimit;
    sign(m_charges, now);
    if (m_low && !m_running) {
        enter(State::Settling, now);
    }
}

// By level only if it was below before: a converter that charges a parked car for hours would else wake it for ever.
void SleepJudge::judgeParked(double volts, SteadyTime now)
{
    std::optional<double> const before = m_volts;
    m_volts = volts;
    if (!before || m_low) {
        return;
    }
    double const level = scale(m_settings.runningVolts);
    bool const risen = *before < level && volts >= level;
    bool const changed = std::abs(volts - *before) > scale(m_settings.wakeChange) - step / 2.0;
    if (risen || changed) {
        wake(now);
    }
}

void SleepJudge::onProbe(bool answered, SteadyTime now)
{
    m_lastProbe = now;
    if (answered) {
        wake(now);
    }
}

void SleepJudge::onTime(SteadyTime now)
{
    if (m_state == State::Asking && now - m_lastSign >= m_settings.stopAfter) {
        enter(State::Settling, now);
    } else if (m_state == State::Settling && now - m_since >= m_settings.settle) {
        enter(State::Parked, now);
    }
}

void SleepJudge::wake(SteadyTime now)
{
    m_lastMove = now;
    enter(State::Asking, now);
}

void SleepJudge::sleep(SteadyTime now)
{
    enter(State::Settling, now);
}

bool SleepJudge::wantsVolts(SteadyTime now) const
{
    bool const looks = m_state == State::Parked || (m_state == State::Asking && goesByVolts());
    return looks && now - m_lastVolts >= m_settings.voltageEvery;
}

bool SleepJudge::wantsProbe(SteadyTime now) const
{
    return m_state == State::Parked && m_settings.wakeEvery.has_value() && !m_low &&
           now - m_lastProbe >= *m_settings.wakeEvery;
}

} // namespace velmora
