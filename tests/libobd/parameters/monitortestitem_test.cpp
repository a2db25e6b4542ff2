#include "libobd/parameters/monitortestitem.h"
#include "libobd/value/unitscalingfactory.h"
#include "tests/support/hexbytes.h"
#include "tests/support/logcapture.h"

#include <gtest/gtest.h>

namespace {

using namespace obd;

std::shared_ptr<IUnitScaling> const counts = UnitScalingFactory::createForCan(0x82, UnitSystem::Metric);

TEST(CanMonitorTestItem, AllZerosHaveNoResultYet)
{
    EXPECT_EQ(CanMonitorTestItem(counts, 1, 0.0, 0.0, 0.0).status(), 2);
}

TEST(CanMonitorTestItem, StatusComparesWithBothLimits)
{
    struct Case
    {
        double value;
        double minimum;
        double maximum;
        int status;
    };
    for (Case const& c :
         {Case{5, 1, 9, 0}, Case{1, 1, 9, 0}, Case{9, 1, 9, 0}, Case{0.9, 1, 9, 1}, Case{9.1, 1, 9, 1},
          Case{0, 0, 1, 0}, Case{0, -1, 0, 0}, Case{5, 9, 1, 1}, Case{0.1, 0, 0, 1}, Case{-0.1, 0, 0, 1}}) {
        EXPECT_EQ(CanMonitorTestItem(counts, 1, c.value, c.minimum, c.maximum).status(), c.status)
            << c.value << " in " << c.minimum << " to " << c.maximum;
    }
}

TEST(CanMonitorTestItem, TellsItsTexts)
{
    CanMonitorTestItem const item(counts, 0x0C, -1.3, -9.0, 16.04);
    EXPECT_EQ(item.testId(), 0x0C);
    EXPECT_EQ(item.description(), "Misfire counts for last/current driving cycles (calculated)");
    EXPECT_EQ(item.value(), "-1.3");
    EXPECT_EQ(item.minimum(), "-9.0");
    EXPECT_EQ(item.maximum(), "16.0");
    EXPECT_EQ(item.unit(), UnitNone);
}

TEST(MonitorTestItem, LimitIsTheLowerOneWithBit7OfTheComponent)
{
    std::shared_ptr<IUnitScaling> const volts = UnitScalingFactory::createForTest(0x07);
    MonitorTestItem const lower(volts, 0x07, 0x83, 0.5, 0.6);
    EXPECT_EQ(lower.status(), 1);
    EXPECT_EQ(lower.value(), "0.500");
    EXPECT_EQ(lower.minimum(), "0.600");
    EXPECT_EQ(lower.maximum(), "");
    EXPECT_EQ(lower.unit(), UnitVolt);
    EXPECT_EQ(lower.testId(), 0x07);
    EXPECT_EQ(lower.description(), "Minimum sensor voltage for test cycle (calculated)");
    EXPECT_EQ(MonitorTestItem(volts, 0x07, 0x83, 0.6, 0.6).status(), 0);

    MonitorTestItem const upper(volts, 0x07, 0x03, 0.5, 0.6);
    EXPECT_EQ(upper.status(), 0);
    EXPECT_EQ(upper.minimum(), "");
    EXPECT_EQ(upper.maximum(), "0.600");
    EXPECT_EQ(MonitorTestItem(volts, 0x07, 0x03, 0.7, 0.6).status(), 1);
    EXPECT_EQ(MonitorTestItem(volts, 0x07, 0x03, 0.0, 0.0).status(), 0) << "zeros are a result here";
}

TEST(MonitorTestItem, TestsBetween0DAnd1FAreReserved)
{
    std::shared_ptr<IUnitScaling> const raw = UnitScalingFactory::createForTest(0x1F);
    EXPECT_EQ(MonitorTestItem(raw, 0x1F, 0, 1, 2).description(), "ISO/SAE reserved");
    EXPECT_EQ(MonitorTestItem(raw, 0x20, 0, 1, 2).description(), "NA");
}

TEST(MonitorTestItemParserCan, UnknownScalingsLeaveNoItemAndTwoLogLines)
{
    support::LogCapture log;
    MonitorTestItemParserCan const parser(support::hexBytes("01 47 00 01 00 00 00 02"));
    EXPECT_EQ(parser.parse(UnitSystem::Metric), nullptr);
    EXPECT_EQ(log.lines(), (std::vector<std::string>{"ERROR Invalid scaling ID: 71",
                                                     "ERROR Failed to create unit scaler for scale ID: 71"}));
}

TEST(MonitorTestItemParserCan, ReadsTheRecordInTheAskedUnitSystem)
{
    MonitorTestItemParserCan const parser(support::hexBytes("80 16 05 78 00 00 FF FF"));
    auto const metric = parser.parse(UnitSystem::Metric);
    EXPECT_EQ(metric->value(), "100.0");
    EXPECT_EQ(metric->minimum(), "-40.0");
    EXPECT_EQ(metric->maximum(), "6513.5");
    EXPECT_EQ(metric->unit(), UnitCelsius);
    auto const imperial = parser.parse(UnitSystem::Imperial);
    EXPECT_EQ(imperial->value(), "212.0");
    EXPECT_EQ(imperial->minimum(), "-40.0");
    EXPECT_EQ(imperial->maximum(), "11756.3");
    EXPECT_EQ(imperial->unit(), UnitFahrenheit);
    EXPECT_EQ(imperial->description(), "Manufacturer Defined Test");
}

TEST(MonitorTestItemParserNonCan, IsMetricInBothSystems)
{
    MonitorTestItemParserNonCan const parser(support::hexBytes("05 83 00 FA 00 7D"));
    for (UnitSystem const system : {UnitSystem::Metric, UnitSystem::Imperial}) {
        auto const item = parser.parse(system);
        EXPECT_EQ(item->value(), "1.000");
        EXPECT_EQ(item->minimum(), "0.500");
        EXPECT_EQ(item->unit(), UnitSecond);
    }
}

} // namespace
