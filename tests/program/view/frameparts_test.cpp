// The parts that frames are made of, each to the letter.
#include "program/view/framestyle.h"
#include "program/view/live/bigdigits.h"
#include "program/view/live/livehelp.h"
#include "program/view/live/sensorpicker.h"
#include "program/view/live/timebar.h"
#include "program/view/live/trendline.h"
#include "program/view/timetext.h"
#include "program/view/unitpairs.h"
#include "tests/program/view/liverows.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <ctime>

namespace {

using namespace velmora;
using namespace velmora::cli;
using std::chrono::milliseconds;
using std::chrono::seconds;
using testing::ElementsAre;

TEST(FrameParts, LooksAreSwitchedOnAndOff)
{
    Look const all[] = {Look::Plain, Look::Heading, Look::Stale, Look::Outside, Look::Marked};
    std::string const bold[] = {"t", "\033[1mt\033[0m", "\033[2mt\033[0m", "\033[1mt\033[0m", "\033[7mt\033[0m"};
    FrameStyle style;
    EXPECT_EQ(style.columns, 80U);
    EXPECT_EQ(style.rows, 24U);
    for (std::size_t i = 0; i < std::size(all); ++i) {
        EXPECT_EQ(looking(all[i], "t", FrameStyle()), "t") << i;
        style.bold = true;
        style.coloured = false;
        EXPECT_EQ(looking(all[i], "t", style), bold[i]) << i;
        style.coloured = true;
        EXPECT_EQ(looking(all[i], "t", style), all[i] == Look::Outside ? "\033[1;31mt\033[0m" : bold[i]) << i;
        style.bold = false;
        EXPECT_EQ(looking(all[i], "t", style), "t") << i;
    }
}

TEST(FrameParts, TextsAreCutWhereTheScreenEnds)
{
    EXPECT_EQ(cutTo("°C und", 6), "°C und");
    EXPECT_EQ(cutTo("°C und", 5), "°C u…");
    EXPECT_EQ(cutTo("", 0), "");
}

TEST(FrameParts, AgesCountFromNothingOn)
{
    EXPECT_EQ(ageText(seconds(-3)), "0 s ago");
    EXPECT_EQ(ageText(milliseconds(999)), "0 s ago");
    EXPECT_EQ(ageText(milliseconds(1999)), "1 s ago");
    EXPECT_EQ(ageText(seconds(179)), "2 min ago");
    EXPECT_EQ(ageText(seconds(180)), "3 min ago");
    EXPECT_EQ(ageText(seconds(7200)), "120 min ago");
}

TEST(FrameParts, AsciiStandsForWhatATerminalLacks)
{
    EXPECT_EQ(toAscii("a~\x7F"), "a~\x7F") << "ASCII stays";
    EXPECT_EQ(toAscii("m²"), "m2");
    EXPECT_EQ(toAscii("…°²µ"), ".o2u");
    EXPECT_EQ(toAscii("ä→"), "??");
    EXPECT_EQ(toAscii("日a"), "??a") << "two columns wide";
    EXPECT_EQ(toAscii(""), "");
}

TEST(FrameParts, TrendsHaveEightHeights)
{
    EXPECT_EQ(trendLine({0, 1, 2, 3, 4, 5, 6, 7}, 8, true), ".:-=+*%#");
    EXPECT_EQ(trendLine({0, 0.49, 0.51, 7}, 4, true), "..:#") << "the nearest height";
    EXPECT_EQ(trendLine({NAN, 3, 100, 3}, 2, true), "#.") << "what is not shown does not count";
    EXPECT_EQ(trendLine({1, 2}, 0, true), "");
}

TEST(FrameParts, TimesOfABarHaveHoursWhereTheyNeedThem)
{
    EXPECT_EQ(timeBar(3661999, 0, 7323998, 8), "1:01:01 [====....] 2:02:03");
    EXPECT_EQ(timeBar(3599999, 0, 3600000, 4), "59:59 [===.] 1:00:00");
    EXPECT_EQ(timeBar(61000, 1000, 121000, 4), "1:00 [==..] 2:00") << "of a recording that begins later";
    EXPECT_EQ(timeBar(9000, 1000, 5000, 4), "0:08 [====] 0:04") << "no wider than the bar";
    EXPECT_EQ(timeBar(0, 1000, 5000, 4).substr(5), "[....] 0:04");
}

TEST(FrameParts, BigDigitsHaveOneColumnBetweenThem)
{
    EXPECT_EQ(bigWidth(""), 0U);
    EXPECT_EQ(bigWidth("on"), 0U);
    EXPECT_EQ(bigWidth("8"), 3U);
    EXPECT_EQ(bigWidth("-8.5"), 3 + 1 + 3 + 1 + 1 + 1 + 3U);
    EXPECT_EQ(bigLines(true), 5U);
    EXPECT_EQ(bigLines(false), 3U);
    EXPECT_THAT(bigText("-.4", true), ElementsAre("      # #", "      # #", "###   ###", "        #", "    #   #"));
    EXPECT_THAT(bigText("4.", false), ElementsAre("█ █  ", "▀▀█  ", "  ▀ ▀"));
}

TEST(FrameParts, UnitsAreTurnedAsTheLibraryTurnsThem)
{
    struct Pair
    {
        char const* metric;
        char const* shown;
        double value;
        double turned;
    };
    for (Pair const& each :
         {Pair{"km/h", "mph", 100, 62.137}, Pair{"km", "mi", 100, 62.137}, Pair{"°C", "°F", 100, 212},
          Pair{"°C", "°F", -40, -40}, Pair{"kPa", "psi", 100, 14.50377}, Pair{"kPa", "inHg", 100, 29.53005865},
          Pair{"kPa", "inH2O", 100, 401.463092}, Pair{"Pa", "inH2O", 1000, 4.01463092},
          Pair{"g/s", "lb/min", 100, 13.2277357}, Pair{"kW", "hp", 100, 134.10220888}, Pair{"V", "V", 12.5, 12.5}}) {
        std::optional<double> const turned = converted(each.value, each.metric, each.shown);
        ASSERT_TRUE(turned) << each.shown;
        EXPECT_NEAR(*turned, each.turned, 1e-9) << each.metric << " to " << each.shown;
        SensorLimit const limit = converted(SensorLimit{each.value, {}}, each.metric, each.shown);
        EXPECT_NEAR(limit.lowest.value_or(0), each.turned, 1e-9);
        EXPECT_FALSE(limit.highest);
        EXPECT_FALSE(converted(SensorLimit{{}, each.value}, each.metric, each.shown).lowest);
    }
    EXPECT_FALSE(converted(1.0, "mph", "km/h")) << "the other way is not asked for";
    EXPECT_FALSE(converted(1.0, "°C", "psi"));
}

TEST(FrameParts, TheHelpHasALineForEachKey)
{
    EXPECT_EQ(drawHelp({{"w", "write a recording"}}, {}),
              "Keys\n"
              "  q          quit\n"
              "  s          choose sensors and their order\n"
              "  b          big digits on and off, of the first six sensors\n"
              "  h, space   hold the screen, and let it go on\n"
              "  up, down   move the table, by pages with page up and down\n"
              "  w          write a recording\n"
              "\n"
              "A value beyond its limit has a !. A dim one is old, and tells its age.\n"
              "Any key goes back\n");
    FrameStyle style;
    style.bold = true;
    style.columns = 12;
    EXPECT_THAT(support::linesOf(drawHelp({}, style)),
                ElementsAre("\033[1mKeys\033[0m", "  q        …", "  s        …", "  b        …", "  h, space …",
                            "  up, down …", "", "A value bey…", "Any key goe…"));
}

TEST(FrameParts, TheListOfSensorsFollowsItsCursor)
{
    SensorPicker picker({{4, "Load"}, {0x0C, "RPM"}, {0x0D, "Speed"}, {0x11, "Throttle"}}, {0x0D, 99});
    FrameStyle style;
    style.bold = true;
    style.columns = 14;
    style.rows = 5;
    std::string const title = "\033[1mWhich sensors…\033[0m";
    EXPECT_THAT(support::linesOf(picker.draw(style)),
                ElementsAre(title, "\033[7m> [x] 0D Speed\033[0m", "  [ ] 04 Load", "", "up, down move…"));
    picker.move(1);
    EXPECT_THAT(support::linesOf(picker.draw(style)),
                ElementsAre(title, "  [x] 0D Speed", "\033[7m> [ ] 04 Load\033[0m", "", "up, down move…"));
    picker.move(1);
    picker.toggle();
    EXPECT_THAT(support::linesOf(picker.draw(style)),
                ElementsAre(title, "  [ ] 04 Load", "\033[7m> [x] 0C RPM\033[0m", "", "up, down move…"));
    EXPECT_THAT(picker.chosen(), ElementsAre(0x0D, 0x0C));
    picker.move(1);
    EXPECT_THAT(support::linesOf(picker.draw(style)),
                ElementsAre(title, "  [x] 0C RPM", "\033[7m> [ ] 11 Thro…\033[0m", "", "up, down move…"));
    picker.move(1);
    picker.carry(-3);
    picker.toggle();
    EXPECT_THAT(picker.chosen(), ElementsAre(0x11, 0x0C, 0x0D)) << "it changes places with the first";
}

TEST(FrameParts, TimesOfDay)
{
    using std::chrono::system_clock;
    EXPECT_EQ(isoTimeOf(0), "1970-01-01T00:00:00.000Z");
    EXPECT_EQ(isoTimeOf(-1), "1969-12-31T23:59:59.999Z");
    EXPECT_EQ(isoTimeOf(-1000), "1969-12-31T23:59:59.000Z");
    EXPECT_EQ(isoTimeOf(1709802302999), "2024-03-07T09:05:02.999Z");
    EXPECT_EQ(isoTime(system_clock::time_point(std::chrono::microseconds(1709802302007999))),
              "2024-03-07T09:05:02.007Z");
    ::setenv("TZ", "CET-1CEST,M3.5.0,M10.5.0/3", 1);
    ::tzset();
    EXPECT_EQ(localTime(system_clock::time_point(seconds(1774992600)), "%Y-%m-%d %H:%M"), "2026-03-31 23:30");
    ::unsetenv("TZ");
    ::tzset();
}

} // namespace
