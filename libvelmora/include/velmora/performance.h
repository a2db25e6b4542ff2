#pragma once

#include <velmora/export.h>
#include <velmora/reading.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace obd {
class IEcu;
class IVelmoraSettings;
} // namespace obd

/// Timed runs: how long a vehicle takes from 0 to 100 km/h, and its power by engine speed.

namespace velmora {

/// One point of a run's speed over time; between two of them the speed is taken to rise or fall evenly.
struct SpeedPoint
{
    double seconds = 0.0; ///< from any moment on
    double kmh = 0.0;     ///< speed then
};

/// What a run is timed for: to a speed, from one, or over a distance from standing.
struct SprintGoal
{
    std::string name;             ///< "0 to 100 km/h"
    double fromKmh = 0.0;         ///< 0 is standing
    std::optional<double> toKmh;  ///< empty for a distance
    std::optional<double> metres; ///< empty for a speed
};

/// How long it took, and how sure that is.
struct SprintTime
{
    double seconds = 0.0;      ///< from the goal's begin to its end
    double errorSeconds = 0.0; ///< what whole km/h and the pause between readings make uncertain
    double endKmh = 0.0;       ///< speed at the end
};

/// Power and torque at an engine speed.
struct PowerPoint
{
    double rpm = 0.0;         ///< middle of its step of 250
    double kilowatt = 0.0;    ///< the highest that was seen
    double newtonMetre = 0.0; ///< at the same moment
};

/// Where a timed run stands.
enum class RunState
{
    Moving,   ///< was not seen standing yet, so nothing can be timed from 0
    Standing, ///< ready
    Running,  ///< on its way
    Stopped,  ///< stands again after a run, whose times stay until the next start
};

/// What came of a run so far.
struct PerformanceRun
{
    RunState state = RunState::Moving; ///< where it stands
    double kmh = 0.0;                  ///< the last speed
    std::vector<SpeedPoint> speeds;    ///< the start reckoned back from the first readings that rise; empty before it
    double interval = 0.0;             ///< mean seconds between two readings; 0 before there are two
    std::vector<PowerPoint> powers;    ///< by rising engine speed
    int kilograms = 0;                 ///< the vehicle's weight that power was reckoned with; 0 without power
};

/// The usual ones: 0 to 100 km/h, or 0 to 60 mph for imperial units; 80 to 120 km/h; a quarter mile.
VELMORA_EXPORT std::vector<SprintGoal> sprintGoals(bool imperial);
/// The time of a goal by the points of a run, whose first one is the start; nothing while it is not reached. A speed
/// between two readings is met on the line between them. interval: seconds between two readings.
VELMORA_EXPORT std::optional<SprintTime> timeOf(SprintGoal const& goal, std::vector<SpeedPoint> const& run,
                                                double interval);
/// "standing, ready"
VELMORA_EXPORT std::string stateText(RunState state);
/// All of a run: goals with times and errors, the speed over time, power and torque over the engine speed.
VELMORA_EXPORT std::string toJson(PerformanceRun const& run, std::vector<SprintGoal> const& goals);

/// Times a vehicle by its readings, from standing still. A new start forgets the run before. Wants the speed (0D) as
/// often as it comes, and for power the engine speed (0C). One thread.
class VELMORA_EXPORT PerformanceTimer
{
public:
    /// Times without power, of whatever module the readings are.
    PerformanceTimer();
    /// With power and torque of that module; readings of others don't count. settings must outlive it: the vehicle's
    /// weight is taken from there.
    PerformanceTimer(std::shared_ptr<obd::IEcu> module, obd::IVelmoraSettings const& settings);
    ~PerformanceTimer();
    PerformanceTimer(PerformanceTimer const&) = delete;
    PerformanceTimer& operator=(PerformanceTimer const&) = delete;

    /// In the order of their times; others than those of speed and engine speed do nothing.
    void take(Reading const& reading);
    /// What came of it so far.
    PerformanceRun run() const;

private:
    struct Parts;
    std::unique_ptr<Parts> m_parts;
};

} // namespace velmora
