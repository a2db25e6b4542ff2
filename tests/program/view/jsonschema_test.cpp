// What --json prints, against docs/json.schema.json; and that the schema can refuse.

#include "libvelmora/report/clearreport.h"
#include "libvelmora/report/codereport.h"
#include "libvelmora/report/countersreport.h"
#include "libvelmora/report/document/reportdocument.h"
#include "libvelmora/report/freezereport.h"
#include "libvelmora/report/inforeport.h"
#include "libvelmora/report/monitorsreport.h"
#include "libvelmora/report/oxygenreport.h"
#include "libvelmora/report/readinessreport.h"
#include "libvelmora/report/routinesreport.h"
#include "libvelmora/report/vehiclereport.h"
#include "program/view/live/livelines.h"
#include "program/view/timetext.h"
#include "program/view/trafficlog.h"
#include "tests/support/json/jsonschema.h"

#include <gtest/gtest.h>

namespace {

using namespace velmora;
using namespace velmora::cli;
using support::expectValid;
using support::schemaErrors;

// A module that told everything, and one of no name that told nothing.
template <typename Report>
std::string document(Report const& full, Report const& empty)
{
    return toJson(std::vector<ModuleTopic<Report>>{{0x7E8, "ECM", full}, {0x18DAF110, "", empty}});
}

TroubleCode const code{"P0133", "Powertrain", {{"Generic", "Slow"}}};

CodeReport codeReport()
{
    return {true,
            {{CodeKind::Confirmed, CodeList::Answer::Read, {}, {code}},
             {CodeKind::Pending, CodeList::Answer::Refused, "busy (21)", {}},
             {CodeKind::Permanent, CodeList::Answer::Silent, {}, {}}}};
}

std::vector<LimitTest> limitTests()
{
    return {{0x81, "A", "1", "0", "2", "V", LimitTest::Verdict::Passed},
            {0x05, "", "", "", "", "", LimitTest::Verdict::NoResult},
            {0x01, "B", "5", "", "", "V", LimitTest::Verdict::None}};
}

InfoReport infoReport()
{
    InfoReport report;
    report.vin = "V";
    report.calibrations = {{"A", "1"}, {"B", ""}};
    report.sinceCleared.distance = InfoReport::Reading{"1", "km"};
    return report;
}

TEST(JsonSchema, HoldsForTroubleCodes)
{
    expectValid(document(codeReport(), CodeReport{{}, {{CodeKind::Pending, CodeList::Answer::Unreadable, {}, {}}}}),
                "codes");
    FreezeFrame const frame{code, {{"Engine RPM", "2355", "rpm"}, {"Speed", std::nullopt, ""}}};
    expectValid(document(FreezeReport{0, TopicAnswer::Read, frame}, FreezeReport{255, TopicAnswer::Refused, {}}),
                "freeze");
    expectValid(printed(toJsonValue(std::vector<TroubleCode>{code})), "dtc");
}

TEST(JsonSchema, HoldsForDiagnosticResults)
{
    using Status = obd::ReadinessMonitorDataModel;
    ReadinessReport const readiness{
        TopicAnswer::Read,
        true,
        {{"A", Status::NotComplete, Status::DisabledThisCycle}, {"B", Status::NotAvailable, {}}}};
    expectValid(document(readiness, ReadinessReport()), "readiness");
    expectValid(document(MonitorsReport{TopicAnswer::Read, {{0x01, "A", limitTests()}}}, MonitorsReport()), "monitors");
    OxygenReport const oxygen{
        TopicAnswer::Read, true, false, {{obd::OxygenSensorLocation::Bank4Sensor2, limitTests()}}};
    OxygenReport const onCan{TopicAnswer::Read, {}, true, {{obd::OxygenSensorLocation::Bank1Sensor1, {}}}};
    expectValid(document(oxygen, onCan), "oxygen");
    expectValid(document(CountersReport{TopicAnswer::Read, {{"A", 7}}}, CountersReport{TopicAnswer::Silent, {}}),
                "counters");
}

TEST(JsonSchema, HoldsForInformationAndRoutines)
{
    expectValid(document(infoReport(), InfoReport()), "info");
    Routine const routine{1, "A", "B"};
    expectValid(document(RoutinesReport{TopicAnswer::Read, {routine}}, RoutinesReport()), "routines");
    expectValid(document(RoutineRun{routine, RoutineRun::Result::Refused, "busy"},
                         RoutineRun{routine, RoutineRun::Result::Unreadable, {}}),
                "routinesRun");
    expectValid(
        document(ClearReport{ClearReport::Result::Cleared, {}}, ClearReport{ClearReport::Result::Unreadable, "busy"}),
        "clear");
}

TEST(JsonSchema, HoldsForAScan)
{
    VehicleReport report;
    report.adapter = {"ELM327 v1.5", "", "", 12.3F};
    report.protocol = {6, "ISO 15765-4"};
    ModuleReport full{0x7E8, "ECM", {0x0C, 0x0D}, infoReport(), codeReport(), {0, TopicAnswer::Read, {}}, {}, {},
                      {},    {}};
    full.monitors = {TopicAnswer::Read, {{0x01, "A", limitTests()}}};
    full.counters = {TopicAnswer::Read, {{"A", 7}}};
    ModuleReport empty{0x7E9, "", {}, {}, codeReport(), {}, {}, {}, {}, {}};
    empty.codes.lamp.reset();
    report.modules = {full, empty};
    expectValid(report.toJson(), "scan");
    full.values = {{0x05, 0, "Coolant", "88", "\u00B0C", {87.0, 88.0}}, {0x03, 0, "Fuel system", "", "", {}}};
    full.codes.lists[0].codes.clear();
    report.modules = {full};
    for (InspectionRule const rule : {InspectionRule::UsEpa, InspectionRule::DeAu}) {
        std::string const document = reportJson(report, {"", "", "", false, 2026, {rule, {}}, {}});
        expectValid(document, "scan");
        EXPECT_TRUE(Json::parse(document)["inspection"].is_object());
        EXPECT_EQ(Json::parse(document)["findings"].back()["kind"], "no-verification-number");
    }
}

TEST(JsonSchema, RefusesAScanThatMissesATopic)
{
    VehicleReport report;
    report.modules = {{0x7E8, "", {}, {}, codeReport(), {}, {}, {}, {}, {}}};
    Json document = Json::parse(report.toJson());
    ASSERT_EQ(schemaErrors(document.dump(), "scan"), "");
    for (char const* topic : {"info", "codes", "freeze", "readiness", "monitors", "oxygen", "counters", "sensors"}) {
        Json wrong = document;
        wrong["modules"][0].erase(topic);
        EXPECT_NE(schemaErrors(wrong.dump(), "scan"), "") << topic;
    }
    document["modules"][0]["readiness"]["x"] = 1;
    EXPECT_NE(schemaErrors(document.dump(), "scan"), "");
}

TEST(JsonSchema, HoldsForALineOfTheLog)
{
    expectValid(toJsonLine(obd::MessageDataModel{"09:05:02", obd::MessageDataModel::Sent, "010C"}), "log");
    expectValid(toJsonLine(obd::MessageDataModel{"23:59:60", obd::MessageDataModel::Received, ""}), "log");
}

TEST(JsonSchema, HoldsForALineOfLive)
{
    LiveRow row;
    row.uid = 0x0C00;
    row.name = "Engine RPM";
    row.numeric = true;
    row.value = "1726";
    expectValid(toJsonLine(row, isoTime({})), "live");
}

TEST(JsonSchema, RefusesADocumentThatIsWrong)
{
    char const* const right = R"([{"id": "7E8", "name": "ECM", "answer": "read", "counters": []}])";
    EXPECT_EQ(schemaErrors(right, "counters"), "");
    for (char const* wrong : {R"([{"id": "7E8", "name": "ECM", "answer": "read"}])", // misses one
                              R"([{"id": "7E8", "name": "ECM", "answer": "read", "counters": [], "x": 1}])", // unknown
                              R"([{"id": "7e8", "name": "ECM", "answer": "read", "counters": []}])",  // small letters
                              R"([{"id": "7E8", "name": "", "answer": "read", "counters": []}])",     // empty text
                              R"([{"id": "7E8", "name": "ECM", "answer": "maybe", "counters": []}])", // unknown word
                              R"([{"id": "7E8", "name": "ECM", "answer": "read", "counters": {}}])",  // no list
                              R"({"id": "7E8"})", "[", ""}) {
        EXPECT_NE(schemaErrors(wrong, "counters"), "") << wrong;
    }
    EXPECT_NE(schemaErrors(R"([{"id": "7E8", "name": "ECM"}])", "codes"), "");
}

TEST(JsonSchema, TellsThePlaceOfAnError)
{
    std::string const errors = schemaErrors(
        R"([{"id": "7E8", "name": "ECM", "answer": "read", "counters": [{"name": "A", "value": -1}]}])", "counters");
    EXPECT_TRUE(errors.find("0/counters/0/value: -1") != std::string::npos) << errors;
}

} // namespace
