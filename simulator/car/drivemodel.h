#pragma once

#include "simulator/car/course.h"
#include "simulator/peer.h"

#include <memory>

namespace obdsim {

/// What the drive model must know of an engine.
struct EngineData
{
    bool compression = false; ///< diesel
    bool boosted = false;
    double litres = 1.6;
    double idleRpm = 780;
    double ambientCelsius = 18;
    double startCoolantCelsius = 62;
    double startOdometerKm = 48210;
    double startFuelPercent = 63;
    double topSpeedKmh = 92;                   ///< of the cruise in each cycle
    std::shared_ptr<Course const> course = {}; ///< in place of the cycle
};

/// A moment of the drive, in the units of the standard's PIDs.
struct DriveState
{
    double seconds = 0;      ///< since the engine was started
    double totalSeconds = 0; ///< of running engine since the simulation began
    double speedKmh = 0;
    double rpm = 0;
    double loadPercent = 0;
    double throttlePercent = 0;
    double pedalPercent = 0;
    double manifoldKpa = 0;
    double airGramsPerSecond = 0;
    double coolantCelsius = 0;
    double intakeCelsius = 0;
    double oilCelsius = 0;
    double ambientCelsius = 0;
    double catalystCelsius = 0;
    double timingDegrees = 0;
    double shortTrimPercent = 0;
    double longTrimPercent = 0;
    double frontSensorVolts = 0;
    double rearSensorVolts = 0;
    double lambda = 1;
    double fuelLitresPerHour = 0;
    double fuelLevelPercent = 0;
    double railKpa = 0;
    double egrPercent = 0;
    double purgePercent = 0;
    double torquePercent = 0;
    double volts = 0;
    double barometricKpa = 0;
    double kilometres = 0; ///< driven since the start
    double odometerKm = 0;
    double gearboxCelsius = 0;
    double batteryPercent = 0; ///< of the driving battery of an electric car; likewise the next three
    double batteryVolts = 0;
    double batteryAmps = 0; ///< negative: it is charged
    double batteryCelsius = 0;
    bool closedLoop = true;
};

/// A drive that repeats every two minutes: idle, accelerate through the gears,
/// cruise, brake to a stop; or the engine's course. A pure function of time, so that runs are repeatable.
class DriveModel
{
public:
    explicit DriveModel(EngineData const& engine);

    DriveState at(Time time) const;

private:
    double speedKmh(double seconds) const;
    double kilometres(double seconds) const;
    void addMotion(DriveState& state) const;
    void addAir(DriveState& state) const;
    void addTemperatures(DriveState& state) const;
    void addMixture(DriveState& state) const;
    void addBattery(DriveState& state) const;

    EngineData m_engine;
};

} // namespace obdsim
