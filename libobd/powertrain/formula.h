#pragma once

#include <obd/iecu.h>

#include <cstdint>
#include <optional>

// From the number in a reply to the metric value (SAE J1979, ISO 15031-5). Users see the last digit: the constants and
// the order of the operations stand as they are.
namespace obd::formula {

using Raw = std::uint32_t;
using Decoded = std::optional<double>;

constexpr Decoded plain(Raw raw, IEcu const& /*ecu*/)
{
    return raw;
}

constexpr Decoded timesTen(Raw raw, IEcu const& /*ecu*/)
{
    return raw * 10.0;
}

constexpr Decoded percent(Raw raw, IEcu const& /*ecu*/)
{
    return raw * 100.0 / 255.0;
}

// Fuel trims and the EGR error: 0x80 is none.
constexpr Decoded trim(Raw raw, IEcu const& /*ecu*/)
{
    return (raw - 128.0) * 100.0 * 0.0078125;
}

constexpr Decoded celsius(Raw raw, IEcu const& /*ecu*/)
{
    return raw - 40.0;
}

constexpr Decoded wideCelsius(Raw raw, IEcu const& /*ecu*/)
{
    return raw * 4.0 - 40.0;
}

constexpr Decoded tenthCelsius(Raw raw, IEcu const& /*ecu*/)
{
    return raw * 0.1 - 40.0;
}

// Whole degrees at a turbine: the tenths are cut off before the offset is taken away.
constexpr Decoded turbineCelsius(Raw raw, IEcu const& /*ecu*/)
{
    return -40.0 - static_cast<int>(raw * -0.1);
}

// Tenths of a degree, cut toward zero.
constexpr Decoded wholeCelsius(Raw raw, IEcu const& /*ecu*/)
{
    return static_cast<int>(raw / 10.0 - 40.0);
}

constexpr Decoded timesThree(Raw raw, IEcu const& /*ecu*/)
{
    return raw * 3.0;
}

constexpr Decoded timesEight(Raw raw, IEcu const& /*ecu*/)
{
    return raw * 8.0;
}

// The reply counts quarters of a revolution; they are dropped.
constexpr Decoded wholeRpm(Raw raw, IEcu const& /*ecu*/)
{
    return raw >> 2U;
}

// Degrees before top dead centre.
constexpr Decoded sparkAdvance(Raw raw, IEcu const& /*ecu*/)
{
    return raw * 0.5 - 64.0;
}

constexpr Decoded injectionTiming(Raw raw, IEcu const& /*ecu*/)
{
    return (raw - 26880.0) * 0.0078125;
}

constexpr Decoded torquePercent(Raw raw, IEcu const& /*ecu*/)
{
    return raw - 125.0;
}

// Above the declared range by a trifle at its end: the multiplier is a rounded one.
constexpr Decoded relativeRailPressure(Raw raw, IEcu const& /*ecu*/)
{
    return raw * 5178.0 / 65535.0;
}

constexpr Decoded signedWord(Raw raw, IEcu const& /*ecu*/)
{
    return static_cast<std::int16_t>(raw);
}

constexpr Decoded signedQuarters(Raw raw, IEcu const& /*ecu*/)
{
    return static_cast<std::int16_t>(raw) * 0.25;
}

constexpr Decoded twoHundredths(Raw raw, IEcu const& /*ecu*/)
{
    return raw / 200.0;
}

constexpr Decoded twentieths(Raw raw, IEcu const& /*ecu*/)
{
    return raw / 20.0;
}

constexpr Decoded hundredths(Raw raw, IEcu const& /*ecu*/)
{
    return raw * 0.01;
}

// Steps of 1/32.
constexpr Decoded thirtySeconds(Raw raw, IEcu const& /*ecu*/)
{
    return raw * 0.03125;
}

constexpr Decoded fiveThousandths(Raw raw, IEcu const& /*ecu*/)
{
    return raw * 0.005;
}

// The trim that follows the voltage of an oxygen sensor; 0xFF says that the sensor has no part in it.
constexpr Decoded sensorTrim(Raw raw, IEcu const& ecu)
{
    return raw == 0xFF ? std::nullopt : trim(raw, ecu);
}

constexpr Decoded thousandths(Raw raw, IEcu const& /*ecu*/)
{
    return raw * 0.001;
}

// The scale of these ends at a maximum that the module may tell in PIDs 0x4F and 0x50.
inline Decoded manifoldPressure(Raw raw, IEcu const& ecu)
{
    return raw * (ecu.intakeManifoldAbsolutePressureMax() / 255.0);
}

inline Decoded airFlow(Raw raw, IEcu const& ecu)
{
    return raw * ecu.airFlowRateMax() / 65535.0;
}

inline Decoded equivalenceRatio(Raw raw, IEcu const& ecu)
{
    return raw * static_cast<double>(ecu.equivalenceRatioMax()) / 65535.0;
}

inline Decoded oxygenSensorVoltage(Raw raw, IEcu const& ecu)
{
    return raw * static_cast<double>(ecu.oxygenSensorVoltageMax()) / 65535.0;
}

// Steps of 1/32768 of the maximum; a current of none is 0.
inline Decoded oxygenSensorCurrent(Raw raw, IEcu const& ecu)
{
    return raw * 0.000030517578125 * ecu.oxygenSensorCurrentMax();
}

} // namespace obd::formula
