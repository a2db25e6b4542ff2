#include "libvelmora/report/monitorsreport.h"
#include "libvelmora/report/plain/reporttext.h"

#include <gtest/gtest.h>

namespace {

using namespace velmora;

MonitorsReport const report{
    TopicAnswer::Read,
    {{0x01, "Sensor 1", {{0x81, "Amplitude", "0.450", "0.400", "", "V", LimitTest::Verdict::Passed}}},
     {0xA2,
      "Misfire",
      {{0x0B, "Average", "0", "", "", "", LimitTest::Verdict::NoResult},
       {0x0C, "Count", "900", "0", "80", "", LimitTest::Verdict::Failed}}}}};

TEST(MonitorsReportView, ShowsFailedTestsFirst)
{
    EXPECT_EQ(toText(report, Style()), "  Monitor tests  1 failed, 1 passed, 1 without result\n"
                                       "      Result     Test  Value  Minimum  Maximum  Unit  Description\n"
                                       "    A2 Misfire\n"
                                       "      failed     0C      900        0       80        Count\n"
                                       "      no result  0B        0        -        -        Average\n"
                                       "    01 Sensor 1\n"
                                       "      passed     81    0.450    0.400        -  V     Amplitude\n");
}

TEST(MonitorsReportView, HeadingsOfNumbersStandOverTheirEnds)
{
    MonitorsReport const wide{
        TopicAnswer::Read,
        {{0x21, "A", {{0x81, "B", "1.00000000", "2.00000000", "3.00000000", "V", LimitTest::Verdict::Passed}}}}};
    EXPECT_EQ(toText(wide, Style()), "  Monitor tests  1 passed\n"
                                     "      Result  Test       Value     Minimum     Maximum  Unit  Description\n"
                                     "    21 A\n"
                                     "      passed  81    1.00000000  2.00000000  3.00000000  V     B\n");
}

TEST(MonitorsReportView, IsNoTableWhereLinesAreNarrow)
{
    EXPECT_EQ(toText(report, Style(false, false, 40)), "  Monitor tests  1 failed, 1 passed, 1 without result\n"
                                                       "    A2 Misfire\n"
                                                       "      failed  0C: 900 (0 to 80)\n"
                                                       "        Count\n"
                                                       "      no result  0B: 0 (- to -)\n"
                                                       "        Average\n"
                                                       "    01 Sensor 1\n"
                                                       "      passed  81: 0.450 V (0.400 to -)\n"
                                                       "        Amplitude\n");
}

TEST(MonitorsReportView, ColoursFailures)
{
    std::string const text = toText(report, Style(true));
    EXPECT_TRUE(text.find("\033[31m1 failed\033[0m, 1 passed") != std::string::npos) << text;
    EXPECT_TRUE(text.find("\033[31m  failed\033[0m ") != std::string::npos) << text;
    EXPECT_TRUE(text.find("\033[32m  passed\033[0m ") != std::string::npos) << text;
}

TEST(MonitorsReportView, TellsWhyThereIsNone)
{
    EXPECT_EQ(toText(MonitorsReport(), Style()), "  Monitor tests  not supported\n");
    EXPECT_EQ(toText(MonitorsReport{TopicAnswer::Silent, {}}, Style()), "  Monitor tests  no answer\n");
}

TEST(MonitorsReportView, JsonHasNullForALimitThatIsNone)
{
    EXPECT_EQ(toJsonValue(report), Json::parse(R"({"answer": "read", "monitors": [
        {"id": "A2", "description": "Misfire", "tests": [
            {"id": "0C", "description": "Count", "result": "failed",
             "value": "900", "minimum": "0", "maximum": "80", "unit": null},
            {"id": "0B", "description": "Average", "result": "no result",
             "value": "0", "minimum": null, "maximum": null, "unit": null}]},
        {"id": "01", "description": "Sensor 1", "tests": [
            {"id": "81", "description": "Amplitude", "result": "passed",
             "value": "0.450", "minimum": "0.400", "maximum": null, "unit": "V"}]}]})"));
    EXPECT_EQ(toJsonValue(MonitorsReport()), Json::parse(R"({"answer": "not supported", "monitors": []})"));
}

} // namespace
