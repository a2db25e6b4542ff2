#include "common/text/text.h"
#include "program/view/performancetext.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sstream>

namespace {

using namespace velmora;
using namespace velmora::cli;
using testing::HasSubstr;

PerformanceMeter fullRun()
{
    PerformanceMeter meter;
    meter.addSpeed(0.0, 0.0);
    for (int kmh = 1; kmh <= 130; ++kmh) {
        meter.addSpeed(kmh * 0.1, kmh);
    }
    for (int step = 0; step < 30; ++step) {
        meter.addPower(1000.0 + step * 250.0, 10.0 + step, 100.0);
    }
    return meter;
}

TEST(PerformanceText, TellsTimesErrorsAndTheCurve)
{
    PerformanceMeter const meter = fullRun();
    std::string const text = drawPerformance({meter, false, 1500, ""}, {});
    EXPECT_THAT(text, HasSubstr("Performance: running\n"));
    EXPECT_THAT(text, HasSubstr("  0 to 100 km/h     10.00 s +- 0.20 s\n"));
    EXPECT_THAT(text, HasSubstr("  80 to 120 km/h     4.00 s +- 0.20 s\n"));
    EXPECT_THAT(text, HasSubstr("  quarter mile            -\n"));
    EXPECT_THAT(text, HasSubstr("whole km/h each 100 ms"));
    EXPECT_THAT(text, HasSubstr(" 8375 rpm    39 kW   100 Nm ━")) << "the highest engine speeds have the room";
    EXPECT_THAT(text, HasSubstr("for 1500 kg"));
    EXPECT_THAT(drawPerformance({meter, true, 1500, ""}, {}), HasSubstr("  0 to 60 mph        9.66 s"));
    EXPECT_THAT(drawPerformance({meter, true, 1500, ""}, {}), HasSubstr("    52 hp"));
}

TEST(PerformanceText, FitsTheScreen)
{
    PerformanceMeter const meter = fullRun();
    for (auto const& [columns, rows] : {std::pair{80U, 24U}, std::pair{40U, 20U}, std::pair{200U, 60U}}) {
        FrameStyle style;
        style.columns = columns;
        style.rows = rows;
        style.ascii = true;
        std::istringstream lines(drawPerformance({meter, false, 1500, "Saved"}, style));
        std::size_t count = 0;
        for (std::string line; std::getline(lines, line); ++count) {
            EXPECT_LE(displayWidth(line), columns);
        }
        EXPECT_LE(count, rows);
    }
    EXPECT_THAT(drawPerformance({PerformanceMeter(), false, 1500, ""}, {}), HasSubstr("stand still to be ready"));
}

} // namespace
