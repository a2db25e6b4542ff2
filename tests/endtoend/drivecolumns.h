#pragma once

#include "simulator/car/drivemodel.h"

#include <algorithm>
#include <cmath>
#include <string>

// A column of a recording that follows the drive of the simulated car: what the model says, and how finely the PID
// tells it.
struct DriveColumn
{
    char const* title;
    double (*value)(obdsim::DriveState const&);
    double step;
};

namespace drive {

using obdsim::DriveState;

inline constexpr double percent = 100.0 / 255;
inline constexpr double trim = 100.0 / 128;

// clang-format off
inline DriveColumn const columns[] = {
    {"Calculated engine load (%)", [](DriveState const& d) { return d.loadPercent; }, percent},
    {"Engine Coolant Temperature (°C)", [](DriveState const& d) { return d.coolantCelsius; }, 1},
    {"Short Term Fuel Trim - Bank 1: Bank 1 (%)", [](DriveState const& d) { return d.shortTrimPercent; }, trim},
    {"Long Term Fuel Trim - Bank 1: Bank 1 (%)", [](DriveState const& d) { return d.longTrimPercent; }, trim},
    {"Short Term Fuel Trim - Bank 2: Bank 2 (%)", [](DriveState const& d) { return -d.shortTrimPercent; }, trim},
    {"Long Term Fuel Trim - Bank 2: Bank 2 (%)", [](DriveState const& d) { return d.longTrimPercent - 1.6; }, trim},
    {"Intake Manifold Absolute Pressure (kPa)", [](DriveState const& d) { return d.manifoldKpa; }, 1},
    {"Engine RPM (rpm)", [](DriveState const& d) { return d.rpm; }, 0.25},
    {"Vehicle Speed Sensor (km/h)", [](DriveState const& d) { return d.speedKmh; }, 1},
    {"Ignition Timing Advance for #1 Cylinder (°)", [](DriveState const& d) { return d.timingDegrees; }, 0.5},
    {"Intake Air Temperature (°C)", [](DriveState const& d) { return d.intakeCelsius; }, 1},
    {"Air Flow Rate from Mass Flow Sensor (g/s)", [](DriveState const& d) { return d.airGramsPerSecond; }, 0.01},
    {"Absolute Throttle Position (%)", [](DriveState const& d) { return d.throttlePercent; }, percent},
    {"Bank 1 - Sensor 1 (O2S): Oxygen Sensor Output Voltage (V)", [](DriveState const& d) { return d.frontSensorVolts; }, 0.005},
    {"Bank 1 - Sensor 1 (O2S): Short Term Fuel Trim (%)", [](DriveState const& d) { return d.shortTrimPercent; }, trim},
    {"Bank 1 - Sensor 2 (O2S): Oxygen Sensor Output Voltage (V)", [](DriveState const& d) { return d.rearSensorVolts; }, 0.005},
    {"Bank 2 - Sensor 1 (O2S): Oxygen Sensor Output Voltage (V)", [](DriveState const& d) { return 0.9 - d.frontSensorVolts; }, 0.005},
    {"Bank 2 - Sensor 1 (O2S): Short Term Fuel Trim (%)", [](DriveState const& d) { return -d.shortTrimPercent; }, trim},
    {"Bank 2 - Sensor 2 (O2S): Oxygen Sensor Output Voltage (V)", [](DriveState const& d) { return d.rearSensorVolts; }, 0.005},
    {"Time Since Engine Start (s)", [](DriveState const& d) { return d.seconds; }, 1},
    {"Distance traveled since DTCs cleared (km)", [](DriveState const& d) { return 640 + d.kilometres; }, 1},
    {"Distance Traveled While MIL is Activated (km)", [](DriveState const& d) { return d.kilometres; }, 1},
    {"Fuel Rail Pressure (kPa)", [](DriveState const& d) { return d.railKpa; }, 10},
    {"Absolute Fuel Rail Pressure (kPa)", [](DriveState const& d) { return d.railKpa; }, 10},
    {"Commanded EGR (%)", [](DriveState const& d) { return d.egrPercent; }, percent},
    {"EGR Error (%)", [](DriveState const& d) { return 2 * std::sin(d.seconds); }, trim},
    {"Commanded Evaporative Purge (%)", [](DriveState const& d) { return d.purgePercent; }, percent},
    {"Fuel Level Input (%)", [](DriveState const& d) { return d.fuelLevelPercent; }, percent},
    {"Catalyst Temperature Bank 1, Sensor 1 (°C)", [](DriveState const& d) { return d.catalystCelsius; }, 0.1},
    {"Control module voltage (V)", [](DriveState const& d) { return d.volts; }, 0.001},
    {"Absolute Load Value (%)", [](DriveState const& d) { return d.loadPercent; }, percent},
    {"Fuel/Air Commanded Equivalence Ratio", [](DriveState const& d) { return std::min(d.lambda, 65535.0 / 32768); }, 2.0 / 65536},
    {"Relative Throttle Position (%)", [](DriveState const& d) { return d.throttlePercent - 11; }, percent},
    {"Absolute Throttle Position B (%)", [](DriveState const& d) { return d.throttlePercent + 0.8; }, percent},
    {"Accelerator Pedal Position D (%)", [](DriveState const& d) { return 14.5 + 0.8 * d.pedalPercent; }, percent},
    {"Accelerator Pedal Position E (%)", [](DriveState const& d) { return 7.2 + 0.4 * d.pedalPercent; }, percent},
    {"Commanded Throttle Actuator Control (%)", [](DriveState const& d) { return d.throttlePercent - 10; }, percent},
    {"Engine run time while MIL activated (min)", [](DriveState const& d) { return d.seconds / 60; }, 1},
    {"Engine run time since DTCs cleared (min)", [](DriveState const& d) { return d.seconds / 60; }, 1},
    {"Relative Accelerator Pedal Position (%)", [](DriveState const& d) { return d.pedalPercent; }, percent},
    {"Engine Oil Temperature (°C)", [](DriveState const& d) { return d.oilCelsius; }, 1},
    {"Fuel Injection Timing (°)", [](DriveState const& d) { return 0.4 * d.timingDegrees; }, 1.0 / 128},
    {"Engine Fuel Rate (l/h)", [](DriveState const& d) { return d.fuelLitresPerHour; }, 0.05},
    {"Requested Engine Torque (%)", [](DriveState const& d) { return d.torquePercent + 2; }, 1},
    {"Actual Engine Torque (%)", [](DriveState const& d) { return d.torquePercent; }, 1},
    {"Air Flow Rate from Mass Flow Sensor: Sensor A (g/s)", [](DriveState const& d) { return d.airGramsPerSecond; }, 1.0 / 32},
    {"Engine Coolant Temperature: Sensor 1 (°C)", [](DriveState const& d) { return d.coolantCelsius; }, 1},
    {"Engine Coolant Temperature: Sensor 2 (°C)", [](DriveState const& d) { return d.coolantCelsius - 9; }, 1},
    {"Boost Pressure Control: Commanded Boost Pressure A (kPa)", [](DriveState const& d) { return d.manifoldKpa; }, 1.0 / 32},
    {"Boost Pressure Control: Boost Pressure A (kPa)", [](DriveState const& d) { return d.manifoldKpa - 1; }, 1.0 / 32},
    {"Exhaust Gas Temperature Bank 1: Sensor 1 (°C)", [](DriveState const& d) { return d.catalystCelsius + 40; }, 0.1},
    {"Exhaust Gas Temperature Bank 1: Sensor 2 (°C)", [](DriveState const& d) { return d.catalystCelsius; }, 0.1},
    {"Diesel Particulate Filter Bank 1: Delta Pressure (kPa)", [](DriveState const& d) { return 0.04 * d.airGramsPerSecond; }, 0.01},
    {"Battery voltage (V)", [](DriveState const& d) { return d.volts; }, 0.1},
};
// clang-format on

// Worked out of several requests and of what was before; they are looked at by themselves.
inline constexpr char const* boost = "Boost pressure (kPa)";
inline constexpr char const* consumption = "Fuel consumption (l/100 km)";
inline constexpr char const* power = "Engine power (kW)";
inline constexpr char const* torque = "Engine torque (Nm)";

// Null for a column that does not follow the drive.
inline DriveColumn const* find(std::string const& title)
{
    for (DriveColumn const& column : columns) {
        if (title == column.title) {
            return &column;
        }
    }
    return nullptr;
}

} // namespace drive
