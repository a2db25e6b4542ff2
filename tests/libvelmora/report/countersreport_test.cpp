#include "libvelmora/report/countersreport.h"
#include "libvelmora/report/plain/reporttext.h"

#include <gtest/gtest.h>

namespace {

using namespace velmora;

TEST(CountersReportView, ListsCountersInColumns)
{
    CountersReport const report{TopicAnswer::Read, {{"Ignition Cycle Counter", 1655}, {"Catalyst", 12}}};
    EXPECT_EQ(toText(report, Style()), "  Counters       2 counters above 0\n"
                                       "    Ignition Cycle Counter  1655\n"
                                       "    Catalyst                  12\n");
    EXPECT_EQ(toJsonValue(report), Json::parse(R"({"answer": "read", "counters": [
        {"name": "Ignition Cycle Counter", "value": 1655}, {"name": "Catalyst", "value": 12}]})"));
}

TEST(CountersReportView, TellsZeroesFromNoAnswer)
{
    EXPECT_EQ(toText(CountersReport{TopicAnswer::Read, {}}, Style()), "  Counters       all are 0\n");
    EXPECT_EQ(toText(CountersReport{TopicAnswer::Silent, {}}, Style()), "  Counters       no answer\n");
    EXPECT_EQ(toText(CountersReport(), Style()), "  Counters       not supported\n");
    EXPECT_EQ(toJsonValue(CountersReport()), Json::parse(R"({"answer": "not supported", "counters": []})"));
}

} // namespace
