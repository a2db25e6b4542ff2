#include "libvelmora/watch/tripmeter.h"
#include "tests/support/driventime.h"

#include <gtest/gtest.h>

namespace {

using namespace std::chrono_literals;
using velmora::Trip;
using velmora::TripMeter;

struct Driven
{
    testsupport::DrivenTime time;
    TripMeter meter{"van"};

    // A value a second of each.
    void drive(int seconds, double rpm, double kmh)
    {
        for (int i = 0; i < seconds; ++i) {
            time.pass(1s);
            meter.onEngineSpeed(rpm, time.now);
            meter.onVehicleSpeed(kmh, time.now);
            meter.onFuelRate(rpm > 0 ? 6.0 : 0.0, time.now);
            ASSERT_FALSE(meter.onTime(time.now));
        }
    }
    Trip stop()
    {
        for (int i = 0; i < 200; ++i) {
            time.pass(1s);
            meter.onEngineSpeed(0.0, time.now);
            meter.onVehicleSpeed(0.0, time.now);
            if (std::optional<Trip> const trip = meter.onTime(time.now)) {
                return *trip;
            }
        }
        ADD_FAILURE() << "the trip does not end";
        return {};
    }
};

TEST(TripMeter, MeasuresATrip)
{
    Driven car;
    car.drive(60, 800, 0);
    velmora::WallTime const begin = car.time.now.wall - 58s; // the second of two engine speeds
    car.meter.onCoolant(60);
    car.meter.onOdometer(1000);
    car.drive(600, 2500, 72);
    car.meter.onCoolant(90);
    car.drive(100, 0, 0); // a red light, with start-stop
    car.drive(600, 2000, 36);
    car.meter.onOdometer(1018);
    velmora::WallTime const end = car.time.now.wall;
    Trip const trip = car.stop();
    EXPECT_EQ(trip.vehicle, "van");
    EXPECT_FALSE(trip.engineRun);
    EXPECT_EQ(trip.begin, begin);
    EXPECT_EQ(trip.end, end);
    EXPECT_NEAR(trip.durationS, 1358, 0.01);
    EXPECT_NEAR(trip.distanceKm, 12.0 + 6.0, 0.02);
    EXPECT_NEAR(trip.odometerKm.value(), 18.0, 1e-9);
    EXPECT_NEAR(trip.idleS, 58, 1.01);
    EXPECT_NEAR(trip.gapS, 0, 0.01);
    EXPECT_NEAR(trip.fuelL.value(), 6.0 * 1258 / 3600, 0.01);
    EXPECT_NEAR(trip.meanKmh.value(), 18.0 / 1358 * 3600, 0.1);
    EXPECT_EQ(trip.maxKmh, 72.0);
    EXPECT_EQ(trip.maxRpm, 2500.0);
    EXPECT_EQ(trip.maxCoolantC, 90.0);
    EXPECT_FALSE(car.meter.underway());
}

TEST(TripMeter, ASingleEngineSpeedIsNoise)
{
    Driven car;
    for (int i = 0; i < 10; ++i) {
        car.meter.onEngineSpeed(i % 2 == 0 ? 300.0 : 0.0, car.time.now);
        EXPECT_FALSE(car.meter.underway());
    }
}

TEST(TripMeter, GapsAreNotBridged)
{
    Driven car;
    car.drive(100, 2000, 72);
    car.time.pass(60s);
    car.drive(100, 2000, 72);
    Trip const trip = car.stop();
    EXPECT_NEAR(trip.gapS, 60, 1.01);
    EXPECT_NEAR(trip.distanceKm, 4.0, 0.06);
    EXPECT_NEAR(trip.meanKmh.value(), 72, 0.5);
    EXPECT_NEAR(trip.fuelL.value(), 6.0 * 198 / 3600, 0.005);
}

TEST(TripMeter, TheLongestGapIsBridgedStill)
{
    Driven car;
    car.drive(100, 2000, 72);
    car.time.pass(velmora::TripSettings().longestGap - 1s);
    car.drive(100, 2000, 72);
    EXPECT_NEAR(car.stop().gapS, 0, 1.01);
}

TEST(TripMeter, AShortOneIsAnEngineRun)
{
    Driven car;
    car.drive(300, 800, 0);
    EXPECT_TRUE(car.stop().engineRun);
    car.drive(20, 2000, 72); // 400 m, but 20 s
    EXPECT_TRUE(car.stop().engineRun);
    car.drive(40, 2000, 36);
    EXPECT_FALSE(car.stop().engineRun);
}

TEST(TripMeter, AClockThatIsSetOnTheWayMovesTheBeginToo)
{
    Driven car;
    car.meter.onClockSet(1h); // no trip yet
    car.drive(60, 2000, 72);
    car.time.now.wall += 100h;
    car.meter.onClockSet(100h);
    car.drive(60, 2000, 72);
    velmora::WallTime const end = car.time.now.wall;
    Trip const trip = car.stop();
    EXPECT_EQ(trip.end, end);
    EXPECT_EQ(trip.begin, end - 118s);
    EXPECT_NEAR(trip.durationS, 118, 0.01);
}

TEST(TripMeter, WhatWasNotToldStaysEmpty)
{
    Driven car;
    for (int i = 0; i < 100; ++i) {
        car.time.pass(1s);
        car.meter.onEngineSpeed(900, car.time.now);
    }
    std::optional<Trip> const trip = car.meter.finish();
    ASSERT_TRUE(trip);
    EXPECT_EQ(trip->distanceKm, 0.0);
    EXPECT_EQ(trip->gapS, trip->durationS);
    EXPECT_FALSE(trip->meanKmh);
    EXPECT_FALSE(trip->maxKmh);
    EXPECT_FALSE(trip->fuelL);
    EXPECT_FALSE(trip->odometerKm);
    EXPECT_FALSE(car.meter.finish());
}

TEST(TripMeter, AnElectricCarDrivesWithoutAnEngine)
{
    Driven car;
    car.drive(300, 0, 50);
    Trip const trip = car.stop();
    EXPECT_FALSE(trip.engineRun);
    EXPECT_NEAR(trip.distanceKm, 50.0 * 298 / 3600, 0.02);
    EXPECT_EQ(trip.idleS, 0.0);
}

} // namespace
