#include "libvelmora/report/oxygenreport.h"
#include "libvelmora/report/plain/reporttext.h"

#include <gtest/gtest.h>

namespace {

using namespace velmora;
using obd::OxygenSensorLocation;

OxygenReport const oxygen{TopicAnswer::Read,
                          true,
                          false,
                          {{OxygenSensorLocation::Bank1Sensor1,
                            {{1, "Threshold", "0.450", "", "", "V", LimitTest::Verdict::None},
                             {5, "Switch time", "0.200", "0.000", "0.160", "s", LimitTest::Verdict::Failed}}},
                           {OxygenSensorLocation::Bank4Sensor2, {}}}};

TEST(OxygenReportView, ShowsSensorsAndTheirTests)
{
    EXPECT_EQ(toText(oxygen, Style()), "  Oxygen monitor complete\n"
                                       "  O2 sensors     Bank 1 sensor 1, Bank 4 sensor 2\n"
                                       "      Result  Test  Value  Minimum  Maximum  Unit  Description\n"
                                       "    Bank 1 sensor 1\n"
                                       "      failed  05    0.200    0.000    0.160  s     Switch time\n"
                                       "      -       01    0.450        -        -  V     Threshold\n"
                                       "    Bank 4 sensor 2: no tests\n");
}

TEST(OxygenReportView, PointsToTheMonitorsOnCan)
{
    OxygenReport const onCan{TopicAnswer::Read, false, true, {{OxygenSensorLocation::Bank2Sensor3, {}}}};
    EXPECT_EQ(toText(onCan, Style()), "  Oxygen monitor not complete, so results don't count yet\n"
                                      "  O2 sensors     Bank 2 sensor 3\n"
                                      "  O2 tests       among those of the monitors (velmora monitors)\n");
    EXPECT_EQ(toJsonValue(onCan), Json::parse(R"({"answer": "read", "complete": false,
        "sensors": [{"bank": 2, "sensor": 3, "tests": null}]})"));
}

TEST(OxygenReportView, NamesThePlaceOfEachSensor)
{
    std::string places;
    for (int location = 0; location <= static_cast<int>(OxygenSensorLocation::Bank4Sensor2); ++location) {
        auto const [bank, sensor] = placeOf(static_cast<OxygenSensorLocation>(location));
        places += std::to_string(bank) + "/" + std::to_string(sensor) + " ";
    }
    EXPECT_EQ(places, "1/1 1/2 1/3 1/4 2/1 2/2 2/3 2/4 3/1 3/2 4/1 4/2 ");
    EXPECT_EQ(locationName(OxygenSensorLocation::Bank1Sensor2), "Bank 1 sensor 2");
}

TEST(OxygenReportView, TellsWhyThereIsNone)
{
    EXPECT_EQ(toText(OxygenReport(), Style()), "  Oxygen monitor not supported\n");
}

TEST(OxygenReportView, JsonHasNoResultForAConstant)
{
    EXPECT_EQ(toJsonValue(oxygen), Json::parse(R"({"answer": "read", "complete": true, "sensors": [
        {"bank": 1, "sensor": 1, "tests": [
            {"id": "05", "description": "Switch time", "result": "failed",
             "value": "0.200", "minimum": "0.000", "maximum": "0.160", "unit": "s"},
            {"id": "01", "description": "Threshold", "result": null,
             "value": "0.450", "minimum": null, "maximum": null, "unit": "V"}]},
        {"bank": 4, "sensor": 2, "tests": []}]})"));
}

} // namespace
