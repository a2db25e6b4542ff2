#include "simulator/car/drive.h"

#include <algorithm>
#include <iterator>

namespace obdsim {

namespace {

struct HeldRow
{
    char const* name;
    double DriveState::*member;
};

constexpr HeldRow heldRows[] = {
    {"speed", &DriveState::speedKmh},
    {"rpm", &DriveState::rpm},
    {"load", &DriveState::loadPercent},
    {"throttle", &DriveState::throttlePercent},
    {"pedal", &DriveState::pedalPercent},
    {"manifold", &DriveState::manifoldKpa},
    {"air", &DriveState::airGramsPerSecond},
    {"coolant", &DriveState::coolantCelsius},
    {"intake", &DriveState::intakeCelsius},
    {"oil", &DriveState::oilCelsius},
    {"ambient", &DriveState::ambientCelsius},
    {"catalyst", &DriveState::catalystCelsius},
    {"short-trim", &DriveState::shortTrimPercent},
    {"long-trim", &DriveState::longTrimPercent},
    {"lambda", &DriveState::lambda},
    {"fuel-rate", &DriveState::fuelLitresPerHour},
    {"fuel-level", &DriveState::fuelLevelPercent},
    {"odometer", &DriveState::odometerKm},
    {"gearbox", &DriveState::gearboxCelsius},
    {"battery", &DriveState::batteryPercent},
    {"battery-volts", &DriveState::batteryVolts},
    {"battery-amps", &DriveState::batteryAmps},
    {"battery-temperature", &DriveState::batteryCelsius},
};

/// A standing engine: nothing turns, nothing flows, the battery is alone.
void stand(DriveState& state)
{
    constexpr double restingVolts = 12.4;
    for (double DriveState::*each :
         {&DriveState::speedKmh, &DriveState::rpm, &DriveState::loadPercent, &DriveState::airGramsPerSecond,
          &DriveState::timingDegrees, &DriveState::shortTrimPercent, &DriveState::fuelLitresPerHour,
          &DriveState::egrPercent, &DriveState::purgePercent, &DriveState::torquePercent, &DriveState::seconds}) {
        state.*each = 0;
    }
    state.manifoldKpa = state.barometricKpa;
    state.volts = restingVolts;
    state.closedLoop = false;
}

} // namespace

Drive::Drive(EngineData const& engine) : m_planned(engine), m_engine(engine) {}

DriveState Drive::at(Time time) const
{
    DriveState state = DriveModel(m_engine).at(m_stoppedAt.value_or(time) - m_start);
    state.totalSeconds = m_secondsBefore + state.seconds;
    state.kilometres += m_kilometresBefore;
    addColumns(state);
    if (m_stoppedAt) {
        stand(state);
    }
    for (auto const& row : heldRows) {
        auto const held = m_held.find(row.name);
        state.*row.member = held == m_held.end() ? state.*row.member : held->second;
    }
    return state;
}

/// What a recorded drive has beside its speed goes before what the model makes of it.
void Drive::addColumns(DriveState& state) const
{
    if (!m_engine.course) {
        return;
    }
    auto const& columns = m_engine.course->columns();
    for (std::size_t i = 1; i < columns.size(); ++i) {
        auto const row = std::find_if(std::begin(heldRows), std::end(heldRows),
                                      [&](HeldRow const& each) { return each.name == columns[i].name; });
        state.*row->member = m_engine.course->value(columns[i], state.seconds);
    }
}

DriveState Drive::planned(Time time) const
{
    DriveState state = DriveModel(m_planned).at(time);
    state.totalSeconds = state.seconds;
    return state;
}

void Drive::stopEngine(Time now)
{
    m_stoppedAt = m_stoppedAt.value_or(now);
}

void Drive::startEngine(Time now)
{
    if (!m_stoppedAt) {
        return;
    }
    DriveState const reached = DriveModel(m_engine).at(*m_stoppedAt - m_start);
    m_engine.startCoolantCelsius = reached.coolantCelsius;
    m_engine.startOdometerKm = reached.odometerKm;
    m_engine.startFuelPercent = reached.fuelLevelPercent;
    m_secondsBefore += reached.seconds;
    m_kilometresBefore += reached.kilometres;
    m_start = now;
    m_stoppedAt.reset();
}

bool Drive::hold(std::string const& name, std::optional<double> value)
{
    bool const known =
        std::any_of(std::begin(heldRows), std::end(heldRows), [&](HeldRow const& row) { return row.name == name; });
    if (known && value) {
        m_held[name] = *value;
    } else if (known) {
        m_held.erase(name);
    }
    return known;
}

std::optional<double> Drive::value(DriveState const& state, std::string const& name)
{
    for (auto const& row : heldRows) {
        if (row.name == name) {
            return state.*row.member;
        }
    }
    return std::nullopt;
}

std::vector<std::string> Drive::names()
{
    std::vector<std::string> all;
    for (auto const& row : heldRows) {
        all.emplace_back(row.name);
    }
    return all;
}

} // namespace obdsim
