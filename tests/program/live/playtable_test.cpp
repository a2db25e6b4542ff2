#include "libvelmora/replay/recordingfile.h"
#include "program/live/playtable.h"
#include "program/view/live/timebar.h"

#include <gtest/gtest.h>

#include <sstream>

namespace {

using namespace velmora;
using namespace velmora::cli;

class PlayTableTest : public testing::Test
{
protected:
    static Recording read()
    {
        std::istringstream in("time,7E8 RPM (rpm),7E8 MAP (kPa),7E8 STATE\n"
                              "2024-03-07T09:05:00.000Z,800,30.5,on\n"
                              "2024-03-07T09:05:01.000Z,1000,30,-\n"
                              "2024-03-07T09:05:02.000Z,-,31.25,off\n");
        return readCsv(in);
    }
    void play(std::size_t values)
    {
        for (RecordedSensor const& each : recording.sensors) {
            auto const number = static_cast<std::size_t>(&each - recording.sensors.data());
            for (std::size_t i = 0; i < values; ++i) {
                table.take(number, each.values[i]);
            }
        }
    }

    Recording const recording = read();
    PlayTable table{recording};
};

TEST_F(PlayTableTest, ShowsValuesWithTheirDigitsAndStatistics)
{
    play(2);
    ASSERT_EQ(table.rows().size(), 3U);
    LiveRow const& rpm = table.rows()[0];
    EXPECT_EQ(rpm.value, "1000");
    EXPECT_EQ(rpm.minimum, "800");
    EXPECT_EQ(rpm.mean, "900");
    EXPECT_EQ(rpm.maximum, "1000");
    EXPECT_EQ(rpm.unit, "rpm");
    EXPECT_EQ(rpm.key, "RPM");
    EXPECT_EQ(table.rows()[1].value, "30.00") << "as many digits as the recording has";
    EXPECT_EQ(table.rows()[2].value, "");
    EXPECT_EQ(table.rows()[2].last, "on");
    EXPECT_FALSE(table.rows()[2].numeric);
}

TEST_F(PlayTableTest, StatisticsBeginWithTheFirstValue)
{
    for (double const number : {-5.0, -9.0, -7.0}) {
        table.take(0, {recording.begin, number});
    }
    EXPECT_EQ(table.rows()[0].minimum, "-9");
    EXPECT_EQ(table.rows()[0].mean, "-7");
    EXPECT_EQ(table.rows()[0].maximum, "-5");
}

TEST_F(PlayTableTest, AValueGrowsOldByTheRecordingsTime)
{
    play(3);
    EXPECT_EQ(table.rows()[0].value, "") << "it says itself that there was none";
    EXPECT_EQ(table.rows()[0].last, "1000");
    table.expire(recording.end + 3000);
    EXPECT_EQ(table.rows()[1].value, "31.25");
    table.expire(recording.end + 60000);
    EXPECT_EQ(table.rows()[1].value, "");
    EXPECT_EQ(table.rows()[1].last, "31.25");
}

TEST_F(PlayTableTest, TakesWhatIsChosenInItsOrder)
{
    table.select({2, 0});
    play(1);
    ASSERT_EQ(table.rows().size(), 2U);
    EXPECT_EQ(table.rows()[0].value, "on");
    EXPECT_EQ(table.rows()[1].value, "800");
    table.restart();
    EXPECT_EQ(table.rows()[1].value, "");
}

TEST(TimeBar, StandsWhereTheRecordingDoes)
{
    EXPECT_EQ(timeBar(12000, 0, 24000, 10), "0:12 [=====.....] 0:24");
    EXPECT_EQ(timeBar(0, 0, 3600000, 4), "0:00 [....] 1:00:00");
    EXPECT_EQ(timeBar(5, 5, 5, 4), "0:00 [====] 0:00");
}

} // namespace
