// Runs and their times to the last digit: where a run begins and ends, what counts as steady, and what is no time at
// all.
#include "libobd/connection/velmorasettings.h"
#include "libvelmora/performance/performancejson.h"
#include "libvelmora/performance/performancemeter.h"
#include "libvelmora/performance/powermodel.h"
#include "libvelmora/performance/runboard.h"
#include "libvelmora/performance/sprint.h"
#include "tests/support/fakeclock.h"
#include "tests/support/fakeecu.h"
#include "tests/support/memorysettings.h"

#include <gtest/gtest.h>

#include <cmath>

namespace {

using namespace velmora;

using SprintRun = std::vector<SpeedPoint>;

constexpr double sprintError = 1e-9;

SprintGoal speedGoal(double from, double to)
{
    return {"", from, to, {}};
}

// Seconds and the speed at the end; nothing for no time.
std::optional<std::pair<double, double>> timed(SprintGoal const& goal, SprintRun const& run)
{
    std::optional<SprintTime> const time = timeOf(goal, run, 0.1);
    return time ? std::optional(std::pair(time->seconds, time->endKmh)) : std::nullopt;
}

void expectTimed(SprintGoal const& goal, SprintRun const& run, double seconds, double kmh)
{
    auto const time = timed(goal, run);
    ASSERT_TRUE(time);
    EXPECT_NEAR(time->first, seconds, sprintError);
    EXPECT_NEAR(time->second, kmh, sprintError);
}

TEST(SprintEdges, SpeedsAreMetBetweenTwoReadings)
{
    expectTimed(speedGoal(0, 100), {{1, 0}, {2, 40}, {3, 80}, {4, 120}}, 2.5, 100);
    expectTimed(speedGoal(0, 100), {{1, 0}, {2, 100}}, 1, 100);
    expectTimed(speedGoal(80, 120), {{0, 0}, {1, 60}, {3, 100}, {5, 140}}, 2, 120);
    expectTimed(speedGoal(0, 100), {{0, 0}, {2, 50}, {4, 50}, {6, 100}, {7, 90}, {8, 130}}, 6, 100);
    expectTimed(speedGoal(80, 120), {{0, 0}, {1, 90}, {2, 70}, {3, 90}, {4, 120}}, 1.5, 120);
    EXPECT_FALSE(timed(speedGoal(0, 100), {{0, 0}, {1, 99}}));
    EXPECT_FALSE(timed(speedGoal(0, 100), {{0, 100}, {1, 110}})) << "nobody saw it reach them";
    expectTimed(speedGoal(80, 100), {{0, 100}, {1, 105}, {2, 70}, {4, 110}}, 1, 100);
    EXPECT_FALSE(timed(speedGoal(80, 120), {{0, 90}, {1, 130}}));
    EXPECT_FALSE(timed(speedGoal(0, 100), {{0, 0}}));
}

// Who holds 80 km/h and then accelerates is timed from the end of the hold.
TEST(SprintEdges, ASpeedThatWasHeldIsNoPartOfTheTime)
{
    expectTimed(speedGoal(80, 120), {{0, 0}, {1, 80}, {9, 80}, {11, 120}}, 2, 120);
    expectTimed(speedGoal(80, 120), {{0, 0}, {1, 80}, {3, 120}}, 2, 120);
    PerformanceMeter meter;
    meter.addSpeed(0, 0);
    for (int i = 1; i <= 8; ++i) {
        meter.addSpeed(i, i * 10);
    }
    for (int i = 9; i <= 20; ++i) {
        meter.addSpeed(i, 80);
    }
    for (int i = 1; i <= 5; ++i) {
        meter.addSpeed(20 + i, 80 + i * 10);
    }
    expectTimed(sprintGoals(false)[1], meter.points(), 4, 120);
}

TEST(SprintEdges, AJumpInNoTimeIsNoTime)
{
    EXPECT_FALSE(timed(speedGoal(80, 120), {{0, 0}, {0.5, 90}, {0.8, 50}, {1, 50}, {1, 130}}));
    EXPECT_FALSE(timed(speedGoal(0, 100), {{1, 0}, {1, 120}}));
}

TEST(SprintEdges, WaysAreMeasuredUnderTheSpeeds)
{
    auto const way = [](double metres) { return SprintGoal{"", 0.0, {}, metres}; };
    SprintRun const rising = {{0, 0}, {10, 36}, {20, 72}}; // 50 m, then 150 m
    expectTimed(way(12.5), rising, 5, 18);
    expectTimed(way(50), rising, 10, 36);
    expectTimed(way(112.5), rising, 15, 54);
    EXPECT_FALSE(timed(way(200.1), rising));
    expectTimed(way(16.25), {{0, 0}, {1, 36}, {3, 0}, {5, 0}, {6, 36}}, 5.5, 18);
    EXPECT_FALSE(timed(way(0), rising)) << "no way at all";
    EXPECT_FALSE(timed(way(-1), rising));
    EXPECT_FALSE(timed(way(10), {{0, 36}, {5, 36}})) << "nothing that was accelerated";
    expectTimed(way(10), {{0, 18}, {10, 36}}, std::sqrt(25.0 / 0.25 + 2 * 10 / 0.5) - 10.0,
                3.6 * std::sqrt(25.0 + 2 * 0.5 * 10));
}

// The points behind its end, which were dropped, are no part of a run.
TEST(SprintEdges, EndWithTheRun)
{
    auto const without = [](SprintRun run) {
        run.pop_back();
        return run;
    };
    EXPECT_FALSE(timed(speedGoal(0, 100), without({{0, 0}, {1, 90}, {2, 130}})));
    expectTimed(speedGoal(80, 120), without({{0, 0}, {1, 130}, {2, 50}, {-5, 130}}), 40.0 / 130.0, 120);
    EXPECT_FALSE(timed({"", 0.0, {}, 10.0}, without({{0, 0}, {1, 36}, {9, 36}})));
    EXPECT_NEAR(distanceOf(without({{0, 0}, {1, 36}, {9, 36}})), 5.0, sprintError);
}

TEST(SprintEdges, TellHowWrongTheyMayBe)
{
    std::optional<SprintTime> const time = timeOf(speedGoal(0, 100), {{0, 0}, {4, 100}}, 0.2);
    ASSERT_TRUE(time);
    EXPECT_NEAR(time->errorSeconds, 1.0 / 25.0 + 0.2, sprintError) << "one km/h, and one reading";
}

TEST(PerformanceMeterEdges, TheStartLiesWhereTheFirstSpeedsPointTo)
{
    auto const start = [](double stood, SpeedPoint const& first, SpeedPoint const& second) {
        PerformanceMeter meter;
        meter.addSpeed(stood - 5.0, 0.0);
        meter.addSpeed(stood, 0.0);
        meter.addSpeed(first.seconds, first.kmh);
        meter.addSpeed(second.seconds, second.kmh);
        EXPECT_EQ(meter.points().size(), 3U);
        return meter.points()[0].seconds;
    };
    EXPECT_NEAR(start(10.0, {10.3, 2}, {10.5, 6}), 10.2, sprintError);
    EXPECT_NEAR(start(10.0, {10.1, 30}, {10.3, 31}), 9.8, sprintError)
        << "a step before it was seen standing at the most";
    EXPECT_NEAR(start(10.0, {10.1, 30}, {10.9, 31}), 9.5, sprintError) << "or half a second";
    EXPECT_NEAR(start(10.0, {13.0, 5}, {13.1, 3}), 11.0, sprintError)
        << "two seconds before the first speed, as it slows down";
    EXPECT_NEAR(start(10.0, {11.0, 5}, {11.0, 8}), 10.0, sprintError) << "two speeds at one time point nowhere";
    EXPECT_NEAR(start(10.0, {11.0, 5}, {11.5, 3}), 10.0, sprintError);
}

TEST(PerformanceMeterEdges, StandingIsToldFromHavingStopped)
{
    PerformanceMeter meter;
    for (auto const& [kmh, state] : std::vector<std::pair<double, RunState>>{{0.0, RunState::Standing},
                                                                             {0.0, RunState::Standing},
                                                                             {5.0, RunState::Running},
                                                                             {0.0, RunState::Stopped},
                                                                             {0.0, RunState::Stopped}}) {
        meter.addSpeed(1.0, kmh);
        EXPECT_EQ(meter.state(), state);
    }
}

TEST(PerformanceMeterEdges, ReadingsComeSoManySecondsApart)
{
    PerformanceMeter meter;
    EXPECT_EQ(meter.interval(), 0.0);
    meter.addSpeed(4.0, 0.0);
    meter.addSpeed(5.0, 10.0);
    EXPECT_EQ(meter.interval(), 0.0) << "one reading";
    meter.addSpeed(5.5, 10.0);
    EXPECT_NEAR(meter.interval(), 0.5, sprintError);
    meter.addSpeed(5.6, 11.0);
    EXPECT_NEAR(meter.interval(), 0.3, sprintError);
    EXPECT_EQ(meter.kmh(), 11.0);
    meter.addSpeed(8.6, 0.0);
    EXPECT_NEAR(meter.interval(), 1.2, sprintError);
    meter.addSpeed(9.0, 7.0);
    EXPECT_EQ(meter.interval(), 0.0) << "a run of its own";
}

TEST(PerformanceMeterEdges, ASpeedIsSteadyAfterMoreThanASecond)
{
    auto const points = [](double last) {
        PerformanceMeter meter;
        meter.addSpeed(0.0, 0.0);
        meter.addSpeed(1.0, 10.0);
        meter.addSpeed(last, 10.0);
        std::size_t const running = meter.points().size();
        meter.addSpeed(last + 0.5, 11.0);
        std::size_t const risen = meter.points().size();
        meter.addSpeed(last + 1.0, 11.0);
        meter.addSpeed(last + 9.0, 0.0);
        meter.addSpeed(last + 20.0, 0.0);
        return std::to_string(running) + " " + std::to_string(risen) + " " + std::to_string(meter.points().size());
    };
    EXPECT_EQ(points(2.0), "2 3 4");
    EXPECT_EQ(points(2.125), "3 4 5");
}

TEST(PerformanceMeterEdges, ARunHasFiveThousandPoints)
{
    PerformanceMeter meter;
    meter.addSpeed(0.0, 0.0);
    for (int i = 1; i <= 5500; ++i) {
        meter.addSpeed(i * 0.001, 10.0 + i % 2);
    }
    EXPECT_EQ(meter.points().size(), 5000U);
}

TEST(PerformanceMeterEdges, PowerIsTakenOfARunAlone)
{
    PerformanceMeter meter;
    meter.addPower(2500.0, 40.0, 150.0);
    meter.addSpeed(0.0, 0.0);
    meter.addPower(2500.0, 40.0, 150.0);
    EXPECT_TRUE(meter.powers().empty());
    meter.addSpeed(1.0, 10.0);
    meter.addPower(0.0, 40.0, 150.0);
    meter.addPower(2500.0, 0.0, 150.0);
    EXPECT_TRUE(meter.powers().empty());
    meter.addPower(2500.0, 40.0, 150.0);
    meter.addPower(2749.0, 40.0, 140.0);
    meter.addPower(2499.0, 30.0, 110.0);
    std::vector<PowerPoint> const powers = meter.powers();
    ASSERT_EQ(powers.size(), 2U);
    EXPECT_EQ(powers[0].rpm, 2375.0);
    EXPECT_EQ(powers[1].rpm, 2625.0);
    EXPECT_EQ(powers[1].newtonMetre, 150.0) << "the first of equal ones";
    EXPECT_EQ(stateText(RunState::Moving), "stand still to be ready");
    EXPECT_EQ(stateText(RunState::Standing), "standing, ready");
    EXPECT_EQ(stateText(RunState::Stopped), "standing, ready for the next run");
}

TEST(PerformanceMeterEdges, AreExportedRounded)
{
    PerformanceRun run{RunState::Running, 100, {{10, 0}, {14.0004, 100}}, 0.2004, {}, 1500};
    Json const json = performanceJson(run, {speedGoal(0, 100), speedGoal(0, 200)});
    EXPECT_EQ(json["goals"][0].dump(), R"({"name":"","seconds":4.0,"error_s":0.24,"end_kmh":100.0})");
    EXPECT_EQ(json["goals"][1].dump(), R"({"name":"","seconds":null,"error_s":null,"end_kmh":null})");
    EXPECT_EQ(json["interval_s"], 0.2);
    EXPECT_EQ(json["distance_m"], 55.6);
    EXPECT_EQ(json["speed"][1].dump(), R"({"s":4.0,"kmh":100.0})");
    EXPECT_EQ(json["state"], "running");
    EXPECT_EQ(allSprintGoals().size(), 4U);
    EXPECT_EQ(allSprintGoals()[3].name, sprintGoals(true)[2].name);
}

Reading boardReading(unsigned int module, std::vector<unsigned char> const& raw, int millis)
{
    Reading reading;
    reading.time = std::chrono::system_clock::time_point(std::chrono::milliseconds(millis));
    reading.module = module;
    reading.raw = raw;
    return reading;
}

TEST(RunBoard, ShowsTheRunsOfOneModuleAfterTheOther)
{
    support::FakeClock clock;
    auto const ecu = [](unsigned int id) {
        auto made = std::make_shared<support::FakeEcu>(id);
        made->setSupported(obd::ObdMode::CurrentData, {0x0C, 0x0D});
        return made;
    };
    obd::VelmoraSettings const settings{std::make_shared<support::MemorySettings>()};
    RunBoard board;
    EXPECT_FALSE(board.takeChange());
    EXPECT_FALSE(board.isActive());
    EXPECT_TRUE(board.state(true).is_null());
    board.begin(ecu(0x7E8), settings);
    EXPECT_TRUE(board.isActive());
    EXPECT_TRUE(board.takeChange());
    EXPECT_FALSE(board.takeChange()) << "told once";
    board.take(boardReading(0x7E9, {0x41, 0x0D, 0}, 0));
    board.take(boardReading(0x7E8, {0x41, 0x0C, 0x1A, 0xF8}, 0));
    EXPECT_FALSE(board.takeChange()) << "neither another module's speed nor this one's engine speed";
    board.take(boardReading(0x7E8, {0x41, 0x0D, 0}, 100));
    EXPECT_TRUE(board.takeChange());
    board.take(boardReading(0x7E8, {0x41, 0x0D, 50}, 1000));
    EXPECT_EQ(board.state(true)["speed"].size(), 2U);
    EXPECT_FALSE(board.state(false).contains("speed"));
    EXPECT_EQ(board.state(false)["kmh"], 50);
    EXPECT_EQ(board.state(false)["weight_kg"], 1500);
    EXPECT_EQ(board.state(false)["active"], true);
    for (int i = 1; i <= 20; ++i) {
        clock.advance(500);
        board.take(boardReading(0x7E8, {0x41, 0x0C, 0x2E, 0xE0}, 1000 + i * 500));
        board.take(boardReading(0x7E8, {0x41, 0x0D, static_cast<unsigned char>(50 + i)}, 1000 + i * 500));
    }
    EXPECT_EQ(board.state(false)["power"][0]["rpm"], 3125.0) << board.state(false).dump();
    board.takeChange();
    board.end();
    EXPECT_TRUE(board.takeChange());
    EXPECT_EQ(board.state(false)["active"], false);
    board.take(boardReading(0x7E8, {0x41, 0x0D, 60}, 20000));
    EXPECT_EQ(board.state(false)["kmh"], 70) << "it has ended";
    board.begin(ecu(0x7E9), settings);
    EXPECT_EQ(board.state(false)["kmh"], 0) << "forgets what was before";
    EXPECT_EQ(board.state(false)["state"], "stand still to be ready");
    EXPECT_TRUE(board.state(false)["power"].empty());
    board.take(boardReading(0x7E9, {0x41, 0x0D, 71}, 30000));
    EXPECT_EQ(board.state(false)["kmh"], 71);
}

TEST(PowerModelReadings, AreWholeRepliesOfTheirPid)
{
    auto const speed = [](std::vector<unsigned char> const& raw) { return speedIn(boardReading(1, raw, 0)); };
    auto const engine = [](std::vector<unsigned char> const& raw) { return engineSpeedIn(boardReading(1, raw, 0)); };
    EXPECT_EQ(speed({0x41, 0x0D, 50}), 50.0);
    EXPECT_EQ(speed({0x41, 0x0D, 50, 0}), 50.0) << "with filling";
    EXPECT_EQ(speed({0x41, 0x0D}), std::nullopt);
    EXPECT_EQ(speed({0x42, 0x0D, 50}), std::nullopt) << "of a freeze frame";
    EXPECT_EQ(speed({0x41, 0x0C, 50}), std::nullopt);
    EXPECT_EQ(engine({0x41, 0x0C, 0x1A, 0xF8}), 1726.0);
    EXPECT_EQ(engine({0x41, 0x0C, 0x1A}), std::nullopt);
    EXPECT_EQ(engine({0x7F, 0x0C, 0x1A, 0xF8}), std::nullopt);
}

TEST(PowerModelReadings, GiveNoPowerWithoutAnEngineSpeed)
{
    support::FakeClock clock;
    auto const ecu = std::make_shared<support::FakeEcu>(0x7E8);
    ecu->setSupported(obd::ObdMode::CurrentData, {0x0D});
    obd::VelmoraSettings const settings{std::make_shared<support::MemorySettings>()};
    PowerModel model(ecu, settings);
    for (int i = 0; i < 10; ++i) {
        clock.advance(1000);
        EXPECT_FALSE(model.take(boardReading(0x7E8, {0x41, 0x0D, static_cast<unsigned char>(i)}, i * 1000)));
    }
}

TEST(PowerModelReadings, AreNotDelayedByASpeedBeforeTheFirstEngineSpeed)
{
    auto const firstOutput = [](bool early) {
        support::FakeClock clock;
        auto const ecu = std::make_shared<support::FakeEcu>(0x7E8);
        ecu->setSupported(obd::ObdMode::CurrentData, {0x0C, 0x0D});
        obd::VelmoraSettings const settings{std::make_shared<support::MemorySettings>()};
        PowerModel model(ecu, settings);
        if (early) {
            EXPECT_FALSE(model.take(boardReading(0x7E8, {0x41, 0x0D, 36}, 999900)));
        }
        for (int millis = 0; millis < 4000; millis += 100) {
            clock.advance(100);
            auto const kmh = static_cast<unsigned char>(36 + millis / 100);
            model.take(boardReading(0x7E8, {0x41, 0x0C, 0x2E, 0xE0}, 1000000 + millis));
            if (model.take(boardReading(0x7E8, {0x41, 0x0D, kmh}, 1000000 + millis))) {
                return millis;
            }
        }
        return -1;
    };
    EXPECT_EQ(firstOutput(false), 0);
    EXPECT_EQ(firstOutput(true), 0);
}

// The library keeps the last speeds of a module; those of a run before are none of the next.
TEST(PowerModelReadings, BeginAnewWithEachModel)
{
    support::FakeClock clock;
    auto const ecu = std::make_shared<support::FakeEcu>(0x7E8);
    ecu->setSupported(obd::ObdMode::CurrentData, {0x0C, 0x0D});
    obd::VelmoraSettings const settings{std::make_shared<support::MemorySettings>()};
    int millis = 1000000;
    auto const outputs = [&](unsigned char end) {
        PowerModel model(ecu, settings);
        std::string text;
        for (unsigned char kmh = 36; kmh < end; ++kmh) {
            clock.advance(100);
            millis += 100;
            model.take(boardReading(0x7E8, {0x41, 0x0C, 0x2E, 0xE0}, millis));
            if (auto const output = model.take(boardReading(0x7E8, {0x41, 0x0D, kmh}, millis))) {
                text += std::to_string(std::lround(output->kilowatt)) + "/" +
                        std::to_string(std::lround(output->newtonMetre)) + " ";
            }
        }
        return text;
    };
    std::string const first = outputs(70);
    EXPECT_NE(first, "");
    EXPECT_EQ(outputs(70), first) << "though it was at 70 km/h a moment ago";
}

} // namespace
