#include "tests/libvelmora/watch/drivenjudge.h"

#include <gtest/gtest.h>

namespace {

using namespace std::chrono_literals;
using velmora::BatterySettings;
using velmora::SleepJudge;
using State = SleepJudge::State;

struct Judged : velmora::test::DrivenJudge
{
    using DrivenJudge::DrivenJudge;

    // A look at the voltage each minute.
    void park(double first)
    {
        pass(120s);
        pass(120s);
        ASSERT_EQ(judge.state(), State::Parked);
        ASSERT_TRUE(judge.wantsVolts(time.steady()));
        volts(first);
    }
    State after(std::chrono::seconds seconds, double value)
    {
        pass(seconds);
        volts(value);
        return judge.state();
    }
};

TEST(SleepJudge, RunsWhileEngineOrVehicleMoveWhateverTheVoltage)
{
    Judged car;
    for (int i = 0; i < 1000; ++i) {
        car.judge.onEngineSpeed(i % 2 == 0 ? 800.0 : 0.0, car.time.steady());
        car.volts(12.3);
        car.pass(5s);
        ASSERT_EQ(car.judge.state(), State::Asking);
    }
    for (int i = 0; i < 1000; ++i) { // a hybrid on its battery
        car.judge.onEngineSpeed(0.0, car.time.steady());
        car.judge.onVehicleSpeed(30.0, car.time.steady());
        EXPECT_TRUE(car.judge.running());
        car.pass(5s);
        ASSERT_EQ(car.judge.state(), State::Asking);
    }
}

TEST(SleepJudge, StopsThenWaitsThenLooksAtTheVoltageEachMinute)
{
    Judged car;
    car.judge.onEngineSpeed(800.0, car.time.steady());
    car.judge.onEngineSpeed(0.0, car.time.steady());
    EXPECT_FALSE(car.judge.running());
    car.volts(14.4); // says nothing, since the engine's speed is told
    car.pass(119s);
    EXPECT_EQ(car.judge.state(), State::Asking);
    car.pass(1s);
    EXPECT_EQ(car.judge.state(), State::Settling);
    car.pass(119s);
    EXPECT_FALSE(car.judge.wantsVolts(car.time.steady()));
    car.pass(1s);
    EXPECT_EQ(car.judge.state(), State::Parked);
    EXPECT_TRUE(car.judge.wantsVolts(car.time.steady()));
    car.volts(12.8);
    car.pass(59s);
    EXPECT_FALSE(car.judge.wantsVolts(car.time.steady()));
    car.pass(1s);
    EXPECT_TRUE(car.judge.wantsVolts(car.time.steady()));
    car.judge.onNoVolts(car.time.steady());
    EXPECT_FALSE(car.judge.wantsVolts(car.time.steady()));
    EXPECT_FALSE(car.judge.low());
}

TEST(SleepJudge, WakesByLevelAndByChangeButNotBySurfaceCharge)
{
    Judged level;
    level.park(13.1);
    EXPECT_EQ(level.after(60s, 13.2), State::Asking);

    Judged change;
    change.park(12.8);
    for (double const resting : {12.8, 12.7, 12.7, 12.6, 12.5, 12.6}) {
        EXPECT_EQ(change.after(60s, resting), State::Parked);
    }
    EXPECT_EQ(change.after(60s, 12.8), State::Asking); // a smart alternator that never rises above 13

    Judged dip;
    dip.park(12.6);
    EXPECT_EQ(dip.after(60s, 12.4), State::Asking); // the doors are unlocked

    Judged charging; // for hours, at the socket
    charging.park(14.2);
    EXPECT_EQ(charging.after(60s, 14.3), State::Parked);
    EXPECT_EQ(charging.after(60s, 14.2), State::Parked);
}

TEST(SleepJudge, ALowBatteryStopsEverything)
{
    Judged car;
    car.volts(12.0);
    EXPECT_TRUE(car.judge.low());
    EXPECT_EQ(car.judge.state(), State::Settling);
    car.pass(120s);
    car.volts(12.0);
    EXPECT_EQ(car.after(60s, 11.5), State::Parked); // a change, but there is nothing to spare
    EXPECT_EQ(car.after(60s, 13.3), State::Asking);
    EXPECT_FALSE(car.judge.low());

    Judged driving;
    driving.judge.onEngineSpeed(800.0, driving.time.steady());
    driving.volts(11.9);
    EXPECT_EQ(driving.judge.state(), State::Asking);
}

TEST(SleepJudge, KnowsA24VoltSystem)
{
    Judged car;
    car.volts(25.2);
    EXPECT_FALSE(car.judge.low());
    car.park(25.2);
    EXPECT_EQ(car.after(60s, 25.4), State::Parked);
    EXPECT_EQ(car.after(60s, 25.5), State::Parked);
    EXPECT_EQ(car.after(60s, 26.4), State::Asking);
    car.volts(24.0);
    EXPECT_TRUE(car.judge.low());
}

TEST(SleepJudge, AnElectricCarRunsByItsConverterForHalfAnHourWithoutMovement)
{
    BatterySettings settings;
    settings.electric = true;
    Judged car(settings);
    int minutes = 0;
    for (; car.judge.state() == State::Asking && minutes < 100; ++minutes) {
        car.judge.onEngineSpeed(0.0, car.time.steady());
        car.volts(14.1);
        car.pass(60s);
    }
    EXPECT_EQ(minutes, 31); // the last sign was in the 30th, and two minutes go by

    Judged petrol; // told no engine speed at all
    for (minutes = 0; petrol.judge.state() == State::Asking && minutes < 100; ++minutes) {
        petrol.volts(14.1);
        petrol.pass(60s);
    }
    EXPECT_EQ(minutes, 31);
}

// Where no control module tells the voltage, the adapter has to.
TEST(SleepJudge, AsksTheAdapterForTheVoltageThatTellsWhetherTheCarRuns)
{
    BatterySettings settings;
    settings.electric = true;
    Judged electric(settings);
    Judged unknown;
    Judged petrol;
    petrol.judge.onEngineSpeed(800.0, petrol.time.steady());
    for (Judged* const car : {&electric, &unknown, &petrol}) {
        car->pass(59s);
        EXPECT_FALSE(car->judge.wantsVolts(car->time.steady()));
        car->pass(1s);
    }
    EXPECT_TRUE(electric.judge.wantsVolts(electric.time.steady()));
    EXPECT_TRUE(unknown.judge.wantsVolts(unknown.time.steady()));
    EXPECT_FALSE(petrol.judge.wantsVolts(petrol.time.steady()));
    electric.volts(14.0);
    EXPECT_TRUE(electric.judge.running());
    EXPECT_FALSE(electric.judge.wantsVolts(electric.time.steady()));
    unknown.judge.onNoVolts(unknown.time.steady());
    EXPECT_FALSE(unknown.judge.wantsVolts(unknown.time.steady()));
    EXPECT_FALSE(unknown.judge.running());
}

TEST(SleepJudge, EachThresholdIsTheLastValueOnItsSide)
{
    Judged low;
    low.volts(12.1);
    EXPECT_FALSE(low.judge.low());
    low.volts(12.0);
    EXPECT_TRUE(low.judge.low());

    Judged running;
    running.volts(13.1);
    EXPECT_FALSE(running.judge.running());
    running.volts(13.2);
    EXPECT_TRUE(running.judge.running());

    Judged system;
    system.volts(18.0); // an alternator gone mad
    system.volts(12.2);
    EXPECT_FALSE(system.judge.low());
    system.volts(18.1);
    system.volts(24.2);
    EXPECT_FALSE(system.judge.low());
    system.volts(24.1);
    EXPECT_TRUE(system.judge.low());

    Judged change;
    change.park(12.8);
    EXPECT_EQ(change.after(60s, 12.7), State::Parked);
    EXPECT_EQ(change.after(60s, 12.5), State::Asking);
}

TEST(SleepJudge, EachThresholdIsASetting)
{
    BatterySettings settings;
    settings.stopAfter = 10s;
    settings.settle = 20s;
    settings.voltageEvery = 30s;
    settings.runningVolts = 14.0;
    settings.lowVolts = 11.0;
    settings.wakeChange = 0.5;
    settings.stillLimit = 2min;
    Judged car(settings);
    car.volts(11.1);
    EXPECT_FALSE(car.judge.low());
    car.pass(9s);
    EXPECT_EQ(car.judge.state(), State::Asking);
    car.pass(1s);
    EXPECT_EQ(car.judge.state(), State::Settling);
    car.pass(20s);
    ASSERT_EQ(car.judge.state(), State::Parked);
    car.volts(12.6);
    car.pass(29s);
    EXPECT_FALSE(car.judge.wantsVolts(car.time.steady()));
    car.pass(1s);
    EXPECT_TRUE(car.judge.wantsVolts(car.time.steady()));
    EXPECT_EQ(car.after(0s, 12.2), State::Parked);
    EXPECT_EQ(car.after(30s, 12.7), State::Asking);
    for (int i = 0; i < 12; ++i) { // by its voltage, two minutes without movement
        car.volts(14.0);
        EXPECT_TRUE(car.judge.running()) << i;
        car.pass(10s - 1ms);
    }
    car.pass(1s);
    car.volts(14.0);
    EXPECT_FALSE(car.judge.running());
}

TEST(SleepJudge, AsksAParkedCarOnlyIfTold)
{
    Judged never;
    never.park(12.6);
    never.pass(24h);
    EXPECT_FALSE(never.judge.wantsProbe(never.time.steady()));

    BatterySettings settings;
    settings.wakeEvery = 30min;
    Judged car(settings);
    car.park(12.6);
    car.pass(29min);
    EXPECT_FALSE(car.judge.wantsProbe(car.time.steady()));
    car.pass(1min);
    EXPECT_TRUE(car.judge.wantsProbe(car.time.steady()));
    car.judge.onProbe(false, car.time.steady());
    EXPECT_FALSE(car.judge.wantsProbe(car.time.steady()));
    EXPECT_EQ(car.judge.state(), State::Parked);
    car.pass(30min);
    car.judge.onProbe(true, car.time.steady());
    EXPECT_EQ(car.judge.state(), State::Asking);
}

} // namespace
