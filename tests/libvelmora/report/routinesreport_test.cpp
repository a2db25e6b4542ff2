#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/routinesreport.h"

#include <gtest/gtest.h>

namespace {

using namespace velmora;

Routine const leakTest{1, "Leak test", "Closes the valve."};

TEST(RoutinesReportView, ListsRoutinesWithTheirDescriptions)
{
    RoutinesReport const report{TopicAnswer::Read, {leakTest}};
    EXPECT_EQ(toText(report, Style()), "  Routine 01     Leak test\n"
                                       "    Closes the valve.\n");
    EXPECT_EQ(toJsonValue(report), Json::parse(R"({"answer": "read",
        "routines": [{"id": "01", "name": "Leak test", "description": "Closes the valve."}]})"));
    EXPECT_EQ(toText(RoutinesReport(), Style()), "  Routines       not supported\n");
    EXPECT_EQ(toJsonValue(RoutinesReport()), Json::parse(R"({"answer": "not supported", "routines": []})"));
}

TEST(RoutinesReportView, TellsWhatBecameOfARun)
{
    EXPECT_EQ(toText(RoutineRun{leakTest, RoutineRun::Result::Accepted, {}}, Style(true)),
              "  Routine 01     Leak test\n"
              "  Result         \033[32maccepted\033[0m\n");
    RoutineRun const refused{leakTest, RoutineRun::Result::Refused, "busy"};
    EXPECT_EQ(toText(refused, Style()), "  Routine 01     Leak test\n"
                                        "  Result         refused: busy\n");
    EXPECT_EQ(toJsonValue(refused), Json::parse(R"({
        "routine": {"id": "01", "name": "Leak test", "description": "Closes the valve."},
        "result": "refused", "reason": "busy"})"));
    EXPECT_EQ(toJsonValue(RoutineRun{leakTest, RoutineRun::Result::NoAnswer, {}})["reason"], Json(nullptr));
}

} // namespace
