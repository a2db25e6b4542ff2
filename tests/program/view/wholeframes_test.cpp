// Whole frames, to the letter: what stands where, and what gives way where there is less room.
#include "program/view/live/livebig.h"
#include "program/view/live/livescreen.h"
#include "program/view/performancetext.h"
#include "tests/program/view/liverows.h"

#include <gtest/gtest.h>

#include <cmath>

namespace {

using namespace velmora;
using namespace velmora::cli;
using std::chrono::seconds;
using support::numberRow;

FrameStyle asciiOf(std::size_t columns, std::size_t rows)
{
    FrameStyle style;
    style.columns = columns;
    style.rows = rows;
    style.ascii = true;
    style.now = LiveTime() + seconds(1000);
    return style;
}

// Without the blanks at the ends of lines, which nobody sees.
std::string trimmed(std::string const& text)
{
    std::string result;
    for (std::string const& line : support::linesOf(text)) {
        result += line.substr(0, line.find_last_not_of(' ') + 1) + "\n";
    }
    return result;
}

// A number within its limits, a text, one beyond its limit, and one that is gone.
std::vector<LiveRow> fourRows()
{
    std::vector<LiveRow> rows = {numberRow("Engine RPM", "1726", "rpm"), numberRow("Fuel system", "Closed loop", ""),
                                 numberRow("Vehicle Speed Sensor", "132", "km/h"),
                                 numberRow("Engine Coolant Temperature", "", "oC")};
    rows[0].minimum = "780";
    rows[0].mean = "1200";
    rows[0].maximum = "2672";
    rows[0].trend = {0, 1, NAN, 2, 3, 4, 5, 6, 7};
    rows[1].numeric = false;
    rows[2].minimum = "0";
    rows[2].mean = "66";
    rows[2].limit.highest = 130;
    rows[2].trend = {1, 2};
    rows[3].last = "-40";
    rows[3].minimum = rows[3].mean = rows[3].maximum = "-40";
    rows[3].updated = LiveTime() + seconds(970);
    return rows;
}

TEST(WholeFrames, ATableGivesUpTrendAndStatistics)
{
    EXPECT_EQ(trimmed(drawTable(fourRows(), 0, "title", "q quit", asciiOf(100, 10))), R"(title
Sensor                       Value Unit Minimum    Mean Maximum Trend of 180 s
Engine RPM                    1726 rpm      780    1200    2672                            .: -=+*%#
Fuel system                Closed loop
Vehicle Speed Sensor          !132 km/h       0      66     132                                   .#
Engine Coolant Temperature     -40 oC       -40     -40     -40                             30 s ago

q quit
)");
    EXPECT_EQ(trimmed(drawTable(fourRows(), 0, "title", "q quit", asciiOf(60, 7))), R"(title
Sensor                    Value Unit Minimum    Mean Maximum
Engine RPM                 1726 rpm      780    1200    2672
Fuel system             Closed loop
Vehicle Speed Sensor       !132 km/h       0      66     132

(1 more: up and down) q quit
)");
    EXPECT_EQ(trimmed(drawTable(fourRows(), 1, "a title that is long", "q quit", asciiOf(34, 6))),
              R"(a title that is long
Sensor                  Value Unit
Fuel system           Closed loop
Vehicle Speed Sensor     !132 km/h

(2 more: up and down) q quit
)");
    EXPECT_EQ(trimmed(drawTable({}, 0, "title", "", asciiOf(34, 6))), R"(title
Sensor               Value Unit
)");
}

TEST(WholeFrames, BigDigitsStandBesideEachOther)
{
    EXPECT_EQ(trimmed(drawBig(fourRows(), asciiOf(80, 24))),
              R"(Engine RPM                ! Vehicle Speed Sensor    Engine Coolant Temperat…
 #  ### ### ###            #  ### ###
##    #   # #             ##    #   #
 #    # ### ###            #   ## ###               ###
 #   #  #   # #            #    # #
###  #  ### ### rpm       ### ### ### km/h              oC
780 ========....... 2672  0 ================== 132  was -40, 30 s ago

)");
    EXPECT_EQ(trimmed(drawBig(fourRows(), asciiOf(54, 40))), R"(Engine RPM                 ! Vehicle Speed Sensor
 #  ### ### ###             #  ### ###
##    #   # #              ##    #   #
 #    # ### ###             #   ## ###
 #   #  #   # #             #    # #
###  #  ### ### rpm        ### ### ### km/h
780 ========........ 2672  0 =================== 132
                .: -=+*%#                         .#

Engine Coolant Temperatu…


###

    oC
was -40, 30 s ago


)");
    EXPECT_EQ(drawBig(fourRows(), asciiOf(80, 19)), "") << "the table keeps twelve lines";
    EXPECT_EQ(drawBig(fourRows(), asciiOf(25, 60)), "") << "no room for a name and a number";
    std::vector<LiveRow> rows = {numberRow("Long", "1234567.5", "m"), numberRow("Zero", "5", ""),
                                 numberRow("Wide", "1", "")};
    rows[0].maximum = "1234567.75";
    rows[0].minimum = "1234567.25";
    rows[2].minimum = "-100000000.5";
    rows[2].maximum = "100000000.5";
    EXPECT_EQ(trimmed(drawBig(rows, asciiOf(80, 21))), R"(Long                      Zero                      Wide
                          ###                        #
                          #                         ##
1234567.5                 ###                        #
                            #                        #
 m                        ###                       ###
1234567.25  1234567.75    5 ==================== 5  -100000000.5  100000000…

)");
}

TEST(WholeFrames, ATimedRunHasTheRestOfTheScreenForItsCurve)
{
    PerformanceRun run;
    run.state = RunState::Running;
    run.kmh = 52.6;
    run.interval = 0.1;
    run.kilograms = 1500;
    for (int kmh = 0; kmh <= 110; ++kmh) {
        run.speeds.push_back({kmh * 0.1, static_cast<double>(kmh)});
    }
    run.powers = {{1125, 12.4, 105.3}, {1375, 25.2, 140.6}, {1625, 49.6, 291.5}};
    EXPECT_EQ(drawPerformance({run, false, ""}, asciiOf(60, 23)), R"(Performance: running
### ###
#     #
###  ##
  #   #
### ### km/h

  0 to 100 km/h     10.00 s +- 0.20 s
  80 to 120 km/h          -
  quarter mile            -
  The start is reckoned back from the first readings that r…
  Speed comes in whole km/h each 100 ms.

Highest power and torque by engine speed, for 1500 kg (sett…
   1125 rpm    12 kW   105 Nm ========
   1375 rpm    25 kW   141 Nm ===============
   1625 rpm    50 kW   292 Nm ==============================

p back to the values  e export the run  q quit
)");
    EXPECT_EQ(drawPerformance({run, true, "Saved"}, asciiOf(60, 24)), R"(Performance: running
### ###
  #   #
 ##  ##
  #   #
### ### mph

  0 to 60 mph        9.66 s +- 0.20 s
  80 to 120 km/h          -
  quarter mile            -
  The start is reckoned back from the first readings that r…
  Speed comes in whole km/h each 100 ms.

Highest power and torque by engine speed, for 1500 kg (sett…
   1125 rpm    17 hp   105 Nm ========
   1375 rpm    34 hp   141 Nm ===============
   1625 rpm    67 hp   292 Nm ==============================

Saved
)");
    run.state = RunState::Stopped;
    run.interval = 0;
    EXPECT_EQ(drawPerformance({run, false, ""}, asciiOf(36, 4)), R"(Performance: standing, ready for th…
### ###
#     #
###  ##
  #   #
### ### km/h

  0 to 100 km/h     10.00 s +- 0.10…
  80 to 120 km/h          -
  quarter mile            -
  The start is reckoned back from t…
  Speed comes in whole km/h.

Highest power and torque by engine …

p back to the values  e export the …
)");
}

TEST(WholeFrames, ACurveWithoutRoomForItsBarHasNone)
{
    PerformanceRun run;
    run.powers = {{1125, 12.4, 105.3}};
    std::string const line = "   1125 rpm    12 kW   105 Nm ";
    EXPECT_NE(drawPerformance({run, false, ""}, asciiOf(line.size(), 40)).find(line + "\n"), std::string::npos);
    EXPECT_NE(drawPerformance({run, false, ""}, asciiOf(line.size() + 1, 40)).find(line + "=\n"), std::string::npos);
}

TEST(WholeFrames, DigitsGiveWayWhereTheUnitWouldNotFit)
{
    auto const firstLines = [](std::string const& unit) {
        std::string const text = trimmed(drawBig({numberRow("A", "12345", unit)}, asciiOf(26, 24)));
        return support::linesOf(text)[3];
    };
    EXPECT_EQ(firstLines("rpm"), " #  ###  ## ### ###") << "nineteen columns, a blank and three letters fill 24";
    EXPECT_EQ(firstLines("rpm/"), " #  ###  ## ### ###");
    EXPECT_EQ(firstLines("rpm/s"), "12345");
}

} // namespace
