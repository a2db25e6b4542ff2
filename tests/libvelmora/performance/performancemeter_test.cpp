#include "libvelmora/performance/performancejson.h"
#include "libvelmora/performance/performancemeter.h"
#include "libvelmora/performance/sprint.h"

#include <gtest/gtest.h>

#include <cmath>

namespace {

using namespace velmora;

// What a vehicle that gains speed evenly tells: whole km/h, cut off, so many times a second.
void drive(PerformanceMeter& meter, double start, double gain, double end, double interval)
{
    for (double now = 0.0; now < start + end; now += interval) {
        meter.addSpeed(now, now < start ? 0.0 : std::floor((now - start) * gain));
    }
}

std::optional<SprintTime> sprint(PerformanceMeter const& meter, std::size_t goal, bool imperial = false)
{
    return timeOf(sprintGoals(imperial)[goal], meter.points(), meter.interval());
}

TEST(Sprint, TimesAreTrueWithinTheErrorThatIsTold)
{
    for (double const gain : {4.0, 10.0, 25.0}) {
        for (double const interval : {0.03, 0.06, 0.2}) {
            PerformanceMeter meter;
            drive(meter, 5.013, gain, 130.0 / gain, interval);
            std::optional<SprintTime> const time = sprint(meter, 0);
            ASSERT_TRUE(time) << gain;
            EXPECT_NEAR(time->errorSeconds, 1.0 / gain + interval, 0.15 * time->errorSeconds);
            EXPECT_NEAR(time->seconds, 100.0 / gain, time->errorSeconds) << gain << " " << interval;
            EXPECT_NEAR(sprint(meter, 1)->seconds, 40.0 / gain, sprint(meter, 1)->errorSeconds);
            EXPECT_NEAR(sprint(meter, 0, true)->seconds, 96.56 / gain, time->errorSeconds);
        }
    }
}

TEST(Sprint, AModuleThatRenewsItsSpeedTwiceASecondIsTimedByItsChanges)
{
    PerformanceMeter meter;
    for (int i = 0; i < 500; ++i) {
        double const now = i * 0.04;
        double const renewed = std::floor(now / 0.5) * 0.5; // what it tells is of then
        meter.addSpeed(now, renewed < 3.0 ? 0.0 : std::floor((renewed - 3.0) * 8.0));
    }
    EXPECT_NEAR(sprint(meter, 0)->seconds, 12.5, 0.3);
}

TEST(Sprint, TheQuarterMileIsTheIntegralOfTheSpeed)
{
    PerformanceMeter meter;
    drive(meter, 1.0, 10.0, 20.0, 0.05); // 2.78 m/s2
    double const seconds = std::sqrt(2.0 * 402.336 / (10.0 / 3.6));
    ASSERT_TRUE(sprint(meter, 2));
    EXPECT_NEAR(sprint(meter, 2)->seconds, seconds, 0.1);
    EXPECT_NEAR(sprint(meter, 2)->endKmh, 10.0 * seconds, 2.0);
    EXPECT_NEAR(distanceOf({{0.0, 0.0}, {10.0, 36.0}, {20.0, 36.0}}), 150.0, 1e-9);
    EXPECT_NEAR(timeOf({"", 0.0, {}, 50.0}, {{0.0, 0.0}, {10.0, 36.0}}, 0.1)->seconds, 10.0, 1e-9);
    EXPECT_NEAR(timeOf({"", 0.0, {}, 12.5}, {{0.0, 0.0}, {10.0, 36.0}}, 0.1)->seconds, 5.0, 1e-9);
}

TEST(Sprint, ASteadySpeedIsNoSlowRise)
{
    PerformanceMeter meter;
    meter.addSpeed(0.0, 0.0);
    meter.addSpeed(0.1, 36.0);
    for (int i = 2; i <= 100; ++i) {
        meter.addSpeed(i * 0.1, 36.0);
    }
    EXPECT_NEAR(distanceOf(meter.points()), 99.5, 0.1) << "up to the last reading";
    meter.addSpeed(10.1, 37.0);
    EXPECT_NEAR(distanceOf(meter.points()), 100.5, 0.1);
}

TEST(Sprint, NothingIsTimedThatDidNotHappen)
{
    PerformanceMeter moving;
    for (int i = 0; i < 200; ++i) {
        moving.addSpeed(i * 0.1, 50.0 + i);
    }
    EXPECT_EQ(moving.state(), RunState::Moving);
    EXPECT_FALSE(sprint(moving, 0)) << "nobody saw it start";
    PerformanceMeter slow;
    drive(slow, 1.0, 10.0, 9.0, 0.1);
    EXPECT_FALSE(sprint(slow, 0)) << "90 km/h";
    EXPECT_FALSE(sprint(slow, 1));
    EXPECT_FALSE(timeOf(sprintGoals(false)[0], {}, 0.1));
}

TEST(PerformanceMeter, EachStartIsARunOfItsOwn)
{
    PerformanceMeter meter;
    EXPECT_EQ(meter.state(), RunState::Moving);
    drive(meter, 2.0, 10.0, 11.0, 0.1);
    EXPECT_EQ(meter.state(), RunState::Running);
    meter.addPower(2510.0, 40.0, 150.0);
    meter.addPower(2600.0, 50.0, 180.0);
    meter.addPower(2700.0, 45.0, 160.0);
    meter.addPower(900.0, 0.0, 0.0);
    ASSERT_EQ(meter.powers().size(), 1U) << "one step of 250 rpm, and none without power";
    EXPECT_EQ(meter.powers()[0].rpm, 2625.0);
    EXPECT_EQ(meter.powers()[0].kilowatt, 50.0);
    EXPECT_EQ(meter.powers()[0].newtonMetre, 180.0);
    meter.addSpeed(14.0, 0.0);
    EXPECT_EQ(meter.state(), RunState::Stopped);
    EXPECT_TRUE(sprint(meter, 0)) << "the time stays";
    meter.addSpeed(15.0, 0.0);
    meter.addSpeed(15.1, 3.0);
    EXPECT_EQ(meter.state(), RunState::Running);
    EXPECT_FALSE(sprint(meter, 0));
    EXPECT_TRUE(meter.powers().empty());
}

TEST(PerformanceMeter, IsExportedWhole)
{
    PerformanceMeter meter;
    drive(meter, 1.0, 20.0, 6.0, 0.05);
    meter.addPower(3000.0, 61.26, 195.0);
    Json const json = performanceJson(meter.run(1500), sprintGoals(false));
    EXPECT_EQ(json["weight_kg"], 1500);
    EXPECT_EQ(json["goals"][0]["name"], "0 to 100 km/h");
    EXPECT_NEAR(json["goals"][0]["seconds"].get<double>(), 5.0, 0.11);
    EXPECT_TRUE(json["goals"][2]["seconds"].is_null());
    EXPECT_EQ(json["power"], Json::parse(R"([{"rpm":3125.0,"kw":61.3,"nm":195.0}])"));
    EXPECT_EQ(json["speed"][0], Json::parse(R"({"s":0.0,"kmh":0.0})"));
}

} // namespace
