#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/report/countersreport.h"
#include "program/view/reporttext.h"

#include <gtest/gtest.h>

namespace {

using namespace velmora;
using namespace velmora::cli;

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

TEST(CountersReader, TellsZeroFromAReplyThatCannotBeDecoded)
{
    using Bytes = std::vector<unsigned char>;
    EXPECT_EQ(judgeWithoutCounters({}, obd::ObdProtocolCan11), TopicAnswer::Silent);
    EXPECT_EQ(judgeWithoutCounters({0x7F, 0x09, 0x12}, obd::ObdProtocolCan11), TopicAnswer::Silent);
    Bytes zeros(35);
    zeros[0] = 0x49;
    zeros[1] = 0x08;
    zeros[2] = 0x10;
    EXPECT_EQ(judgeWithoutCounters(zeros, obd::ObdProtocolCan29), TopicAnswer::Read);
    // Four counters where sixteen are due.
    Bytes const few = {0x49, 0x08, 0x04, 0x00, 0x12, 0x00, 0x34, 0x00, 0x00, 0x00, 0x00};
    EXPECT_EQ(judgeWithoutCounters(few, obd::ObdProtocolCan29), TopicAnswer::Unreadable);
    EXPECT_EQ(judgeWithoutCounters({0x49, 0x08, 0x01, 0x00, 0x00, 0x00, 0x00, 0xB5}, obd::ObdProtocolIso9141),
              TopicAnswer::Read);
}

} // namespace
