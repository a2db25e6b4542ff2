#pragma once

#include "libvelmora/watch/watchtime.h"

#include <optional>

namespace velmora {

// When a car counts as running and as parked. Volts are those of a 12 V system; a 24 V one, known by more than 18 V,
// has twice as much.
struct BatterySettings
{
    std::chrono::seconds stopAfter{120};           // asked on that long after the last sign that it runs
    std::chrono::seconds settle{120};              // then left alone that long before the voltage is judged
    std::chrono::seconds voltageEvery{60};         // while parked
    double runningVolts = 13.2;                    // at least, with a classic alternator or a DC converter
    double lowVolts = 12.1;                        // below it everything stops, and an event tells
    double wakeChange = 0.2;                       // V between two looks
    std::optional<std::chrono::minutes> wakeEvery; // one request that often while parked
    bool electric = false;                         // hybrid or electric: an engine that stands says nothing
    bool adapterSleep = false;                     // while parked, in place of looks at the voltage
    std::chrono::minutes stillLimit{30};           // a running voltage without movement counts no longer
};

// Judges whether the car runs, and so whether control modules may be asked. Asking keeps modules awake and with them
// the voltage up: so the asking stops first, then the voltage is judged. Reads no clock.
class SleepJudge
{
public:
    enum class State
    {
        Asking,   // requests to control modules are allowed
        Settling, // nothing at all
        Parked,   // the adapter may be asked for the voltage
    };

    SleepJudge(BatterySettings const& settings, SteadyTime now);

    State state() const { return m_state; }
    // Whether engine or vehicle moved at the last look.
    bool running() const { return m_running; }
    bool low() const { return m_low; }

    // What control modules tell.
    void onEngineSpeed(double rpm, SteadyTime now);
    void onVehicleSpeed(double kmh, SteadyTime now);
    // From a control module or the adapter.
    void onVolts(double volts, SteadyTime now);
    // The adapter did not tell the voltage that wantsVolts asked for.
    void onNoVolts(SteadyTime now) { m_lastVolts = now; }
    // The answer to the request of wantsProbe.
    void onProbe(bool answered, SteadyTime now);
    // Moves on with time. Call it often.
    void onTime(SteadyTime now);
    // The user wants values now, or a link came up that never was judged.
    void wake(SteadyTime now);
    // Goes to sleep at once: the car is silent, as sleeping cars are.
    void sleep(SteadyTime now);

    // Whether the adapter should be asked for the voltage: while parked, and where it is the sign that the car runs and
    // no control module tells it.
    bool wantsVolts(SteadyTime now) const;
    // While parked: whether one request is allowed by wakeEvery.
    bool wantsProbe(SteadyTime now) const;

private:
    void enter(State state, SteadyTime now);
    void sign(bool positive, SteadyTime now);
    bool goesByVolts() const { return m_settings.electric || !m_engineKnown; }
    void judgeAwake(double volts, SteadyTime now);
    void judgeParked(double volts, SteadyTime now);
    double scale(double volts) const { return volts * m_system; }

    BatterySettings const m_settings;
    State m_state = State::Asking;
    SteadyTime m_since;     // of the state
    SteadyTime m_lastSign;  // that it runs
    SteadyTime m_lastMove;  // of the vehicle
    SteadyTime m_lastVolts; // told or asked for
    SteadyTime m_lastProbe;
    std::optional<double> m_volts; // the last while parked
    bool m_running = false;
    bool m_engineTurns = false;
    bool m_moves = false;
    bool m_charges = false;
    bool m_engineKnown = false; // the vehicle tells its engine speed
    bool m_low = false;
    double m_system = 1.0; // 2 for 24 V
};

} // namespace velmora
