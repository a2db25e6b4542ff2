#include "simulator/car/livepids.h"

#include <algorithm>
#include <cmath>
#include <iterator>

namespace obdsim {

namespace {

struct Moment
{
    DriveState const& drive;
    SinceCleared const& cleared;
};

/// One field of a PID: its width in bytes and its raw number before rounding.
struct Field
{
    int bytes;
    double raw;
};

using Fields = std::vector<Field>;

struct LiveRow
{
    std::uint8_t pid;
    Fields (*fields)(Moment const&);
};

Field percent(double value)
{
    return {1, value * 255 / 100};
}

Field trim(double value)
{
    return {1, value * 1.28 + 128};
}

Field celsius(double value)
{
    return {1, value + 40};
}

Field tenthsCelsius(double value)
{
    return {2, (value + 40) * 10};
}

Field lambda(double value)
{
    return {2, value * 32768};
}

double minutes(double seconds)
{
    return seconds / 60;
}

// A heater-less narrow band sensor: 5 mV steps, and FF where it takes no part in the trim.
constexpr Field notUsedForTrim = {1, 255};

// clang-format off
LiveRow const liveRows[] = { // in PID order; the formulas are those of SAE J1979 turned round
    {0x03, [](Moment const& m) -> Fields { return {{1, m.drive.closedLoop ? 2.0 : 1.0}, {1, 0}}; }},
    {0x04, [](Moment const& m) -> Fields { return {percent(m.drive.loadPercent)}; }},
    {0x05, [](Moment const& m) -> Fields { return {celsius(m.drive.coolantCelsius)}; }},
    {0x06, [](Moment const& m) -> Fields { return {trim(m.drive.shortTrimPercent)}; }},
    {0x07, [](Moment const& m) -> Fields { return {trim(m.drive.longTrimPercent)}; }},
    {0x08, [](Moment const& m) -> Fields { return {trim(-m.drive.shortTrimPercent)}; }},
    {0x09, [](Moment const& m) -> Fields { return {trim(m.drive.longTrimPercent - 1.6)}; }},
    {0x0A, [](Moment const& m) -> Fields { return {{1, m.drive.railKpa / 3}}; }},
    {0x0B, [](Moment const& m) -> Fields { return {{1, m.drive.manifoldKpa}}; }},
    {0x0C, [](Moment const& m) -> Fields { return {{2, m.drive.rpm * 4}}; }},
    {0x0D, [](Moment const& m) -> Fields { return {{1, m.drive.speedKmh}}; }},
    {0x0E, [](Moment const& m) -> Fields { return {{1, (m.drive.timingDegrees + 64) * 2}}; }},
    {0x0F, [](Moment const& m) -> Fields { return {celsius(m.drive.intakeCelsius)}; }},
    {0x10, [](Moment const& m) -> Fields { return {{2, m.drive.airGramsPerSecond * 100}}; }},
    {0x11, [](Moment const& m) -> Fields { return {percent(m.drive.throttlePercent)}; }},
    {0x14, [](Moment const& m) -> Fields { return {{1, m.drive.frontSensorVolts * 200}, trim(m.drive.shortTrimPercent)}; }},
    {0x15, [](Moment const& m) -> Fields { return {{1, m.drive.rearSensorVolts * 200}, notUsedForTrim}; }},
    {0x18, [](Moment const& m) -> Fields { return {{1, (0.9 - m.drive.frontSensorVolts) * 200}, trim(-m.drive.shortTrimPercent)}; }},
    {0x19, [](Moment const& m) -> Fields { return {{1, m.drive.rearSensorVolts * 200}, notUsedForTrim}; }},
    {0x1F, [](Moment const& m) -> Fields { return {{2, m.drive.seconds}}; }},
    {0x21, [](Moment const& m) -> Fields { return {{2, m.cleared.lampKilometres}}; }},
    {0x22, [](Moment const& m) -> Fields { return {{2, m.drive.railKpa / 0.079}}; }},
    {0x23, [](Moment const& m) -> Fields { return {{2, m.drive.railKpa / 10}}; }},
    {0x24, [](Moment const& m) -> Fields { return {lambda(m.drive.lambda), {2, 2.2 * 8192}}; }},
    {0x2C, [](Moment const& m) -> Fields { return {percent(m.drive.egrPercent)}; }},
    {0x2D, [](Moment const& m) -> Fields { return {trim(std::sin(m.drive.seconds) * 2)}; }},
    {0x2E, [](Moment const& m) -> Fields { return {percent(m.drive.purgePercent)}; }},
    {0x2F, [](Moment const& m) -> Fields { return {percent(m.drive.fuelLevelPercent)}; }},
    {0x30, [](Moment const& m) -> Fields { return {{1, m.cleared.warmUps}}; }},
    {0x31, [](Moment const& m) -> Fields { return {{2, m.cleared.kilometres}}; }},
    {0x33, [](Moment const& m) -> Fields { return {{1, m.drive.barometricKpa}}; }},
    {0x34, [](Moment const& m) -> Fields { return {lambda(m.drive.lambda), {2, 32768 + (m.drive.lambda - 1) * 2560}}; }},
    {0x3C, [](Moment const& m) -> Fields { return {tenthsCelsius(m.drive.catalystCelsius)}; }},
    {0x3D, [](Moment const& m) -> Fields { return {tenthsCelsius(m.drive.catalystCelsius - 14)}; }},
    {0x3E, [](Moment const& m) -> Fields { return {tenthsCelsius(m.drive.catalystCelsius - 65)}; }},
    {0x3F, [](Moment const& m) -> Fields { return {tenthsCelsius(m.drive.catalystCelsius - 80)}; }},
    {0x42, [](Moment const& m) -> Fields { return {{2, m.drive.volts * 1000}}; }},
    {0x43, [](Moment const& m) -> Fields { return {{2, m.drive.loadPercent * 255 / 100}}; }},
    {0x44, [](Moment const& m) -> Fields { return {lambda(m.drive.lambda)}; }},
    {0x45, [](Moment const& m) -> Fields { return {percent(m.drive.throttlePercent - 11)}; }},
    {0x46, [](Moment const& m) -> Fields { return {celsius(m.drive.ambientCelsius)}; }},
    {0x47, [](Moment const& m) -> Fields { return {percent(m.drive.throttlePercent + 0.8)}; }},
    {0x49, [](Moment const& m) -> Fields { return {percent(14.5 + m.drive.pedalPercent * 0.8)}; }},
    {0x4A, [](Moment const& m) -> Fields { return {percent(7.2 + m.drive.pedalPercent * 0.4)}; }},
    {0x4C, [](Moment const& m) -> Fields { return {percent(m.drive.throttlePercent - 10)}; }},
    {0x4D, [](Moment const& m) -> Fields { return {{2, minutes(m.cleared.lampSeconds)}}; }},
    {0x4E, [](Moment const& m) -> Fields { return {{2, minutes(m.cleared.seconds)}}; }},
    {0x59, [](Moment const& m) -> Fields { return {{2, m.drive.railKpa / 10}}; }},
    {0x5A, [](Moment const& m) -> Fields { return {percent(m.drive.pedalPercent)}; }},
    {0x5C, [](Moment const& m) -> Fields { return {celsius(m.drive.oilCelsius)}; }},
    {0x5D, [](Moment const& m) -> Fields { return {{2, (m.drive.timingDegrees * 0.4 + 210) * 128}}; }},
    {0x5E, [](Moment const& m) -> Fields { return {{2, m.drive.fuelLitresPerHour * 20}}; }},
    {0x61, [](Moment const& m) -> Fields { return {{1, m.drive.torquePercent + 127}}; }},
    {0x62, [](Moment const& m) -> Fields { return {{1, m.drive.torquePercent + 125}}; }},
    {0x66, [](Moment const& m) -> Fields { return {{1, 1}, {2, m.drive.airGramsPerSecond * 32}, {2, 0}}; }},
    {0x67, [](Moment const& m) -> Fields { return {{1, 3}, celsius(m.drive.coolantCelsius), celsius(m.drive.coolantCelsius - 9)}; }},
    {0x70, [](Moment const& m) -> Fields { return {{1, 7}, {2, m.drive.manifoldKpa * 32}, {2, (m.drive.manifoldKpa - 1) * 32}, {2, 0}, {2, 0}, {1, 2}}; }},
    {0x78, [](Moment const& m) -> Fields { return {{1, 3}, tenthsCelsius(m.drive.catalystCelsius + 40), tenthsCelsius(m.drive.catalystCelsius), {2, 0}, {2, 0}}; }},
    {0x7A, [](Moment const& m) -> Fields { return {{1, 1}, {2, m.drive.airGramsPerSecond * 4}, {2, 0}, {2, 0}}; }},
    {0x9D, [](Moment const& m) -> Fields { double const rate = m.drive.fuelLitresPerHour * 0.745 / 3.6 * 50; return {{2, rate}, {2, rate}}; }},
    {0xA6, [](Moment const& m) -> Fields { return {{4, m.drive.odometerKm * 10}}; }},
};
// clang-format on

LiveRow const* findLiveRow(std::uint8_t pid)
{
    auto const row =
        std::find_if(std::begin(liveRows), std::end(liveRows), [pid](LiveRow const& r) { return r.pid == pid; });
    return row == std::end(liveRows) ? nullptr : &*row;
}

void append(Bytes& data, Field const& field)
{
    double const highest = std::pow(256.0, field.bytes) - 1;
    auto const raw = static_cast<std::uint32_t>(std::clamp(std::round(field.raw), 0.0, highest));
    for (int shift = 8 * (field.bytes - 1); shift >= 0; shift -= 8) {
        data.push_back(static_cast<std::uint8_t>(raw >> shift & 0xFF));
    }
}

} // namespace

bool isLivePid(std::uint8_t pid)
{
    return findLiveRow(pid) != nullptr;
}

std::optional<Bytes> livePid(std::uint8_t pid, DriveState const& drive, SinceCleared const& cleared)
{
    LiveRow const* row = findLiveRow(pid);
    if (row == nullptr) {
        return std::nullopt;
    }
    Bytes data;
    for (Field const& field : row->fields({drive, cleared})) {
        append(data, field);
    }
    return data;
}

} // namespace obdsim
