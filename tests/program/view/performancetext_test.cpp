#include "common/text/text.h"
#include "program/view/performancetext.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sstream>

namespace {

using namespace velmora;
using namespace velmora::cli;
using testing::HasSubstr;

PerformanceRun fullRun()
{
    PerformanceRun run;
    run.state = RunState::Running;
    run.interval = 0.1;
    run.kilograms = 1500;
    for (int kmh = 0; kmh <= 130; ++kmh) {
        run.speeds.push_back({kmh * 0.1, static_cast<double>(kmh)});
    }
    for (int step = 0; step < 30; ++step) {
        run.powers.push_back({1125.0 + step * 250.0, 10.0 + step, 100.0});
    }
    return run;
}

TEST(PerformanceText, TellsTimesErrorsAndTheCurve)
{
    PerformanceRun const run = fullRun();
    std::string const text = drawPerformance({run, false, ""}, {});
    EXPECT_THAT(text, HasSubstr("Performance: running\n"));
    EXPECT_THAT(text, HasSubstr("  0 to 100 km/h     10.00 s +- 0.20 s\n"));
    EXPECT_THAT(text, HasSubstr("  80 to 120 km/h     4.00 s +- 0.20 s\n"));
    EXPECT_THAT(text, HasSubstr("  quarter mile            -\n"));
    EXPECT_THAT(text, HasSubstr("whole km/h each 100 ms"));
    EXPECT_THAT(text, HasSubstr(" 8375 rpm    39 kW   100 Nm ━")) << "the highest engine speeds have the room";
    EXPECT_THAT(text, HasSubstr("for 1500 kg"));
    EXPECT_THAT(drawPerformance({run, true, ""}, {}), HasSubstr("  0 to 60 mph        9.66 s"));
    EXPECT_THAT(drawPerformance({run, true, ""}, {}), HasSubstr("    52 hp"));
}

TEST(PerformanceText, FitsTheScreen)
{
    PerformanceRun const run = fullRun();
    for (auto const& [columns, rows] : {std::pair{80U, 24U}, std::pair{40U, 20U}, std::pair{200U, 60U}}) {
        FrameStyle style;
        style.columns = columns;
        style.rows = rows;
        style.ascii = true;
        std::istringstream lines(drawPerformance({run, false, "Saved"}, style));
        std::size_t count = 0;
        for (std::string line; std::getline(lines, line); ++count) {
            EXPECT_LE(displayWidth(line), columns);
        }
        EXPECT_LE(count, rows);
    }
    EXPECT_THAT(drawPerformance({PerformanceRun(), false, ""}, {}), HasSubstr("stand still to be ready"));
}

} // namespace
