#include "simulator/car/drivemodel.h"

#include <algorithm>
#include <cmath>
#include <iterator>
#include <limits>

namespace obdsim {

namespace {

constexpr double pi = 3.14159265358979323846;

// The cycle in seconds.
constexpr double accelerateAt = 15;
constexpr double cruiseAt = 40;
constexpr double brakeAt = 80;
constexpr double standAt = 100;
constexpr double cycle = 120;

struct Gear
{
    double upToKmh;
    double rpmPerKmh;
};

constexpr Gear gears[] = {{18, 118}, {36, 68}, {56, 46}, {76, 35}, {std::numeric_limits<double>::infinity(), 28.5}};

double smoothStep(double from, double to, double x)
{
    double const part = std::clamp((x - from) / (to - from), 0.0, 1.0);
    return part * part * (3 - 2 * part);
}

/// Part of the cruising speed that is driven at `t` seconds of the cycle.
double speedPart(double t)
{
    double const ripple = t > cruiseAt && t < brakeAt ? 0.03 * std::sin((t - cruiseAt) * pi / 10) : 0;
    return smoothStep(accelerateAt, cruiseAt, t) - smoothStep(brakeAt, standAt, t) + ripple;
}

/// Seconds at cruising speed that give the way driven up to `t` of the cycle.
double wayPart(double t)
{
    constexpr double step = 0.5;
    double sum = 0;
    // NOLINTNEXTLINE(clang-analyzer-security.FloatLoopCounter): halves add up exactly
    for (double at = 0; at < t; at += step) {
        sum += speedPart(at) * step;
    }
    return sum;
}

double gearRatio(double speedKmh)
{
    auto const gear =
        std::find_if(std::begin(gears), std::end(gears), [speedKmh](Gear const& g) { return speedKmh <= g.upToKmh; });
    return gear->rpmPerKmh;
}

/// Rises from `start` towards `end`, 63 % of the way after `constant` seconds.
double warmUp(double start, double end, double seconds, double constant)
{
    return end - (end - start) * std::exp(-seconds / constant);
}

double coolantCelsius(EngineData const& engine, double seconds)
{
    return warmUp(engine.startCoolantCelsius, 91, seconds, 180);
}

/// A cold engine idles faster.
double coldIdleRpm(double coolantCelsius)
{
    constexpr double warm = 45;
    return std::max(0.0, warm - coolantCelsius) * 9;
}

} // namespace

DriveModel::DriveModel(EngineData const& engine) : m_engine(engine) {}

DriveState DriveModel::at(Time time) const
{
    DriveState state;
    state.seconds = std::chrono::duration<double>(time).count();
    state.ambientCelsius = m_engine.ambientCelsius;
    state.barometricKpa = 100;
    addMotion(state);
    addAir(state);
    addTemperatures(state);
    addMixture(state);
    addBattery(state);
    return state;
}

void DriveModel::addBattery(DriveState& state) const
{
    bool const braking = speedKmh(state.seconds + 0.5) - speedKmh(state.seconds) < -0.5;
    state.gearboxCelsius = warmUp(m_engine.ambientCelsius + 4, 82, state.seconds, 260);
    state.batteryPercent = std::max(5.0, 78 - state.kilometres * 0.22);
    state.batteryAmps = braking ? -state.speedKmh * 0.9 : 4 + state.loadPercent * state.speedKmh * 0.02;
    state.batteryVolts = 330 + state.batteryPercent * 0.6 - state.batteryAmps * 0.08;
    state.batteryCelsius = warmUp(m_engine.ambientCelsius, m_engine.ambientCelsius + 9, state.seconds, 900);
}

double DriveModel::speedKmh(double seconds) const
{
    return m_engine.course ? m_engine.course->kmh(seconds)
                           : m_engine.topSpeedKmh * speedPart(std::fmod(seconds, cycle));
}

double DriveModel::kilometres(double seconds) const
{
    if (m_engine.course) {
        return m_engine.course->kilometres(seconds);
    }
    double const cycles = std::floor(seconds / cycle);
    return m_engine.topSpeedKmh / 3600.0 * (cycles * wayPart(cycle) + wayPart(std::fmod(seconds, cycle)));
}

void DriveModel::addMotion(DriveState& state) const
{
    state.speedKmh = std::max(0.0, speedKmh(state.seconds));
    state.kilometres = kilometres(state.seconds);
    state.odometerKm = m_engine.startOdometerKm + state.kilometres;

    double const wobble = 8 * std::sin(state.seconds * 2.1);
    double const driven = state.speedKmh * gearRatio(state.speedKmh) * (m_engine.compression ? 0.75 : 1.0);
    state.rpm = std::max(m_engine.idleRpm + coldIdleRpm(coolantCelsius(m_engine, state.seconds)), driven) + wobble;

    double const accelerationKmhPerS = speedKmh(state.seconds + 0.5) - speedKmh(state.seconds);
    double const cruiseLoad = 24 + state.speedKmh * 0.16;
    state.loadPercent = std::clamp(cruiseLoad + accelerationKmhPerS * 12, 3.0, 92.0);
    state.pedalPercent = state.loadPercent > 25 ? std::min(100.0, (state.loadPercent - 22) * 0.9) : 0;
    state.throttlePercent = m_engine.compression ? 88 : 11 + state.pedalPercent * 0.72;
    state.torquePercent = state.loadPercent * 0.9 - 2;
    state.volts = 14.1 - state.loadPercent * 0.002 + 0.03 * std::sin(state.seconds * 0.7);
}

void DriveModel::addAir(DriveState& state) const
{
    double const vacuumKpa = 24 + state.loadPercent * 0.78;
    double const boostKpa = 98 + state.loadPercent * (m_engine.compression ? 1.15 : 0.9);
    bool const blown = m_engine.boosted && (m_engine.compression || state.loadPercent > 70);
    state.manifoldKpa = blown ? boostKpa : vacuumKpa;
    // Four-stroke: half the displacement is filled at each turn.
    constexpr double airGramsPerLitre = 1.19;
    constexpr double filling = 0.82;
    double const litresPerSecond = m_engine.litres * state.rpm / 120.0;
    state.airGramsPerSecond = litresPerSecond * airGramsPerLitre * filling * state.manifoldKpa / 101.0;
    state.railKpa = m_engine.compression ? 28000 + state.loadPercent * 1250 : 380 + state.loadPercent * 0.4;
    state.egrPercent = std::clamp(45 - state.loadPercent * 0.6, 0.0, 40.0);
    state.purgePercent = state.speedKmh > 20 ? 12 + 6 * std::sin(state.seconds * 0.2) : 0;
}

void DriveModel::addTemperatures(DriveState& state) const
{
    double const s = state.seconds;
    state.coolantCelsius = coolantCelsius(m_engine, s) + 0.4 * std::sin(s / 20);
    state.oilCelsius = warmUp(m_engine.startCoolantCelsius - 6, 96, s, 320);
    state.intakeCelsius = m_engine.ambientCelsius + 14 - state.speedKmh * 0.06;
    state.catalystCelsius = warmUp(210, 470, s, 70) + state.loadPercent * 1.6;
}

void DriveModel::addMixture(DriveState& state) const
{
    double const s = state.seconds;
    state.closedLoop = state.coolantCelsius > 50;
    state.shortTrimPercent = 1.6 * std::sin(s * 1.3);
    state.longTrimPercent = 2.3;
    state.frontSensorVolts = 0.45 + 0.35 * std::sin(s * 2 * pi * 0.8);
    state.rearSensorVolts = 0.68 + 0.04 * std::sin(s * 0.5);
    state.timingDegrees = 8 + state.rpm / 250.0 - state.loadPercent * 0.05;
    state.lambda = m_engine.compression ? 4.2 - state.loadPercent * 0.031 : 1.0 + 0.012 * std::sin(s * 5);

    // Stoichiometric mixtures: 14.7 (petrol, 745 g/l) and 14.5 (diesel, 835 g/l).
    double const mixture = (m_engine.compression ? 14.5 : 14.7) * state.lambda;
    double const density = m_engine.compression ? 835.0 : 745.0;
    state.fuelLitresPerHour = state.airGramsPerSecond * 3600 / mixture / density;
    state.fuelLevelPercent = std::max(4.0, m_engine.startFuelPercent - state.kilometres * 0.12);
}

} // namespace obdsim
