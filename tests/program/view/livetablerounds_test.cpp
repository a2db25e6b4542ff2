// Rows of several modules and of signals, and when a value is too old to be shown as one of now.
#include "program/view/live/livetable.h"

#include <gtest/gtest.h>

namespace {

using namespace velmora;
using namespace velmora::cli;
using std::chrono::milliseconds;
using std::chrono::seconds;

LiveSensor sensorOf(unsigned int module, int id, std::string const& name, std::optional<double> hertz = {})
{
    LiveSensor sensor;
    sensor.module = module;
    sensor.id = id;
    sensor.uid = id * 10;
    sensor.key = "KEY_" + name;
    sensor.name = name;
    sensor.unit = "mph";
    sensor.metricUnit = "km/h";
    sensor.hertz = hertz;
    return sensor;
}

LiveTable::Values number(int id, std::string const& text)
{
    return {std::make_shared<obd::SensorValueDataModel>(id * 10, text, "1", "9", "5")};
}

TEST(LiveTableRows, AreNamedByTheirModuleWhereThereAreSeveral)
{
    LiveSensor signal = sensorOf(0x7E9, 3, "Gearbox");
    signal.isSignal = true;
    signal.request = "221E1C";
    LiveSensor derived = signal;
    derived.module = 0;
    derived.name = "Slip";
    LiveTable table;
    table.select({{sensorOf(0x7E8, 12, "RPM")}, {signal}, {derived}});
    ASSERT_EQ(table.rows().size(), 3U);
    EXPECT_EQ(table.rows()[0].name, "7E8 RPM");
    EXPECT_EQ(table.rows()[1].name, "7E9 Gearbox");
    EXPECT_EQ(table.rows()[2].name, "Slip") << "what is worked out of others is no module's";
    EXPECT_EQ(table.rows()[1].key, "KEY_Gearbox");
    EXPECT_EQ(table.rows()[1].request, "221E1C");
    EXPECT_TRUE(table.rows()[1].isSignal);
    EXPECT_EQ(table.rows()[0].unit, "mph");
    EXPECT_EQ(table.rows()[0].metricUnit, "km/h");
    EXPECT_EQ(table.rows()[0].module, 0x7E8U);
    table.select({{sensorOf(0x7E8, 12, "RPM")}, {sensorOf(0x7E8, 13, "Speed")}});
    EXPECT_EQ(table.rows()[0].name, "RPM");
}

TEST(LiveTableRows, ARoundBeginsAnewWithEachChoice)
{
    LiveTable table;
    LiveTable::Parameters const two = {{sensorOf(0x7E8, 12, "RPM")}, {sensorOf(0x7E8, 13, "Speed")}};
    LiveTime const now = LiveTime() + seconds(100);
    table.select(two);
    table.update(12, number(12, "1"), now, 0x7E8);
    EXPECT_TRUE(table.beginsRound(12, 0x7E8));
    table.select(two);
    EXPECT_FALSE(table.beginsRound(12, 0x7E8));
    table.update(12, number(12, "1"), now, 0x7E8);
    EXPECT_EQ(table.rounds(), 0U) << "it has had no turn in this choice";
    table.update(13, number(13, "1"), now, 0x7E8);
    EXPECT_EQ(table.rounds(), 1U);
}

TEST(LiveTableRows, OfTwoModulesKeepApart)
{
    LiveTable table;
    table.select({{sensorOf(0x7E8, 12, "RPM")}, {sensorOf(0x7E9, 12, "RPM")}});
    LiveTime const now = LiveTime() + seconds(100);
    table.update(12, number(12, "800"), now, 0x7E8);
    EXPECT_EQ(table.rows()[0].value, "800");
    EXPECT_EQ(table.rows()[0].updated, now);
    EXPECT_EQ(table.rows()[1].value, "");
    EXPECT_TRUE(table.beginsRound(12, 0x7E8));
    EXPECT_FALSE(table.beginsRound(12, 0x7E9));
    table.update(12, number(12, "700"), now, 0x7E9);
    EXPECT_EQ(table.rounds(), 1U);
    ASSERT_EQ(table.rowsOf(12, 0x7E9).size(), 1U);
    EXPECT_EQ(table.rowsOf(12, 0x7E9).front()->value, "700");
    EXPECT_TRUE(table.rowsOf(13, 0x7E9).empty());
    EXPECT_TRUE(table.rowsOf(12).empty()) << "of no module";
    table.update(13, number(13, "1"), now, 0x7E9);
    EXPECT_EQ(table.readings(), 2U) << "nobody has chosen it";
    table.select({{sensorOf(0x7E8, 13, "Speed")}});
    table.update(12, number(12, "800"), now, 0x7E8);
    EXPECT_EQ(table.readings(), 2U) << "nor is it chosen any more";
    EXPECT_FALSE(table.beginsRound(12, 0x7E8));
}

struct ExpiryCase
{
    char const* what;
    std::optional<double> hertz;
    milliseconds round; // between the first and the second reading
    milliseconds kept;  // behind the last one
};

TEST(LiveTableRows, KeepAValueForTwoSecondsAndThreeRounds)
{
    for (ExpiryCase const& each :
         {ExpiryCase{"rounds of no time", {}, milliseconds(0), milliseconds(2000)},
          ExpiryCase{"rounds of a second", {}, milliseconds(1000), milliseconds(5000)},
          ExpiryCase{"asked for each four seconds", 0.25, milliseconds(1000), milliseconds(14000)},
          ExpiryCase{"asked for ten times a second", 10.0, milliseconds(1000), milliseconds(5000)}}) {
        LiveTable table;
        table.select({{sensorOf(0x7E8, 12, "RPM", each.hertz)}});
        LiveTime now = LiveTime() + seconds(1000);
        table.update(12, number(12, "800"), now, 0x7E8);
        now += each.round;
        table.update(12, number(12, "801"), now, 0x7E8);
        table.expire(now + each.kept);
        EXPECT_EQ(table.rows()[0].value, "801") << each.what;
        table.expire(now + each.kept + milliseconds(1));
        EXPECT_EQ(table.rows()[0].value, "") << each.what;
        EXPECT_EQ(table.rows()[0].last, "801") << each.what;
        table.expire(now + each.kept + milliseconds(2));
        EXPECT_EQ(table.rows()[0].last, "801") << "what it was is told as long as it is gone";
    }
}

TEST(LiveTableRows, ARoundThatBecomesLongerIsMeasuredAsFarAsItHasCome)
{
    LiveTable table;
    table.select({{sensorOf(0x7E8, 12, "RPM")}, {sensorOf(0x7E8, 13, "Speed")}, {sensorOf(0x7E8, 5, "Coolant")}});
    LiveTime now = LiveTime() + seconds(1000);
    for (int id : {12, 13, 5}) {
        table.update(id, number(id, "1"), now, 0x7E8);
    }
    EXPECT_EQ(table.rounds(), 1U);
    table.update(12, number(12, "2"), now, 0x7E8);
    now += seconds(4);
    table.update(13, number(13, "2"), now, 0x7E8);
    table.expire(now + seconds(10));
    EXPECT_EQ(table.rows()[0].value, "2") << "two seconds and three times four, of which four are over";
    table.expire(now + milliseconds(10001));
    EXPECT_EQ(table.rows()[0].value, "");
    EXPECT_EQ(table.rows()[1].value, "2");
}

TEST(LiveTableRows, TrendsAreMeansOfFiveSeconds)
{
    LiveTable table;
    table.select({{sensorOf(0x7E8, 12, "RPM")}});
    LiveTime const begin = LiveTime() + seconds(1000);
    auto const at = [&](milliseconds time, char const* text) {
        table.update(12, number(12, text), begin + time, 0x7E8);
    };
    at(milliseconds(0), "10");
    at(milliseconds(4999), "40");
    EXPECT_EQ(table.rows()[0].trend, (std::deque<double>{25}));
    at(milliseconds(4999), "70");
    EXPECT_EQ(table.rows()[0].trend, (std::deque<double>{40}));
    at(milliseconds(5000), "7");
    EXPECT_EQ(table.rows()[0].trend, (std::deque<double>{40, 7}));
    at(milliseconds(9999), "9");
    at(milliseconds(10000), "3");
    EXPECT_EQ(table.rows()[0].trend, (std::deque<double>{40, 8, 3}));
    at(seconds(10 + 299), "1");
    EXPECT_EQ(table.rows()[0].trend.size(), LiveTable::trendLength);
    EXPECT_EQ(table.rows()[0].trend.back(), 1);
    EXPECT_EQ(table.rows()[0].trend.front(), 3) << "sixty of them: the oldest have gone";
    at(seconds(305 + 300), "2");
    EXPECT_EQ(table.rows()[0].trend, (std::deque<double>{2})) << "older than all of it";
}

} // namespace
