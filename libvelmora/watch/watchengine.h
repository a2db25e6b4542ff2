#pragma once

#include "libvelmora/output/backoff.h"
#include "libvelmora/output/clockjudge.h"
#include "libvelmora/output/health.h"
#include "libvelmora/watch/iwatchedcar.h"
#include "libvelmora/watch/sleepjudge.h"
#include "libvelmora/watch/tripmeter.h"

#include <functional>
#include <optional>
#include <string>

namespace velmora {
class Error;
}

namespace velmora {

struct WatchRules
{
    std::string vehicle;
    BatterySettings battery;
    TripSettings trips;
    std::chrono::minutes codesEvery{10};
    std::chrono::seconds silence{10};   // without a reading while asking: the link is looked at
    std::chrono::seconds silentCar{60}; // without a reading while asking: the car sleeps
    // Whether a vehicle identification number is that of another vehicle than the one to be watched.
    std::function<bool(std::string const& vin)> isStranger = [](std::string const& /*vin*/) { return false; };
    unsigned int seed = 1; // of the jitter of pauses
    ClockSource clocks = lookAtClocks;
};

// The watch without its clock and its loop: connects, asks, judges, tells. Call step as often as it says.
class WatchEngine
{
public:
    using Sink = std::function<void(Record record)>;

    // car must outlive it.
    WatchEngine(IWatchedCar& car, WatchRules rules, Sink sink, WatchTime const& now);

    // Does what is due. Tells how long nothing is, at most a second.
    std::chrono::milliseconds step(WatchTime const& now);
    // The codes are looked at with the next step.
    void lookAtCodesSoon() { m_nextCodes = SteadyTime(); }
    // Ends the trip under way and lets go of the car.
    void finish(WatchTime const& now);

    // Without the outputs.
    Health health() const;
    std::string const& state() const { return m_state; }
    // Whether another vehicle than the one to be watched was found; nothing is done from then on.
    bool metStranger() const { return m_metStranger; }
    // Why there is no link, or no vehicle; empty while both are there.
    std::string const& trouble() const { return m_trouble; }

private:
    void watchClock(WatchTime const& now);
    void connect(WatchTime const& now);
    void onConnected(WatchTime const& now);
    void onLinkBack(WatchTime const& now);
    void onLost(Error const& error, WatchTime const& now);
    void work(WatchTime const& now);
    void ask(WatchTime const& now);
    void park(WatchTime const& now);
    void lookAtVoltage(WatchTime const& now);
    void nap(WatchTime const& now);
    void take(Reading const& reading, WatchTime const& now);
    void watchSilence(WatchTime const& now);
    void lookAtCodes(WatchTime const& now);
    void followJudge(WatchTime const& now);
    void stopAsking(WatchTime const& now);
    void setIgnition(bool on, WatchTime const& now);
    void tellTrip(std::optional<Trip> const& trip);
    void tell(std::string const& kind, std::string const& text, WatchTime const& now);

    IWatchedCar& m_car;
    WatchRules const m_rules;
    Sink const m_sink;
    SleepJudge m_judge;
    TripMeter m_trips;
    CodeWatch m_codes;
    Backoff m_backoff;
    ClockJudge m_clock;
    std::string m_state = "connecting";
    std::string m_trouble;
    bool m_connected = false; // adapter and vehicle were brought up
    bool m_fresh = false;     // with the last step
    bool m_looked = false;    // at codes with the last step, which takes its time
    bool m_asking = false;
    bool m_everConnected = false;
    bool m_metStranger = false;
    bool m_napping = false;
    bool m_sleepless = false; // the adapter knows no sleep
    bool m_lost = false;      // after a link that stood
    bool m_ignition = false;
    bool m_running = false;
    bool m_lowTold = false;
    bool m_unsureTold = false;
    SteadyTime m_nextAttempt;
    std::optional<std::chrono::milliseconds> m_pause; // from the next step on, until the next attempt
    SteadyTime m_nextClockLook;
    SteadyTime m_lastReading;
    std::optional<SteadyTime> m_nextCodes;
    std::uint64_t m_losses = 0;
    std::uint64_t m_probes = 0;
};

} // namespace velmora
