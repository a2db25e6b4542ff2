#include "tests/libvelmora/watch/drivencar.h"

namespace {

using namespace std::chrono_literals;
using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using Watch = velmora::test::DrivenWatch;

TEST(WatchEngine, SurvivesALinkLossAMinuteForADay)
{
    Watch watch;
    watch.car.rpm = 900;
    for (int i = 0; i < 1440; ++i) {
        watch.car.plugged = true;
        watch.run(50s);
        watch.car.plugged = false;
        watch.run(10s + 1ms);
    }
    EXPECT_EQ(watch.readings, watch.car.given); // none lost between, none doubled
    EXPECT_EQ(std::ranges::count(watch.events, "link_lost"), 1440);
    EXPECT_EQ(std::ranges::count(watch.events, "link_back"), 1439);
    EXPECT_EQ(watch.engine.health().linkLosses, 1440U);
    EXPECT_GT(watch.readings, 1440 * 2 * 30);
}

TEST(WatchEngine, TellsABrokenLinkAtOnceAndTriesAgain)
{
    Watch watch;
    watch.drive(1min);
    watch.car.plugged = false;
    watch.run(500ms);
    EXPECT_THAT(watch.events, Contains("link_lost")) << "not after the silence that a car may keep";
    watch.car.plugged = true;
    watch.run(2s);
    EXPECT_THAT(watch.events, Contains("link_back"));
}

TEST(WatchEngine, TriesAMissingAdapterAtGrowingPauses)
{
    Watch watch;
    watch.car.plugged = false;
    watch.run(60s);
    EXPECT_GE(watch.car.connects, 5);
    EXPECT_LE(watch.car.connects, 9);
    EXPECT_EQ(watch.engine.state(), "no link");
    EXPECT_EQ(watch.engine.trouble(), "no such device");
    watch.run(1h);
    int const before = watch.car.connects;
    watch.run(1h);
    EXPECT_GE(watch.car.connects - before, 59);
    EXPECT_LE(watch.car.connects - before, 121);
    EXPECT_THAT(watch.events, IsEmpty()); // there was no link to lose
    watch.car.plugged = true;
    watch.drive(70s);
    EXPECT_THAT(watch.events, ElementsAre("ignition_on", "engine_start"));
    EXPECT_EQ(watch.engine.trouble(), "");
}

TEST(WatchEngine, PausesBeginWhenAnAttemptHasEnded)
{
    Watch watch;
    watch.car.plugged = false;
    watch.car.onAttempt = [&watch] { watch.time.pass(20s); }; // an adapter out of reach, by its operating system
    watch.run(1h);
    EXPECT_GE(watch.car.connects, 3600 / 80);
    EXPECT_LE(watch.car.connects, 3600 / 50 + 6);
}

TEST(WatchEngine, ALinkThatComesBackInADriveIsUsedAtOnce)
{
    Watch watch;
    watch.drive(5min);
    watch.car.plugged = false;
    watch.run(30min);
    watch.car.plugged = true;
    int const before = watch.readings;
    watch.drive(2min);
    EXPECT_GT(watch.readings, before + 100);
}

// A K line takes minutes to be brought up and to tell its codes.
TEST(WatchEngine, TimeThatASlowBusTakesIsNoSilenceOfTheCar)
{
    Watch watch;
    watch.car.onConnect = [&watch] { watch.time.pass(3min); };
    watch.run(4min); // the ignition is on, the engine stands
    EXPECT_EQ(watch.engine.state(), "asking");
    watch.run(90s);
    EXPECT_THAT(watch.events, Contains("asleep"));

    Watch driving;
    driving.drive(1min);
    driving.car.onCodes = [&driving] { driving.time.pass(3min); };
    driving.drive(30min);
    EXPECT_THAT(driving.events, testing::Not(Contains("asleep")));
    EXPECT_EQ(driving.engine.state(), "running");
}

TEST(WatchEngine, LooksAtCodesEveryTenMinutesAndAtEachStart)
{
    Watch watch;
    watch.car.kmh = 10; // rolls, with the ignition on
    watch.run(35min);
    EXPECT_EQ(watch.car.codeLooks, 1 + 1 + 3); // connected, started, each ten minutes
    watch.car.lamp = true;
    watch.run(10min);
    EXPECT_THAT(watch.events, Contains("lamp_on"));
}

// A car that tells no engine speed and no voltage runs by what the adapter measures.
TEST(WatchEngine, ACarThatTellsNeitherEngineNorVoltageIsJudgedByTheAdapters)
{
    Watch watch;
    watch.car.engineless = true;
    watch.car.battery = 14.1;
    watch.run(10min);
    EXPECT_EQ(watch.engine.state(), "running");
    EXPECT_NEAR(watch.car.voltLooks, 9, 1);
    watch.car.battery = 12.7;
    watch.run(10min);
    EXPECT_EQ(watch.engine.state(), "parked");
}

TEST(WatchEngine, DoesNothingWithAnotherVehicle)
{
    velmora::WatchRules rules;
    rules.isStranger = [](std::string const& vin) { return vin == "VIN-2"; };
    Watch watch(rules);
    watch.drive(1min);
    int const before = watch.readings;
    watch.car.plugged = false;
    watch.run(10s);
    watch.car.plugged = true;
    watch.car.number = "VIN-2";
    EXPECT_FALSE(watch.engine.metStranger());
    watch.drive(2min);
    EXPECT_TRUE(watch.engine.metStranger());
    EXPECT_LE(watch.readings, before + 2);
}

TEST(WatchEngine, TellsThatTheClockWasSetAndDatesTheTripByIt)
{
    velmora::ClockLook look{0, 0, false, "boot-1"};
    velmora::WatchRules rules;
    rules.clocks = [&look] { return look; };
    Watch watch(rules);
    watch.drive(5min);
    EXPECT_THAT(watch.events, testing::Not(Contains("clock_set")));
    look = {1772353200250, 300000, true, "boot-1"};
    watch.time.now.wall += 100h;
    watch.drive(5min);
    EXPECT_THAT(watch.events, Contains("clock_set"));
    watch.engine.finish(watch.time.now);
    ASSERT_EQ(watch.trips.size(), 1U);
    EXPECT_NEAR(std::chrono::duration<double>(watch.trips[0].end - watch.trips[0].begin).count(), 600, 3);

    look = {0, 300000, false, "boot-1"}; // five minutes, and nobody has set it
    Watch other(rules);
    other.run(2s);
    EXPECT_EQ(std::ranges::count(other.events, "clock_unsure"), 1);
}

TEST(WatchEngine, AnEndKeepsTheTripUnderWay)
{
    Watch watch;
    watch.drive(10min);
    watch.engine.finish(watch.time.now);
    ASSERT_EQ(watch.trips.size(), 1U);
    EXPECT_NEAR(watch.trips.at(0).distanceKm, 10, 0.1);
}

TEST(WatchEngine, ConnectsAtOnceAndTakesTheOdometerForTheTrip)
{
    Watch watch;
    watch.car.odometer = 4711;
    watch.car.answers = true;
    watch.step();
    EXPECT_EQ(watch.car.connects, 1) << "no pause is over yet, for none was made";
    watch.drive(20min);
    watch.engine.finish(watch.time.now);
    ASSERT_EQ(watch.trips.size(), 1U);
    EXPECT_EQ(watch.trips[0].odometerKm, 0.0) << "told, and the same all the way";
}

} // namespace
