// Judge and meter of the watch at the last value and the last moment on each side.
#include "libvelmora/watch/tripmeter.h"
#include "tests/libvelmora/watch/drivenjudge.h"

#include <gtest/gtest.h>

namespace {

using namespace std::chrono_literals;
using velmora::BatterySettings;
using velmora::SleepJudge;
using velmora::Trip;
using velmora::TripMeter;
using State = SleepJudge::State;

struct Bounded : velmora::test::DrivenJudge
{
    using DrivenJudge::DrivenJudge;

    void rpm(double value) { judge.onEngineSpeed(value, time.steady()); }
    void kmh(double value) { judge.onVehicleSpeed(value, time.steady()); }
    void park(double first)
    {
        judge.sleep(time.steady());
        pass(120s);
        EXPECT_EQ(judge.state(), State::Parked);
        EXPECT_EQ(volts(first), State::Parked) << "the first look has nothing to be compared with";
    }
};

BatterySettings electricCar()
{
    BatterySettings settings;
    settings.electric = true;
    return settings;
}

TEST(SleepJudgeBounds, NothingRunsOnWhileItSleeps)
{
    Bounded car(electricCar());
    car.rpm(800);
    car.kmh(30);
    car.volts(14.0);
    EXPECT_TRUE(car.judge.running());
    car.judge.sleep(car.time.steady());
    EXPECT_FALSE(car.judge.running());
    car.rpm(800);
    car.kmh(30);
    EXPECT_FALSE(car.judge.running()) << "old values that come late";
    car.judge.wake(car.time.steady());
    for (int sign = 0; sign < 3; ++sign) {
        sign == 0 ? car.rpm(0) : sign == 1 ? car.kmh(0) : void(car.volts(12.6));
        EXPECT_FALSE(car.judge.running()) << "of what ran before nothing is known";
    }
    car.kmh(30);
    car.rpm(0);
    EXPECT_TRUE(car.judge.running());
    car.kmh(0);
    EXPECT_FALSE(car.judge.running());
    car.pass(119s);
    car.kmh(0.1);
    car.pass(119s);
    EXPECT_EQ(car.judge.state(), State::Asking) << "any movement is a sign";
    car.pass(1s);
    EXPECT_EQ(car.judge.state(), State::Settling);
}

TEST(SleepJudgeBounds, AParkedCarForgetsTheVoltageOfTheLastTime)
{
    Bounded car;
    car.park(12.8);
    car.judge.wake(car.time.steady());
    car.park(12.2);
    EXPECT_TRUE(car.judge.wantsVolts(car.time.steady() + 60s));
    EXPECT_EQ(car.volts(12.3), State::Parked);
}

TEST(SleepJudgeBounds, VoltsHaveTwoSides)
{
    Bounded truck;
    truck.volts(25.0);
    truck.volts(16.0);
    EXPECT_TRUE(truck.judge.low()) << "a battery of 24 V, and empty";
    truck.volts(15.9);
    EXPECT_FALSE(truck.judge.low()) << "of 12 V, with an alternator";

    Bounded level;
    level.park(13.2);
    EXPECT_EQ(level.volts(13.3), State::Parked) << "it was at the level before";
    Bounded rises;
    rises.park(13.19);
    EXPECT_EQ(rises.volts(13.2), State::Asking);
    Bounded little;
    little.park(12.60);
    EXPECT_EQ(little.volts(12.74), State::Parked);
    EXPECT_EQ(little.volts(12.90), State::Asking) << "adapters that tell hundredths";
    Bounded low;
    low.park(12.0);
    EXPECT_EQ(low.volts(12.09), State::Parked);
    EXPECT_EQ(low.volts(12.3), State::Asking);
}

TEST(SleepJudgeBounds, AStandstillIsCountedFromTheLastMovementOrWaking)
{
    Bounded car(electricCar());
    auto const runs = [&car](std::chrono::minutes time) {
        bool all = true;
        for (auto passed = 0min; passed < time; ++passed) {
            car.volts(14.0);
            all = all && car.judge.running();
            car.pass(60s);
        }
        return all;
    };
    EXPECT_TRUE(runs(29min));
    car.kmh(5);
    car.kmh(0);
    EXPECT_TRUE(runs(30min));
    EXPECT_FALSE(runs(1min));
    car.park(12.8);
    car.pass(2h);
    car.judge.wake(car.time.steady());
    EXPECT_TRUE(runs(30min));
}

TEST(SleepJudgeBounds, AWokenCarIsLookedAtAfterAMinuteAndALowOneIsNotProbed)
{
    BatterySettings settings;
    settings.wakeEvery = 10min;
    Bounded car(settings);
    car.park(12.6);
    car.judge.wake(car.time.steady());
    car.pass(59s);
    EXPECT_FALSE(car.judge.wantsVolts(car.time.steady()));
    car.pass(1s);
    EXPECT_TRUE(car.judge.wantsVolts(car.time.steady()));
    EXPECT_FALSE(car.judge.wantsProbe(car.time.steady() + 10min)) << "it is awake";
    car.park(12.0);
    car.pass(10min);
    EXPECT_FALSE(car.judge.wantsProbe(car.time.steady())) << "each request costs what it has little of";
    car.volts(12.1);
    EXPECT_TRUE(car.judge.wantsProbe(car.time.steady()));
    car.pass(5min);
    car.judge.wake(car.time.steady());
    car.park(12.6);
    EXPECT_FALSE(car.judge.wantsProbe(car.time.steady() + 599s));
    EXPECT_TRUE(car.judge.wantsProbe(car.time.steady() + 600s)) << "since it was parked";
}

// A meter that is fed by hand.
struct Metered
{
    testsupport::DrivenTime time;
    TripMeter meter;

    explicit Metered(velmora::TripSettings const& settings = {}) : meter("van", settings) {}

    void begin()
    {
        meter.onEngineSpeed(800, time.now);
        EXPECT_FALSE(meter.underway()) << "one engine speed may be noise";
        meter.onEngineSpeed(800, time.now);
        EXPECT_TRUE(meter.underway());
    }
    void speed(double kmh)
    {
        time.pass(1s);
        meter.onVehicleSpeed(kmh, time.now);
    }
};

TEST(TripMeterBounds, ATripKnowsNothingOfTheOneBefore)
{
    Metered car;
    std::optional<Trip> trips[2];
    for (std::optional<Trip>& trip : trips) {
        car.begin();
        car.meter.onOdometer(&trip == &trips[0] ? 1000 : 1030);
        for (int i = 0; i < 50; ++i) {
            car.meter.onEngineSpeed(2000, car.time.now);
            car.meter.onFuelRate(3.6, car.time.now);
            car.speed(72);
        }
        car.meter.onOdometer(&trip == &trips[0] ? 1020 : 1050);
        trip = car.meter.finish();
        EXPECT_FALSE(car.meter.underway());
        car.meter.onFuelRate(99, car.time.now);
        car.meter.onCoolant(99);
        car.meter.onOdometer(1030);
    }
    ASSERT_TRUE(trips[0] && trips[1]);
    EXPECT_NEAR(trips[0]->distanceKm, 49 * 0.02, 1e-12);
    EXPECT_DOUBLE_EQ(trips[1]->distanceKm, trips[0]->distanceKm);
    EXPECT_NEAR(*trips[0]->fuelL, 0.049, 1e-12);
    EXPECT_DOUBLE_EQ(*trips[1]->fuelL, *trips[0]->fuelL);
    EXPECT_EQ(trips[0]->gapS, 1.0) << "until the first speed";
    EXPECT_EQ(trips[1]->gapS, 1.0);
    EXPECT_EQ(trips[1]->odometerKm, 20.0);
    EXPECT_EQ(trips[1]->durationS, trips[0]->durationS);
    EXPECT_FALSE(trips[1]->maxCoolantC);
    EXPECT_EQ(trips[1]->vehicle, "van");
}

TEST(TripMeterBounds, MovementAloneBeginsATripAtTheSecondSign)
{
    Metered car;
    car.speed(5);
    EXPECT_FALSE(car.meter.underway());
    car.speed(0);
    car.speed(5);
    EXPECT_FALSE(car.meter.underway()) << "not two in a row";
    car.speed(5);
    EXPECT_TRUE(car.meter.underway());
    car.meter.finish();
    car.speed(5);
    EXPECT_FALSE(car.meter.underway()) << "counted anew";
    car.speed(5);
    EXPECT_TRUE(car.meter.underway());
}

TEST(TripMeterBounds, IdlesBelowTwoKilometresAnHourWhileTheEngineTurns)
{
    Metered car;
    car.begin();
    car.meter.onVehicleSpeed(0, car.time.now);
    for (double const kmh : {1.9, 1.9, 2.0, 1.9, 0.0}) {
        car.meter.onEngineSpeed(800, car.time.now);
        car.speed(kmh);
    }
    for (int i = 0; i < 4; ++i) { // with the last engine speed up to five seconds old
        car.speed(0);
    }
    car.speed(0);
    car.meter.onEngineSpeed(800, car.time.now);
    EXPECT_EQ(car.meter.finish()->idleS, 7.0);
}

TEST(TripMeterBounds, WhatComesAfterTheLastSignIsNoPartOfATrip)
{
    Metered car;
    car.begin();
    car.time.pass(1s);
    car.meter.onEngineSpeed(800, car.time.now);
    car.meter.onVehicleSpeed(0, car.time.now);
    for (int i = 0; i < 4; ++i) {
        car.speed(0);
    }
    car.time.pass(60s);
    car.speed(0);
    car.time.pass(54s);
    EXPECT_FALSE(car.meter.onTime(car.time.now)) << "119 seconds";
    car.time.pass(1s);
    std::optional<Trip> const trip = car.meter.onTime(car.time.now);
    ASSERT_TRUE(trip);
    EXPECT_EQ(trip->durationS, 1.0);
    EXPECT_EQ(trip->idleS, 1.0);
    EXPECT_EQ(trip->gapS, 1.0);
    EXPECT_FALSE(trip->meanKmh) << "of no time at all";
    EXPECT_EQ(trip->end - trip->begin, 1s);
}

TEST(TripMeterBounds, AFuelRateCountsForFiveSecondsAndACounterThatFellFromNothing)
{
    Metered car;
    car.begin();
    car.meter.onFuelRate(36, car.time.now);
    car.time.pass(5s);
    car.meter.onFuelRate(72, car.time.now);
    car.time.pass(5001ms);
    car.meter.onFuelRate(36, car.time.now);
    car.meter.onOdometer(1000);
    car.meter.onOdometer(1004);
    car.meter.onOdometer(3); // codes were cleared
    car.meter.onOdometer(10);
    car.meter.onCoolant(-10);
    car.meter.onCoolant(-20);
    car.meter.onEngineSpeed(700, car.time.now);
    Trip const trip = *car.meter.finish();
    EXPECT_DOUBLE_EQ(*trip.fuelL, 54.0 * 5 / 3600);
    EXPECT_EQ(trip.odometerKm, 7.0);
    EXPECT_EQ(trip.maxCoolantC, -10.0);
    EXPECT_EQ(trip.maxRpm, 800.0);
}

TEST(TripMeterBounds, IsATripFromTwoHundredMetresAndHalfAMinuteOn)
{
    for (auto const& [kmh, seconds, isRun] : {std::tuple(24.1, 30, false), {23.9, 30, true}, {60.0, 29, true}}) {
        Metered car;
        car.begin();
        car.meter.onVehicleSpeed(kmh, car.time.now);
        for (int i = 0; i < seconds; ++i) {
            car.speed(kmh);
        }
        EXPECT_EQ(car.meter.finish()->engineRun, isRun) << kmh;
    }
}

TEST(TripMeterBounds, IsATripFromItsShortestOn)
{
    velmora::TripSettings settings;
    settings.shortestKm = 0.5;
    settings.shortestTime = 2s;
    for (auto const& [kmh, time, isRun] : {std::tuple(1800.0, 1s, false), {1799.0, 1s, true}, {3600.0, 0s, true}}) {
        Metered car(settings);
        car.begin();
        car.time.pass(time);
        car.meter.onVehicleSpeed(kmh, car.time.now);
        car.speed(kmh);
        Trip const trip = *car.meter.finish();
        EXPECT_EQ(trip.engineRun, isRun) << kmh;
        EXPECT_DOUBLE_EQ(*trip.meanKmh, kmh) << "over the time that was measured";
    }
}

} // namespace
