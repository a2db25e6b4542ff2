#include "program/view/live/livetable.h"
#include "tests/program/view/liveparameter.h"

#include <gtest/gtest.h>

#include <cmath>

namespace {

using std::chrono::milliseconds;
using std::chrono::seconds;
using support::liveParameter;
using support::liveValue;
using velmora::cli::LiveRow;
using velmora::cli::LiveTable;
using velmora::cli::LiveTime;

class Live : public testing::Test
{
protected:
    Live()
    {
        table.select({liveParameter(0x0C, "Engine RPM", {""}, true, UnitRpm),
                      liveParameter(0x06, "Fuel Trim", {"Bank 1", "Bank 3"}),
                      liveParameter(0x03, "Fuel system", {""}, false, UnitNone)});
    }

    void rpm(std::string const& text) { table.update(0x0C, {liveValue(120, text)}, now); }
    void trim(std::string const& text) { table.update(0x06, {liveValue(60, text)}, now); }
    void fuel() { table.update(0x03, {std::make_shared<obd::SensorValueDataModel>(30, "Open loop")}, now); }

    LiveTime now = LiveTime() + seconds(1000);
    LiveTable table;
};

TEST_F(Live, HasARowForEachSensor)
{
    ASSERT_EQ(table.rows().size(), 4U);
    EXPECT_EQ(table.rows()[0].name, "Engine RPM");
    EXPECT_EQ(table.rows()[0].unit, "rpm");
    EXPECT_EQ(table.rows()[1].name, "Fuel Trim: Bank 1");
    EXPECT_EQ(table.rows()[2].name, "Fuel Trim: Bank 3");
    EXPECT_FALSE(table.rows()[3].numeric);
    EXPECT_EQ(table.rowsOf(0x06).size(), 2U);
    EXPECT_EQ(nameWithUnit(table.rows()[0]), "Engine RPM (rpm)");
    EXPECT_EQ(nameWithUnit(table.rows()[3]), "Fuel system");
}

TEST_F(Live, GivesDigitsWithAUnitAndAnglesTheirSign)
{
    table.select({liveParameter(0x1F, "Run time", {""}, false, UnitSecond),
                  liveParameter(0x0E, "Timing advance", {""}, true, UnitNone),
                  liveParameter(0x5D, "Injection timing", {""}, true, UnitNone),
                  liveParameter(0x44, "Ratio", {""}, true, UnitNone)});
    EXPECT_TRUE(table.rows()[0].numeric);
    EXPECT_EQ(table.rows()[0].unit, "s");
    EXPECT_EQ(table.rows()[1].unit, "°");
    EXPECT_EQ(table.rows()[2].unit, "°");
    EXPECT_EQ(table.rows()[3].unit, "");
}

TEST_F(Live, TellsTheGallonsApart)
{
    table.select({liveParameter(0xF4, "Consumption", {""}, true, UnitConsumptionImperial, velmora::Units::ImperialUk)});
    EXPECT_EQ(table.rows()[0].unit, "mpg (UK)");
    table.select({liveParameter(0xF4, "Consumption", {""}, true, UnitConsumptionImperial, velmora::Units::Imperial)});
    EXPECT_EQ(table.rows()[0].unit, "mpg");
}

TEST_F(Live, KeepsTheReadingAndItsStatistics)
{
    table.update(0x0C, {std::make_shared<obd::SensorValueDataModel>(120, "800", "700", "900", "850")}, now);
    LiveRow const& row = table.rows()[0];
    EXPECT_EQ(row.value, "800");
    EXPECT_EQ(row.minimum, "700");
    EXPECT_EQ(row.maximum, "900");
    EXPECT_EQ(row.mean, "850");
}

TEST_F(Live, ASensorThatIsNotAmongTheValuesHasNone)
{
    table.update(0x06, {liveValue(60, "1.0"), liveValue(61, "2.0")}, now);
    EXPECT_EQ(table.rows()[2].value, "2.0");
    trim("3.0");
    EXPECT_EQ(table.rows()[1].value, "3.0");
    EXPECT_EQ(table.rows()[2].value, "");
}

TEST_F(Live, ARoundEndsWhenAllHaveHadTheirTurn)
{
    rpm("700");
    trim("0.0");
    EXPECT_EQ(table.rounds(), 0U);
    EXPECT_TRUE(table.beginsRound(0x0C));
    fuel();
    EXPECT_EQ(table.rounds(), 1U);
    EXPECT_FALSE(table.beginsRound(0x0C));
    EXPECT_EQ(table.readings(), 3U);
}

TEST_F(Live, ASensorThatDoesNotAnswerDoesNotHoldTheRoundUp)
{
    rpm("700");
    trim("0.0");
    rpm("701");
    EXPECT_EQ(table.rounds(), 1U);
    trim("0.0");
    rpm("702");
    EXPECT_EQ(table.rounds(), 2U);
}

TEST_F(Live, OldValuesAreForgotten)
{
    rpm("700");
    now += seconds(2);
    table.expire(now);
    EXPECT_EQ(table.rows()[0].value, "700");
    trim("0.0");
    rpm("701");
    now += seconds(30);
    table.expire(now);
    EXPECT_EQ(table.rows()[0].value, "");
    EXPECT_EQ(table.rows()[0].maximum, "701");
    EXPECT_EQ(table.rows()[0].last, "701") << "what it was can still be told";
    rpm("702");
    EXPECT_EQ(table.rows()[0].last, "");
}

TEST_F(Live, ValuesOfASlowBusAreNot)
{
    rpm("700");
    now += seconds(4);
    trim("0.0");
    now += seconds(4);
    table.expire(now);
    EXPECT_EQ(table.rows()[0].value, "700");
}

TEST_F(Live, TheTrendHasFiniteNumbersOnly)
{
    for (char const* text : {"inf", "7.5", "nan", "-inf", "8.5"}) {
        rpm(text);
        EXPECT_EQ(table.rows()[0].value, text);
        now += seconds(1);
    }
    EXPECT_EQ(table.rows()[0].trend, (std::deque<double>{8.0})) << "one mean of five seconds";
}

TEST_F(Live, TheTrendHasAMeanForEachFiveSecondsOfTheLastMinutes)
{
    for (int i = 0; i < 20; ++i) {
        rpm(std::to_string(i));
        now += milliseconds(500);
    }
    EXPECT_EQ(table.rows()[0].trend, (std::deque<double>{4.5, 14.5}));
    now += seconds(7);
    rpm("1");
    ASSERT_EQ(table.rows()[0].trend.size(), 4U);
    EXPECT_TRUE(std::isnan(table.rows()[0].trend[2])) << "nothing came";
    for (int i = 0; i < 200; ++i) {
        now += seconds(5);
        rpm(std::to_string(i));
    }
    EXPECT_EQ(table.rows()[0].trend.size(), LiveTable::trendLength);
    EXPECT_EQ(table.rows()[0].trend.back(), 199.0);
    now += std::chrono::hours(1);
    rpm("3");
    EXPECT_EQ(table.rows()[0].trend, (std::deque<double>{3.0})) << "older than all of it";
    fuel();
    EXPECT_TRUE(table.rows()[3].trend.empty());
}

TEST_F(Live, ALimitIsFoundByTheSensorsKey)
{
    std::vector<std::string> asked;
    table.setLimits([&asked](LiveRow const& row) {
        asked.push_back(row.key);
        return velmora::SensorLimit{{}, 6000.0};
    });
    EXPECT_EQ(asked, (std::vector<std::string>{"RPM", "SHORT_FUEL_TRIM_1_1", "SHORT_FUEL_TRIM_1_2", "FUEL_STATUS"}));
    rpm("6000");
    EXPECT_FALSE(table.rows()[0].isOutside());
    rpm("6001");
    EXPECT_TRUE(table.rows()[0].isOutside());
    fuel();
    EXPECT_FALSE(table.rows()[3].isOutside());
}

TEST_F(Live, AParameterThatIsNotSelectedIsNotTaken)
{
    table.update(0x0D, {liveValue(130, "50")}, now);
    EXPECT_EQ(table.readings(), 0U);
}

} // namespace
