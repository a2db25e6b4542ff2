#include "tests/libvelmora/watch/drivencar.h"

namespace {

using namespace std::chrono_literals;
using testing::Contains;
using testing::ElementsAre;
using Watch = velmora::test::DrivenWatch;

TEST(WatchEngineParked, ADayCostsAParkedCarNotASingleRequest)
{
    Watch watch;
    watch.drive(30min);
    EXPECT_THAT(watch.events, ElementsAre("ignition_on", "engine_start"));
    EXPECT_GT(watch.readings, 3500);
    watch.run(120s + 5s); // the ignition stays on for a while
    EXPECT_THAT(watch.events, Contains("asleep"));
    watch.car.answers = false;
    std::uint64_t const before = watch.car.asked;
    for (int hour = 0; hour < 8; ++hour) {
        watch.run(30min);
        watch.car.battery = 12.8 - hour / 20.0; // the surface charge goes
        watch.run(30min);
    }
    EXPECT_EQ(watch.car.asked, before);
    EXPECT_EQ(watch.engine.state(), "parked");
    EXPECT_NEAR(watch.car.voltLooks, 478, 2);
    EXPECT_EQ(watch.trips.size(), 1U);
    EXPECT_NEAR(watch.trips.at(0).distanceKm, 30, 0.1);
    watch.events.clear();
    watch.drive(30min);
    watch.run(10min);
    EXPECT_THAT(watch.events,
                ElementsAre("awake", "ignition_on", "engine_start", "engine_stop", "ignition_off", "asleep", "trip"));
    ASSERT_EQ(watch.trips.size(), 2U);
    EXPECT_NEAR(watch.trips.at(1).distanceKm, 30, 1.1); // noticed at the next look
    EXPECT_EQ(watch.car.connects, 1);
}

TEST(WatchEngineParked, ASleepingCarIsNoError)
{
    Watch watch;
    watch.car.answers = false;
    watch.run(1h);
    EXPECT_EQ(watch.car.connects, 1);
    EXPECT_EQ(watch.engine.state(), "parked");
    EXPECT_GT(watch.car.voltLooks, 50);
    watch.car.battery = 12.2;
    watch.car.answers = true;
    watch.car.rpm = 800;
    watch.run(70s);
    EXPECT_EQ(watch.engine.state(), "running");
}

TEST(WatchEngineParked, ALinkLostWhileParkedComesBackWithoutARequest)
{
    Watch watch;
    watch.drive(2min);
    watch.run(10min);
    watch.car.answers = false;
    std::uint64_t const before = watch.car.asked;
    watch.car.plugged = false;
    watch.run(1h);
    EXPECT_EQ(watch.events.back(), "link_lost");
    watch.car.plugged = true;
    watch.run(1h);
    EXPECT_EQ(watch.events.back(), "link_back");
    EXPECT_EQ(watch.car.asked, before);
    EXPECT_EQ(watch.car.connects, 1);
}

TEST(WatchEngineParked, ALowBatteryIsToldAndThatItHasRecovered)
{
    Watch watch;
    watch.drive(2min);
    watch.run(5min);
    watch.events.clear();
    watch.car.answers = false;
    watch.car.battery = 12.0;
    watch.run(5min);
    EXPECT_THAT(watch.events, ElementsAre("voltage_low"));
    watch.car.battery = 12.3;
    watch.run(65s);
    EXPECT_THAT(watch.events, Contains("voltage_good"));
}

TEST(WatchEngineParked, AProbeIsMadeOnlyIfToldAndIsCounted)
{
    velmora::WatchRules rules;
    rules.battery.wakeEvery = 30min;
    Watch watch(rules);
    watch.car.answers = false;
    watch.run(10min);
    std::uint64_t const before = watch.car.asked;
    watch.run(3h);
    EXPECT_EQ(watch.car.asked, before + 6);
    EXPECT_EQ(watch.engine.health().wakeRequests, 6U);
    watch.car.answers = true;
    watch.run(31min);
    EXPECT_THAT(watch.events, Contains("ignition_on"));
}

TEST(WatchEngineParked, AnAdapterThatSleepsIsLeftAloneUntilItWakes)
{
    velmora::WatchRules rules;
    rules.battery.adapterSleep = true;
    Watch watch(rules);
    watch.drive(2min);
    watch.car.answers = false;
    watch.run(8h);
    EXPECT_EQ(watch.car.naps, 1);
    EXPECT_EQ(watch.car.voltLooks, 0);
    EXPECT_EQ(watch.events.back(), "adapter_asleep");
    watch.car.woken = true;
    watch.drive(2min);
    EXPECT_EQ(watch.engine.state(), "running");
    EXPECT_EQ(watch.car.connects, 2);
    watch.car.canNap = false;
    watch.run(1h);
    EXPECT_EQ(watch.car.naps, 2);
    EXPECT_GT(watch.car.voltLooks, 50); // one that knows no sleep is asked for the voltage
    EXPECT_THAT(watch.events, Contains("adapter_awake"));
}

} // namespace
