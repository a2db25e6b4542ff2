#include "simulator/car/livepids.h"

#include <gtest/gtest.h>

#include <cmath>
#include <numeric>

namespace {

using obdsim::Bytes;
using obdsim::DriveModel;
using obdsim::DriveState;
using obdsim::EngineData;
using obdsim::Ms;
using obdsim::Time;

Time seconds(int count)
{
    return Ms(count * 1000);
}

TEST(DriveModel, goesThroughIdleAccelerationCruiseAndBraking)
{
    DriveModel const drive{EngineData{}};
    EXPECT_EQ(drive.at(seconds(5)).speedKmh, 0);
    EXPECT_NEAR(drive.at(seconds(5)).rpm, 780, 10);
    EXPECT_GT(drive.at(seconds(28)).loadPercent, drive.at(seconds(5)).loadPercent + 20);
    EXPECT_NEAR(drive.at(seconds(60)).speedKmh, 92, 4);
    EXPECT_LT(drive.at(seconds(90)).loadPercent, 10);
    EXPECT_EQ(drive.at(seconds(110)).speedKmh, 0);
}

TEST(DriveModel, repeatsItselfToTheBit)
{
    DriveModel const one{EngineData{}};
    DriveModel const other{EngineData{}};
    for (int s = 0; s < 400; s += 7) {
        EXPECT_EQ(one.at(seconds(s)).rpm, other.at(seconds(s)).rpm);
        EXPECT_EQ(one.at(seconds(s)).kilometres, other.at(seconds(s)).kilometres);
    }
}

TEST(DriveModel, speedNeverJumpsAndTheWayGrowsWithIt)
{
    DriveModel const drive{EngineData{}};
    DriveState before = drive.at(Time(0));
    for (int ms = 500; ms <= 260000; ms += 500) {
        DriveState const state = drive.at(Ms(ms));
        EXPECT_LT(std::abs(state.speedKmh - before.speedKmh), 5) << ms;
        EXPECT_GE(state.kilometres, before.kilometres) << ms;
        EXPECT_LE(state.kilometres - before.kilometres, 0.02) << ms;
        before = state;
    }
    EXPECT_NEAR(drive.at(seconds(120)).kilometres, 92.0 / 3600 * (25.0 / 2 + 40 + 20.0 / 2), 0.1);
}

TEST(DriveModel, engineWarmsUp)
{
    EngineData cold;
    cold.startCoolantCelsius = 10;
    DriveModel const drive{cold};
    EXPECT_NEAR(drive.at(Time(0)).coolantCelsius, 10, 1);
    EXPECT_FALSE(drive.at(Time(0)).closedLoop);
    EXPECT_NEAR(drive.at(seconds(3600)).coolantCelsius, 91, 1);
    EXPECT_TRUE(drive.at(seconds(3600)).closedLoop);
}

TEST(DriveModel, valuesStayInTheRangesOfAnEngine)
{
    for (bool const compression : {false, true}) {
        EngineData engine;
        engine.compression = compression;
        engine.boosted = compression;
        DriveModel const drive{engine};
        for (int s = 0; s < 1300; ++s) {
            DriveState const state = drive.at(seconds(s));
            EXPECT_GE(state.rpm, 700) << s;
            EXPECT_LE(state.rpm, 4000) << s;
            EXPECT_GE(state.loadPercent, 0) << s;
            EXPECT_LE(state.loadPercent, 100) << s;
            EXPECT_GE(state.throttlePercent, 0) << s;
            EXPECT_LE(state.throttlePercent, 100) << s;
            EXPECT_GE(state.manifoldKpa, 20) << s;
            EXPECT_LE(state.manifoldKpa, 230) << s;
            EXPECT_GT(state.airGramsPerSecond, 0.5) << s;
            EXPECT_LT(state.airGramsPerSecond, 120) << s;
            EXPECT_GE(state.frontSensorVolts, 0) << s;
            EXPECT_LE(state.frontSensorVolts, 1) << s;
            EXPECT_GT(state.lambda, 0.9) << s;
            EXPECT_GT(state.fuelLitresPerHour, 0.05) << s;
            EXPECT_LT(state.fuelLitresPerHour, 30) << s;
            EXPECT_NEAR(state.volts, 14, 0.4) << s;
        }
    }
}

struct MeanCase
{
    double DriveState::*field;
    double frost;
    double turbo;
    double diesel;
};

// A scenario of yesterday must give the same numbers tomorrow: the means of ten minutes of each value, in its unit.
MeanCase const meanCases[] = {
    {&DriveState::speedKmh, 47.8687838, 68.1609856, 47.8687838},
    {&DriveState::rpm, 1827.06886, 2339.1537, 1427.39071},
    {&DriveState::loadPercent, 32.5029538, 37.033292, 32.5029538},
    {&DriveState::throttlePercent, 18.917334, 21.9718575, 88},
    {&DriveState::pedalPercent, 10.9962972, 15.238691, 10.9962972},
    {&DriveState::manifoldKpa, 49.352304, 61.7315847, 135.378397},
    {&DriveState::airGramsPerSecond, 12.131519, 19.9711608, 25.3912151},
    {&DriveState::coolantCelsius, 62.6296364, 82.6125033, 82.6125033},
    {&DriveState::intakeCelsius, 4.12787297, 27.9103409, 29.127873},
    {&DriveState::oilCelsius, 46.7603713, 77.9304115, 77.9304115},
    {&DriveState::ambientCelsius, -7, 18, 18},
    {&DriveState::catalystCelsius, 491.555648, 498.804189, 491.555648},
    {&DriveState::timingDegrees, 13.6831277, 15.5049502, 12.0844152},
    {&DriveState::shortTrimPercent, 0.00115687489, 0.00115687489, 0.00115687489},
    {&DriveState::longTrimPercent, 2.3, 2.3, 2.3},
    {&DriveState::frontSensorVolts, 0.449896928, 0.449896928, 0.449896928},
    {&DriveState::rearSensorVolts, 0.680118085, 0.680118085, 0.680118085},
    {&DriveState::lambda, 1.0000024, 1.0000024, 3.19240843},
    {&DriveState::fuelLitresPerHour, 3.98814838, 6.56546522, 2.54080924},
    {&DriveState::fuelLevelPercent, 62.5187574, 62.3147525, 62.5187574},
    {&DriveState::railKpa, 393.001182, 394.813317, 68628.6922},
    {&DriveState::egrPercent, 25.1699412, 22.6485279, 25.1699412},
    {&DriveState::purgePercent, 7.12951912, 7.38546132, 7.12951912},
    {&DriveState::torquePercent, 27.2526584, 31.3299628, 27.2526584},
    {&DriveState::volts, 14.0350137, 14.025953, 14.0350137},
    {&DriveState::barometricKpa, 100, 100, 100},
    {&DriveState::kilometres, 4.01035461, 5.71039624, 4.01035461},
    {&DriveState::odometerKm, 48214.0104, 48215.7104, 48214.0104},
    {&DriveState::gearboxCelsius, 48.8112965, 58.5726799, 58.5726799},
    {&DriveState::batteryPercent, 77.117722, 76.7437128, 77.117722},
    {&DriveState::batteryVolts, 373.736608, 373.014759, 373.736608},
    {&DriveState::batteryAmps, 31.6753121, 37.8933553, 31.6753121},
    {&DriveState::batteryCelsius, -4.56947532, 20.4305247, 20.4305247},
};

std::vector<DriveState> tenMinutes(EngineData const& engine)
{
    DriveModel const drive(engine);
    std::vector<DriveState> states;
    for (int ms = 0; ms < 600000; ms += 700) {
        states.push_back(drive.at(Ms(ms)));
    }
    return states;
}

void expectMean(std::vector<DriveState> const& states, double DriveState::*field, double mean, int row)
{
    auto const add = [field](double sum, DriveState const& state) { return sum + state.*field; };
    double const sum = std::accumulate(states.begin(), states.end(), 0.0, add);
    EXPECT_NEAR(sum / static_cast<double>(states.size()), mean, 1e-6 + std::abs(mean) * 1e-7) << "row " << row;
}

TEST(DriveModel, staysTheSameDriveFromVersionToVersion)
{
    EngineData frost;
    frost.startCoolantCelsius = frost.ambientCelsius = -7;
    EngineData turbo;
    turbo.boosted = true;
    turbo.topSpeedKmh = 131;
    EngineData diesel;
    diesel.compression = diesel.boosted = true;
    auto const inFrost = tenMinutes(frost);
    auto const withTurbo = tenMinutes(turbo);
    auto const onDiesel = tenMinutes(diesel);
    int row = 0;
    for (auto const& each : meanCases) {
        expectMean(inFrost, each.field, each.frost, row);
        expectMean(withTurbo, each.field, each.turbo, row);
        expectMean(onDiesel, each.field, each.diesel, row++);
    }
}

struct PidCase
{
    std::uint8_t pid;
    void (*set)(DriveState&);
    Bytes data;
};

// clang-format off
PidCase const pidCases[] = {
    {0x04, [](DriveState& s) { s.loadPercent = 100; }, {0xFF}},
    {0x05, [](DriveState& s) { s.coolantCelsius = 93; }, {0x85}},
    {0x06, [](DriveState& s) { s.shortTrimPercent = 0; }, {0x80}},
    {0x07, [](DriveState& s) { s.longTrimPercent = 2.34375; }, {0x83}},
    {0x0B, [](DriveState& s) { s.manifoldKpa = 31; }, {0x1F}},
    {0x0C, [](DriveState& s) { s.rpm = 1726; }, {0x1A, 0xF8}},
    {0x0D, [](DriveState& s) { s.speedKmh = 132; }, {0x84}},
    {0x0E, [](DriveState& s) { s.timingDegrees = 10; }, {0x94}},
    {0x0F, [](DriveState& s) { s.intakeCelsius = -40; }, {0x00}},
    {0x10, [](DriveState& s) { s.airGramsPerSecond = 207.56; }, {0x51, 0x14}},
    {0x14, [](DriveState& s) { s.frontSensorVolts = 0.145; }, {0x1D, 0x80}},
    {0x1F, [](DriveState& s) { s.seconds = 5238; }, {0x14, 0x76}},
    {0x33, [](DriveState& s) { s.barometricKpa = 101; }, {0x65}},
    {0x3C, [](DriveState& s) { s.catalystCelsius = 883.2; }, {0x24, 0x10}},
    {0x42, [](DriveState& s) { s.volts = 14.609; }, {0x39, 0x11}},
    {0x44, [](DriveState& s) { s.lambda = 1; }, {0x80, 0x00}},
    {0x0D, [](DriveState& s) { s.speedKmh = 300; }, {0xFF}},
    {0x05, [](DriveState& s) { s.coolantCelsius = -60; }, {0x00}},
    {0x03, [](DriveState& s) { s.closedLoop = true; }, {0x02, 0x00}},
    {0x03, [](DriveState& s) { s.closedLoop = false; }, {0x01, 0x00}},
    {0x08, [](DriveState& s) { s.shortTrimPercent = -2.34375; }, {0x83}}, // the other bank mirrors the first
    {0x09, [](DriveState& s) { s.longTrimPercent = 1.6 + 2.34375; }, {0x83}},
    {0x0A, [](DriveState& s) { s.railKpa = 300; }, {0x64}},
    {0x0C, [](DriveState& s) { s.rpm = 20000; }, {0xFF, 0xFF}},
    {0x11, [](DriveState& s) { s.throttlePercent = 40; }, {0x66}},
    {0x14, [](DriveState& s) { s.shortTrimPercent = 2.34375; }, {0x00, 0x83}},
    {0x15, [](DriveState& s) { s.rearSensorVolts = 0.68; }, {0x88, 0xFF}},
    {0x18, [](DriveState& s) { s.frontSensorVolts = 0.145; s.shortTrimPercent = -2.34375; }, {0x97, 0x83}},
    {0x19, [](DriveState& s) { s.rearSensorVolts = 0.5; }, {0x64, 0xFF}},
    {0x22, [](DriveState& s) { s.railKpa = 79; }, {0x03, 0xE8}},
    {0x23, [](DriveState& s) { s.railKpa = 50000; }, {0x13, 0x88}},
    {0x24, [](DriveState& s) { s.lambda = 0.5; }, {0x40, 0x00, 0x46, 0x66}}, // 2.2 V
    {0x2C, [](DriveState& s) { s.egrPercent = 20; }, {0x33}},
    {0x2D, [](DriveState& s) { s.seconds = 11; }, {0x7D}}, // sin 11 is -1: 2 % too little
    {0x2E, [](DriveState& s) { s.purgePercent = 40; }, {0x66}},
    {0x2F, [](DriveState& s) { s.fuelLevelPercent = 60; }, {0x99}},
    {0x34, [](DriveState& s) { s.lambda = 1.5; }, {0xC0, 0x00, 0x85, 0x00}}, // 5 mA
    {0x3D, [](DriveState& s) { s.catalystCelsius = 883.2 + 14; }, {0x24, 0x10}},
    {0x3E, [](DriveState& s) { s.catalystCelsius = 883.2 + 65; }, {0x24, 0x10}},
    {0x3F, [](DriveState& s) { s.catalystCelsius = 883.2 + 80; }, {0x24, 0x10}},
    {0x43, [](DriveState& s) { s.loadPercent = 100; }, {0x00, 0xFF}},
    {0x45, [](DriveState& s) { s.throttlePercent = 51; }, {0x66}},
    {0x46, [](DriveState& s) { s.ambientCelsius = 20; }, {0x3C}},
    {0x47, [](DriveState& s) { s.throttlePercent = 39.2; }, {0x66}},
    {0x49, [](DriveState& s) { s.pedalPercent = 31.875; }, {0x66}},
    {0x4A, [](DriveState& s) { s.pedalPercent = 82; }, {0x66}},
    {0x4C, [](DriveState& s) { s.throttlePercent = 50; }, {0x66}},
    {0x59, [](DriveState& s) { s.railKpa = 50000; }, {0x13, 0x88}},
    {0x5A, [](DriveState& s) { s.pedalPercent = 40; }, {0x66}},
    {0x5C, [](DriveState& s) { s.oilCelsius = 92; }, {0x84}},
    {0x5D, [](DriveState& s) { s.timingDegrees = 10; }, {0x6B, 0x00}}, // 4 degrees
    {0x5E, [](DriveState& s) { s.fuelLitresPerHour = 10; }, {0x00, 0xC8}},
    {0x61, [](DriveState& s) { s.torquePercent = 30; }, {0x9D}},
    {0x62, [](DriveState& s) { s.torquePercent = 30; }, {0x9B}},
    {0x66, [](DriveState& s) { s.airGramsPerSecond = 10; }, {0x01, 0x01, 0x40, 0x00, 0x00}},
    {0x67, [](DriveState& s) { s.coolantCelsius = 90; }, {0x03, 0x82, 0x79}},
    {0x70, [](DriveState& s) { s.manifoldKpa = 100; }, {0x07, 0x0C, 0x80, 0x0C, 0x60, 0, 0, 0, 0, 0x02}},
    {0x78, [](DriveState& s) { s.catalystCelsius = 300; }, {0x03, 0x0E, 0xD8, 0x0D, 0x48, 0, 0, 0, 0}},
    {0x7A, [](DriveState& s) { s.airGramsPerSecond = 10; }, {0x01, 0x00, 0x28, 0, 0, 0, 0}},
    {0x9D, [](DriveState& s) { s.fuelLitresPerHour = 3.6; }, {0x00, 0x25, 0x00, 0x25}}, // 0.745 g/s
    {0xA6, [](DriveState& s) { s.odometerKm = 82187.8; }, {0x00, 0x0C, 0x8A, 0x76}},
};
// clang-format on

TEST(LivePids, areTheFormulasOfTheStandardTurnedRound)
{
    for (auto const& row : pidCases) {
        DriveState state;
        row.set(state);
        EXPECT_EQ(obdsim::livePid(row.pid, state, {}), row.data) << obdsim::hexByte(row.pid);
    }
    EXPECT_FALSE(obdsim::livePid(0x1C, DriveState{}, {}));
    EXPECT_FALSE(obdsim::isLivePid(0x00));
    EXPECT_TRUE(obdsim::isLivePid(0x0C));
}

TEST(LivePids, countersComeFromTheTimeSinceClearing)
{
    obdsim::SinceCleared const cleared{600, 640, 12, 120, 9};
    EXPECT_EQ(obdsim::livePid(0x21, {}, cleared), (Bytes{0x00, 0x09}));
    EXPECT_EQ(obdsim::livePid(0x30, {}, cleared), Bytes{0x0C});
    EXPECT_EQ(obdsim::livePid(0x31, {}, cleared), (Bytes{0x02, 0x80}));
    EXPECT_EQ(obdsim::livePid(0x4D, {}, cleared), (Bytes{0x00, 0x02}));
    EXPECT_EQ(obdsim::livePid(0x4E, {}, cleared), (Bytes{0x00, 0x0A}));
}

} // namespace
