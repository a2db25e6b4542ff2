// What the watch does of itself: its steps, its patience by default, what it takes from readings, and what it lets go.
#include "tests/libvelmora/watch/drivencar.h"

namespace {

using namespace std::chrono_literals;
using testing::Contains;
using testing::ElementsAre;
using testing::Not;
using Watch = velmora::test::DrivenWatch;

TEST(WatchEngineBounds, StepsAsOftenAsItHasWork)
{
    Watch watch;
    EXPECT_EQ(watch.step(), 100ms) << "a car that is asked";
    watch.run(5min);
    EXPECT_EQ(watch.engine.state(), "parked");
    EXPECT_EQ(watch.step(), 1s);
    watch.car.plugged = false;
    watch.time.pass(60s);
    EXPECT_EQ(watch.step(), 0ms) << "how long the attempt took is told by the next step";
    EXPECT_EQ(watch.step(), 1s);

    velmora::WatchRules rules;
    rules.isStranger = [](std::string const&) { return true; };
    Watch stranger(rules);
    stranger.step();
    EXPECT_EQ(stranger.car.disconnects, 1);
    EXPECT_EQ(stranger.step(), 1s);
    EXPECT_FALSE(stranger.engine.health().linkUp);
}

TEST(WatchEngineBounds, ASilentCarHasTenSecondsAndThenAMinute)
{
    EXPECT_EQ(velmora::WatchRules().silence, 10s);
    EXPECT_EQ(velmora::WatchRules().silentCar, 60s);
    EXPECT_EQ(velmora::WatchRules().codesEvery, 10min);
    Watch watch;
    watch.drive(1min);
    watch.events.clear();
    watch.car.answers = false; // a minute after the start came its last reading
    watch.run(9900ms);
    EXPECT_TRUE(watch.events.empty());
    watch.time.pass(100ms);
    watch.step();
    EXPECT_THAT(watch.events, ElementsAre("ignition_off"));
    EXPECT_TRUE(watch.engine.health().linkUp);
    watch.run(49900ms);
    EXPECT_THAT(watch.events, Not(Contains("asleep"))) << "not a minute yet";
    watch.time.pass(100ms);
    watch.step();
    EXPECT_THAT(watch.events, ElementsAre("ignition_off", "engine_stop", "asleep"));
    EXPECT_FALSE(watch.engine.health().linkUp);
    EXPECT_EQ(watch.engine.state(), "settling");
    EXPECT_EQ(watch.car.stops, 1);
}

TEST(WatchEngineBounds, TellsThatTheEngineRunsInTheStepThatReadsIt)
{
    Watch watch;
    std::vector<velmora::SteadyTime> looks;
    watch.car.onCodes = [&] { looks.push_back(watch.time.steady()); };
    watch.car.rpm = 800;
    watch.step();
    EXPECT_THAT(watch.events, ElementsAre("ignition_on", "engine_start"));
    EXPECT_EQ(watch.engine.state(), "running");
    watch.run(21min);
    ASSERT_GE(looks.size(), 4U);
    EXPECT_EQ(looks[2] - looks[1], 10min);
    EXPECT_EQ(looks[3] - looks[2], 10min);
}

TEST(WatchEngineBounds, IsConnectingDuringEachAttempt)
{
    Watch watch;
    std::vector<std::string> states;
    watch.car.plugged = false;
    watch.car.onAttempt = [&] { states.push_back(watch.engine.state()); };
    watch.run(5s);
    EXPECT_GE(states.size(), 3U);
    EXPECT_THAT(states, testing::Each("connecting"));
    EXPECT_EQ(watch.engine.state(), "no link");
}

TEST(WatchEngineBounds, TakesFuelTemperatureAndVoltageFromReadings)
{
    Watch watch;
    watch.car.fuelRate = 6.0;
    watch.car.coolant = 85.0;
    watch.car.moduleVolts = 14.1;
    watch.drive(10min);
    watch.car.coolant = 70.0;
    watch.car.moduleVolts = 12.0;
    watch.run(5s);
    EXPECT_THAT(watch.events, Contains("voltage_low"));
    EXPECT_EQ(watch.car.voltLooks, 0) << "the module told it";
    EXPECT_EQ(watch.engine.state(), "settling") << "a low battery that no engine charges";
    watch.engine.finish(watch.time.now);
    ASSERT_EQ(watch.trips.size(), 1U);
    EXPECT_NEAR(watch.trips[0].fuelL.value(), 1.0, 0.02);
    EXPECT_EQ(watch.trips[0].maxCoolantC, 85.0);
    EXPECT_EQ(watch.trips[0].maxRpm, 2000.0);
}

TEST(WatchEngineBounds, AVoltageThatNobodyTellsIsAskedForOnceAMinute)
{
    Watch watch;
    watch.car.voltless = true;
    watch.run(1h);
    EXPECT_EQ(watch.engine.state(), "parked");
    EXPECT_NEAR(watch.car.voltLooks, 56, 1);
    EXPECT_THAT(watch.events, Not(Contains("voltage_low")));
}

TEST(WatchEngineBounds, TellsModulesOnceAndSensorsWithEachConnection)
{
    Watch watch;
    watch.drive(1min);
    EXPECT_EQ(watch.modules, 1);
    EXPECT_EQ(watch.sensorLists, 1);
    watch.car.plugged = false;
    watch.run(5s);
    EXPECT_EQ(watch.engine.state(), "no link");
    EXPECT_EQ(watch.engine.trouble(), "no such device");
    EXPECT_FALSE(watch.engine.health().linkUp);
    watch.car.plugged = true;
    watch.drive(30s);
    EXPECT_EQ(watch.modules, 1);
    EXPECT_EQ(watch.sensorLists, 2);
    EXPECT_EQ(watch.engine.trouble(), "");
}

TEST(WatchEngineBounds, TheEndTakesWhatWasReadAndLetsGo)
{
    Watch watch;
    watch.drive(2min);
    watch.time.pass(3s);
    int const before = watch.readings;
    watch.engine.finish(watch.time.now);
    EXPECT_EQ(watch.readings, watch.car.given);
    EXPECT_GT(watch.readings, before);
    EXPECT_EQ(watch.car.stops, 1);
    EXPECT_EQ(watch.car.disconnects, 1);
    EXPECT_EQ(watch.trips.size(), 1U);
    watch.engine.finish(watch.time.now);
    EXPECT_EQ(watch.trips.size(), 1U);
    EXPECT_EQ(watch.car.stops, 1) << "it was not asked any more";
}

TEST(WatchEngineBounds, ASilentCarBehindALinkThatCameBackIsTold)
{
    Watch watch;
    watch.drive(1min);
    watch.car.plugged = false;
    watch.run(5s);
    watch.car.answers = false;
    watch.car.plugged = true;
    watch.events.clear();
    watch.run(65s);
    EXPECT_THAT(watch.events, Contains("link_back")) << "the adapter works";
    EXPECT_EQ(watch.engine.trouble(), "no module answers");
    EXPECT_EQ(watch.engine.state(), "settling");
}

TEST(WatchEngineBounds, LooksAtTheClockOnceASecondAndAtCodesWhenTold)
{
    int looks = 0;
    velmora::WatchRules rules;
    rules.clocks = [&looks] {
        ++looks;
        return velmora::ClockLook{1772352900250, 1000, true, "boot"};
    };
    Watch watch(rules);
    watch.drive(60s);
    EXPECT_NEAR(looks, 61, 1);
    int const before = watch.car.codeLooks;
    watch.engine.lookAtCodesSoon();
    watch.run(200ms);
    EXPECT_EQ(watch.car.codeLooks, before + 1);
    watch.run(5s);
    EXPECT_EQ(watch.car.codeLooks, before + 1);
}

TEST(WatchEngineBounds, ANapThatTheLinkBrokeIsTakenAgain)
{
    velmora::WatchRules rules;
    rules.battery.adapterSleep = true;
    Watch watch(rules);
    watch.drive(1min);
    watch.car.answers = false;
    watch.run(10min);
    EXPECT_EQ(watch.car.naps, 1);
    EXPECT_EQ(watch.engine.state(), "parked");
    watch.car.woken = true;
    watch.car.plugged = false;
    watch.run(10s);
    EXPECT_EQ(watch.engine.state(), "no link");
    watch.car.woken = false;
    watch.car.plugged = true;
    watch.run(10min);
    EXPECT_EQ(watch.car.naps, 2);
    EXPECT_EQ(watch.engine.state(), "parked");
    EXPECT_THAT(watch.events, Contains("link_back"));
    EXPECT_EQ(watch.engine.trouble(), "");
}

} // namespace
