#pragma once

#include <obd/sensordatamodels.h>
#include <velmora/export.h>
#include <velmora/performance.h>
#include <velmora/reading.h>
#include <velmora/units.h>

#include <chrono>
#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <vector>

/// Live values as a view shows them: chosen and chosen anew while they come, with statistics and rates.

namespace velmora {

class CarCore;
class LiveState;

/// What is to be read live, and how.
struct LiveWish
{
    /// Words as for Car::watch, which may have rates. None: speed, engine speed, coolant, load and throttle.
    std::vector<std::string> sensors = {};
    std::string rate = {}; ///< "10hz", of the sensors that have no rate of their own; as often as it goes if empty
    bool fast = false;     ///< as fast as the bus allows: too much traffic has upset modules
    std::size_t pidsPerRequest = 6; ///< at most; with fast only
    bool allModules = false;        ///< words that name no module mean all that the car asks; else the first one
};

/// A sensor that is read live: one of a parameter's, or a signal of one's own.
struct LiveSensor
{
    unsigned int module = 0;     ///< id of the control module; 0 if any may answer
    int id = 0;                  ///< the PID of its parameter, or the signal's number
    int uid = 0;                 ///< by which values name it
    bool isSignal = false;       ///< whether it is one of the user's own
    std::string key;             ///< for settings and recordings: "RPM", "LAMBDA_2", or a signal's own
    std::string request;         ///< of a signal, hexadecimal; empty for one that is worked out of others
    std::string name;            ///< for people
    std::string unit;            ///< label of what is shown; empty for none
    std::string metricUnit;      ///< label of its metric unit
    bool numeric = true;         ///< whether its values are numbers
    std::optional<double> hertz; ///< how often it is to come; empty for as often as it goes
};

/// All sensors that come in one turn.
using LiveParameter = std::vector<LiveSensor>;

/// A parameter that can be picked.
struct LiveOffer
{
    int id = 0;        ///< as LiveSensor::id
    std::string title; ///< for people
};

/// What came in one turn: all sensors of one parameter.
struct LiveTurn
{
    unsigned int module = 0;       ///< id of the control module
    int id = 0;                    ///< as LiveSensor::id
    std::vector<Reading> readings; ///< one for each sensor that was told
    /// The same as texts, with lowest, mean and highest value since the reading began; see LiveSensor::uid.
    std::vector<std::shared_ptr<obd::SensorValueDataModel>> values;
};

/// Throws Error unless it is a rate such as "10hz", "0.2 Hz" or "10".
VELMORA_EXPORT void checkRate(std::string const& rate);

/// Reads live, as Car::live has begun it, until it is destroyed, which should be before its car is. For one thread, not
/// that of the car's callbacks. The functions throw Error if the link was closed meanwhile.
class VELMORA_EXPORT LiveReader
{
public:
    ~LiveReader();
    LiveReader(LiveReader const&) = delete;
    LiveReader& operator=(LiveReader const&) = delete;

    /// Waits until something has come, no longer than that. Whether it has.
    bool wait(std::chrono::milliseconds time);
    /// What has come since the last call.
    std::vector<LiveTurn> take();
    /// What comes, by parameter.
    std::vector<LiveParameter> parameters() const;
    /// Begins anew with empty statistics.
    void restart();

    /// What pick can choose from. Throws Error where the list can't be changed.
    std::vector<LiveOffer> offers() const;
    /// The ids of what is chosen. Throws Error where the list can't be changed.
    std::vector<int> picked() const;
    /// Others of the same module, in that order; those that were there keep their rate. Begins anew.
    void pick(std::vector<int> const& ids);
    /// What would choose the same sensors, as for LiveWish::sensors; signals are not among them.
    std::vector<std::string> words() const;
    /// "module 7E8 ECM", "modules 7E8 ECM and 7E9 TCM".
    std::string modulesText() const;

    /// The units of what comes.
    Units units() const;
    /// Metric units, or those imperial ones that the settings have. Begins anew.
    void setMetric(bool metric);

    /// Speed and engine speed of the first module that tells both, in the place of all others, so that runs can be
    /// timed. Begins anew. Throws Error if no module does.
    void beginRuns();
    /// Gives the others back, and begins anew.
    void endRuns();
    /// What came of the run, by the readings that were taken since beginRuns.
    PerformanceRun run() const;

    /// The rates that were asked for with those reached: "RPM 9.9 of 10 Hz, 7E9 SPEED 5 of 5 Hz". Empty if none was.
    std::string reachedRates() const;
    /// The same of those that are missed by more than a tenth.
    std::string missedRates() const;
    /// Signals whose replies gave no value or were refused, a line each.
    std::string signalTroubles() const;
    /// Asks the adapter first where the last request brought nothing at all, which takes seconds if it is silent.
    /// Throws Error if it is, or the link broke.
    void checkAdapter() const;
    /// Whether the adapter stands ready for the vehicle.
    bool isConnected() const;

private:
    friend class Car;
    LiveReader(std::shared_ptr<CarCore> core, std::shared_ptr<LiveState> state);

    std::shared_ptr<CarCore> m_core;
    std::shared_ptr<LiveState> m_state;
};

} // namespace velmora
