#include "common/text/text.h"
#include "program/view/live/livehelp.h"
#include "program/view/live/livescreen.h"
#include "program/view/live/sensorpicker.h"
#include "program/view/live/trendline.h"
#include "program/view/unitpairs.h"
#include "tests/program/view/liverows.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>

namespace {

using namespace velmora;
using namespace velmora::cli;
using std::chrono::seconds;
using support::linesOf;
using support::numberRow;
using testing::ElementsAre;
using testing::HasSubstr;

TEST(LiveScreen, DrawsATrend)
{
    EXPECT_EQ(trendLine({0, 1, 2, 3, 4, 5, 6, 7}, 8), "▁▂▃▄▅▆▇█");
    EXPECT_EQ(trendLine({5, 5}, 4), "  ▁▁");
    EXPECT_EQ(trendLine({9, 0, 7}, 2), "▁█");
    EXPECT_EQ(trendLine({-10, -3, -6.5}, 3), "▁█▅");
    EXPECT_EQ(trendLine({}, 3), "   ");
    EXPECT_EQ(trendLine({1, NAN, 2, NAN}, 5), " ▁ █ ") << "a gap stays a gap";
    EXPECT_EQ(trendLine({NAN}, 1), " ");
}

TEST(LiveScreen, NoLineIsWiderThanTheScreenNorTheFrameHigher)
{
    std::vector<LiveRow> rows(30, numberRow("Exhaust Gas Temperature Bank 1: Sensor 3", "-1234.56", "mg/stroke"));
    rows[3].numeric = false;
    rows[3].value = "Closed loop, using oxygen sensor feedback to determine fuel mix, but with a fault";
    for (std::size_t const width : {10U, 30U, 59U, 80U, 120U, 300U}) {
        std::vector<std::string> const frame =
            linesOf(drawTable(rows, 2, std::string(200, 't'), "status", {width, 12}));
        EXPECT_EQ(frame.size(), 12U);
        for (std::string const& line : frame) {
            EXPECT_LE(displayWidth(line), width) << line;
        }
    }
}

TEST(LiveScreen, ShowsValueUnitAndStatistics)
{
    LiveRow row = numberRow("Engine RPM", "1726", "rpm");
    row.minimum = "700";
    row.maximum = "3000";
    std::vector<std::string> const frame = linesOf(drawTable({row}, 0, "title", "status", {80, 24}));
    ASSERT_EQ(frame.size(), 5U);
    EXPECT_EQ(frame[0], "title");
    EXPECT_EQ(frame[1], "Sensor               Value Unit Minimum    Mean Maximum Trend of 120 s");
    EXPECT_THAT(frame[2], HasSubstr("Engine RPM            1726 rpm      700    1726    3000"));
    EXPECT_EQ(frame[4], "status");
}

TEST(LiveScreen, ShowsStatisticsAndTrendWhereThereIsRoom)
{
    std::vector<LiveRow> const rows = {numberRow(std::string(30, 'n'), "1726", "rpm")};
    std::size_t const plain = 18 + std::string(" 1234567 unit").size();
    std::size_t const statistics = plain + 3 * std::string(" Minimum").size();
    std::size_t const all = statistics + 1 + 16;
    auto const heading = [&rows](std::size_t width) { return linesOf(drawTable(rows, 0, "t", "s", {width, 24}))[1]; };
    EXPECT_EQ(heading(plain), "Sensor               Value Unit");
    EXPECT_EQ(heading(statistics - 1), heading(plain).insert(6, 12, ' ')) << "no wider than the longest name";
    EXPECT_EQ(heading(statistics), "Sensor               Value Unit Minimum    Mean Maximum");
    EXPECT_EQ(heading(all), heading(statistics) + " Trend of 80 s");
    EXPECT_EQ(heading(all + 9), heading(all).insert(6, 9, ' ')) << "names come first";
    EXPECT_EQ(heading(all + 16), heading(statistics).insert(6, 12, ' ') + " Trend of 100 s")
        << "the trend has the rest";
    EXPECT_THAT(heading(300), testing::EndsWith(" Trend of 300 s"));
}

TEST(LiveScreen, MarksWhatIsBeyondItsLimit)
{
    LiveRow row = numberRow("Engine RPM", "6120", "rpm");
    row.limit.highest = 6000;
    FrameStyle style;
    EXPECT_THAT(drawTable({row}, 0, "t", "s", style), HasSubstr("Engine RPM           !6120 rpm")) << "without colours";
    style.bold = true;
    EXPECT_THAT(drawTable({row}, 0, "t", "s", style), HasSubstr("\n\033[1mEngine RPM"));
    style.coloured = true;
    EXPECT_THAT(drawTable({row}, 0, "t", "s", style), HasSubstr("\n\033[1;31mEngine RPM"));
    row.value = "6000";
    EXPECT_THAT(drawTable({row}, 0, "t", "s", style), HasSubstr("\nEngine RPM            6000 rpm"));
    row.last = "5990";
    EXPECT_THAT(drawTable({row}, 0, "t", "s", style), HasSubstr("\nEngine RPM            6000 rpm")) << "not dim";
}

TEST(LiveScreen, AValueThatIsGoneIsDimAndTellsItsAge)
{
    LiveRow row = numberRow("Engine RPM", "", "rpm");
    row.last = "1726";
    row.updated = LiveTime() + seconds(100);
    FrameStyle style;
    style.bold = true;
    style.now = LiveTime() + seconds(112);
    std::string const wide = drawTable({row}, 0, "t", "s", style);
    EXPECT_THAT(wide, HasSubstr("\n\033[2mEngine RPM            1726 rpm"));
    EXPECT_THAT(wide, HasSubstr("12 s ago\033[0m\n"));
    style.columns = 40;
    EXPECT_THAT(drawTable({row}, 0, "t", "s", style), HasSubstr("Engine RPM               - rpm"))
        << "no room for the age";
    LiveRow const never = numberRow("Speed", "", "km/h");
    style.columns = 80;
    EXPECT_THAT(drawTable({never}, 0, "t", "s", style), HasSubstr("\nSpeed                    - km/h"))
        << "not dim: nothing is old";
    style.columns = 13;
    style.bold = false;
    EXPECT_THAT(drawTable({numberRow("Engine RPM", "1726", "rpm")}, 0, "t", "s", style),
                HasSubstr("\nEngine RPM  \u2026\n"))
        << "a name where there is room for nothing else";
    EXPECT_EQ(ageText(seconds(119)), "119 s ago");
    EXPECT_EQ(ageText(seconds(120)), "2 min ago");
}

TEST(LiveScreen, HelpNamesTheKeysOfItsHost)
{
    EXPECT_THAT(drawHelp({{"w", "write a recording"}}, {}), HasSubstr("  w          write a recording\n"));
    for (std::string const& line : linesOf(drawHelp({{"w", std::string(200, 'x')}}, {30, 24}))) {
        EXPECT_LE(displayWidth(line), 30U);
    }
}

TEST(LiveUnits, ALimitFollowsTheUnitsThatAreShown)
{
    SensorLimit const limit{50.0, 120.0};
    EXPECT_EQ(converted(limit, "km/h", "km/h"), limit);
    EXPECT_NEAR(*converted(limit, "km/h", "mph").highest, 74.56, 0.01);
    EXPECT_NEAR(*converted(limit, "°C", "°F").lowest, 122.0, 1e-9);
    EXPECT_EQ(converted(limit, "l/100 km", "mpg"), SensorLimit()) << "none is better than a wrong one";
}

TEST(LiveScreen, ATextTakesThePlaceOfUnitAndStatistics)
{
    LiveRow row = numberRow("Fuel system", "Closed loop, using oxygen sensor feedback", "");
    row.numeric = false;
    EXPECT_THAT(drawTable({row}, 0, "t", "s", {80, 24}),
                HasSubstr("Fuel system        Closed loop, using oxygen sensor feedback\n"));
    EXPECT_THAT(drawTable({row}, 0, "t", "s", {30, 24}), HasSubstr("\nFuel system       Closed loop…\n"));
}

TEST(LiveScreen, NeverCutsANumber)
{
    std::string const frame = drawTable({numberRow("Run time", "4294967295", "s")}, 0, "t", "s", {60, 24});
    EXPECT_THAT(frame, HasSubstr(" 4294967295 s"));
}

TEST(LiveScreen, ShowsADashForAMissingValueAndTellsWhatIsHidden)
{
    std::vector<LiveRow> const rows(5, numberRow("A", "", "V"));
    std::string const frame = drawTable(rows, 0, "t", "s", {80, 7});
    EXPECT_THAT(frame, HasSubstr("A                        - V"));
    EXPECT_THAT(frame, HasSubstr("(2 more: up and down) s"));
    EXPECT_THAT(drawTable(rows, 1, "t", "s", {80, 7}), HasSubstr("(2 more: up and down) s"));
    EXPECT_THAT(drawTable(rows, 4, "t", "s", {80, 7}), HasSubstr("(4 more: up and down) s"));
    EXPECT_THAT(drawTable(rows, 0, "t", "s", {80, 9}), HasSubstr("\n\ns\n"));
}

TEST(LiveScreen, TheSmallestScreenHasARow)
{
    EXPECT_EQ(roomForRows({80, 1}), 1U);
    EXPECT_EQ(roomForRows({80, 4}), 1U);
    EXPECT_EQ(roomForRows({80, 6}), 2U);
}

TEST(LivePicker, MarksAndOrders)
{
    SensorPicker picker({{0x04, "Load"}, {0x0C, "RPM"}, {0x0D, "Speed"}}, {0x0D, 0x0C});
    EXPECT_THAT(picker.draw({40, 10}), HasSubstr("> [x] 0D Speed\n  [x] 0C RPM\n  [ ] 04 Load\n"));
    picker.move(1);
    picker.carry(-1);
    EXPECT_THAT(picker.chosen(), ElementsAre(0x0C, 0x0D));
    picker.toggle();
    picker.move(100);
    picker.toggle();
    picker.carry(1);
    EXPECT_THAT(picker.chosen(), ElementsAre(0x0D, 0x04));
    picker.move(-100);
    picker.carry(-1);
    EXPECT_THAT(picker.draw({40, 10}), HasSubstr("> [ ] 0C RPM\n  [x] 0D Speed\n  [x] 04 Load\n"));
}

TEST(LivePicker, ScrollsWithTheCursor)
{
    std::vector<LiveOffer> offered;
    for (int pid = 3; pid < 0x20; ++pid) {
        offered.push_back({pid, "x"});
    }
    SensorPicker picker(offered, {});
    picker.move(15);
    std::string const frame = picker.draw({40, 8});
    EXPECT_THAT(frame, HasSubstr("> [ ] 12 x"));
    EXPECT_EQ(linesOf(frame).size(), 8U);
    EXPECT_THAT(linesOf(picker.draw({40, 3})),
                ElementsAre("Which sensors, in which order?", "> [ ] 12 x", "", testing::_));
}

TEST(LivePicker, AVehicleWithoutSensorsLeavesNothingToMark)
{
    SensorPicker picker({}, {});
    picker.move(1);
    picker.toggle();
    picker.carry(1);
    EXPECT_TRUE(picker.chosen().empty());
}

} // namespace
