#include "simulator/car/livepids.h"

#include <gtest/gtest.h>

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
    const DriveModel drive{EngineData{}};
    EXPECT_EQ(drive.at(seconds(5)).speedKmh, 0);
    EXPECT_NEAR(drive.at(seconds(5)).rpm, 780, 10);
    EXPECT_GT(drive.at(seconds(28)).loadPercent, drive.at(seconds(5)).loadPercent + 20);
    EXPECT_NEAR(drive.at(seconds(60)).speedKmh, 92, 4);
    EXPECT_LT(drive.at(seconds(90)).loadPercent, 10);
    EXPECT_EQ(drive.at(seconds(110)).speedKmh, 0);
}

TEST(DriveModel, repeatsItselfToTheBit)
{
    const DriveModel one{EngineData{}};
    const DriveModel other{EngineData{}};
    for (int s = 0; s < 400; s += 7) {
        EXPECT_EQ(one.at(seconds(s)).rpm, other.at(seconds(s)).rpm);
        EXPECT_EQ(one.at(seconds(s)).kilometres, other.at(seconds(s)).kilometres);
    }
}

TEST(DriveModel, speedNeverJumpsAndTheWayGrowsWithIt)
{
    const DriveModel drive{EngineData{}};
    DriveState before = drive.at(Time(0));
    for (int ms = 500; ms <= 260000; ms += 500) {
        const DriveState state = drive.at(Ms(ms));
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
    const DriveModel drive{cold};
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
        const DriveModel drive{engine};
        for (int s = 0; s < 1300; ++s) {
            const DriveState state = drive.at(seconds(s));
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

struct PidCase
{
    std::uint8_t pid;
    void (*set)(DriveState&);
    Bytes data;
};

const PidCase pidCases[] = {
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
    {0xA6, [](DriveState& s) { s.odometerKm = 82187.8; }, {0x00, 0x0C, 0x8A, 0x76}},
};

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
    const obdsim::SinceCleared cleared{600, 640, 12, 120, 9};
    EXPECT_EQ(obdsim::livePid(0x21, {}, cleared), (Bytes{0x00, 0x09}));
    EXPECT_EQ(obdsim::livePid(0x30, {}, cleared), Bytes{0x0C});
    EXPECT_EQ(obdsim::livePid(0x31, {}, cleared), (Bytes{0x02, 0x80}));
    EXPECT_EQ(obdsim::livePid(0x4D, {}, cleared), (Bytes{0x00, 0x02}));
    EXPECT_EQ(obdsim::livePid(0x4E, {}, cleared), (Bytes{0x00, 0x0A}));
}

} // namespace
