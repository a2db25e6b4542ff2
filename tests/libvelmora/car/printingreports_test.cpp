// What a person reads of each report, whole: with all that it may hold, and with nothing.
#include <velmora/actions.h>
#include <velmora/report.h>
#include <velmora/topics.h>

#include <gtest/gtest.h>

#include <sstream>

namespace {

using namespace velmora;

template <typename Value>
std::string toldText(Value const& value)
{
    std::ostringstream text;
    text << value;
    return text.str();
}

TroubleCode const leanCode{"P0171", "Powertrain", {{"Generic", "System Too Lean Bank 1"}}};

TEST(PrintingReports, ShowCodesAndTheirLists)
{
    EXPECT_EQ(toldText(CodeKind::Confirmed) + toldText(CodeKind::Pending) + toldText(CodeKind::Permanent),
              "confirmedpendingpermanent");
    EXPECT_EQ(toldText(leanCode), "P0171 System Too Lean Bank 1");
    EXPECT_EQ(toldText(StoredCode{0x7E8, CodeKind::Pending, leanCode}), "7E8 pending P0171 System Too Lean Bank 1");
    CodeReport report;
    EXPECT_EQ(toldText(report), "Lamp: -");
    report.lamp = false;
    EXPECT_EQ(toldText(report), "Lamp: off");
    report.lamp = true;
    report.lists = {{CodeKind::Confirmed, CodeList::Answer::Read, "", {leanCode, leanCode}},
                    {CodeKind::Pending, CodeList::Answer::Read, "", {}},
                    {CodeKind::Permanent, CodeList::Answer::Refused, "", {}},
                    {CodeKind::Permanent, CodeList::Answer::Silent, "", {}},
                    {CodeKind::Permanent, CodeList::Answer::Unreadable, "", {}}};
    EXPECT_EQ(toldText(report), "Lamp: on\n"
                                "confirmed: P0171 System Too Lean Bank 1\n"
                                "confirmed: P0171 System Too Lean Bank 1\n"
                                "pending: none stored\n"
                                "permanent: refused\n"
                                "permanent: no answer\n"
                                "permanent: unreadable");
    VehicleReport vehicle;
    vehicle.adapter.device = "ELM327 v1.5";
    vehicle.protocol.name = "CAN";
    EXPECT_EQ(toldText(vehicle), "ELM327 v1.5, CAN");
    vehicle.modules.resize(1);
    vehicle.modules[0].id = 0x7E8;
    vehicle.modules[0].name = "ECM";
    EXPECT_EQ(toldText(vehicle), "ELM327 v1.5, CAN\n7E8 ECM\nLamp: -");
}

TEST(PrintingReports, ShowTestsWithTheLimitsThatTheyHave)
{
    LimitTest test{1, "Catalyst", "0.4", "0", "1", "V", LimitTest::Verdict::Passed};
    EXPECT_EQ(toldText(test), "passed: Catalyst 0.4 (0 to 1) V");
    test.minimum.clear();
    EXPECT_EQ(toldText(test), "passed: Catalyst 0.4 (- to 1) V");
    test.maximum.clear();
    test.verdict = LimitTest::Verdict::None;
    EXPECT_EQ(toldText(test), "constant: Catalyst 0.4 V");
    test.minimum = "0";
    test.unit.clear();
    test.verdict = LimitTest::Verdict::Failed;
    EXPECT_EQ(toldText(test), "failed: Catalyst 0.4 (0 to -)");

    MonitorsReport monitors;
    EXPECT_EQ(toldText(monitors), "not supported");
    monitors.answer = TopicAnswer::Read;
    EXPECT_EQ(toldText(monitors), "read");
    monitors.monitors = {{1, "A", {test, test}}, {2, "B", {test}}};
    EXPECT_EQ(toldText(monitors), "A: failed: Catalyst 0.4 (0 to -)\nA: failed: Catalyst 0.4 (0 to -)\n"
                                  "B: failed: Catalyst 0.4 (0 to -)");
    OxygenReport oxygen;
    oxygen.answer = TopicAnswer::Refused;
    EXPECT_EQ(toldText(oxygen), "refused");
    oxygen.sensors = {{obd::OxygenSensorLocation(), {test}}, {obd::OxygenSensorLocation(), {}}};
    std::string const location = toldText(OxygenReport{TopicAnswer::Read, {}, false, {{{}, {}}}});
    EXPECT_EQ(toldText(oxygen), location + "\n" + location + ": failed: Catalyst 0.4 (0 to -)\n" + location);
}

TEST(PrintingReports, ShowFramesMonitorsAndCounters)
{
    FreezeReport freeze;
    freeze.number = 3;
    EXPECT_EQ(toldText(freeze), "frame 3: not supported");
    freeze.answer = TopicAnswer::Read;
    EXPECT_EQ(toldText(freeze), "frame 3: none stored");
    freeze.frame = FreezeFrame{leanCode, {{"Speed", "50", "km/h"}, {"State", "open", ""}, {"Load", {}, "%"}}};
    EXPECT_EQ(toldText(freeze), "P0171 System Too Lean Bank 1\nSpeed: 50 km/h\nState: open\nLoad: -");

    ReadinessReport readiness;
    readiness.answer = TopicAnswer::Silent;
    EXPECT_EQ(toldText(readiness), "no answer");
    readiness.monitors = {{"Misfire", ReadinessStatus::Complete, {}}, {"Catalyst", ReadinessStatus::NotComplete, {}}};
    EXPECT_EQ(toldText(readiness), "Misfire: complete\nCatalyst: not complete");

    CountersReport counters;
    counters.answer = TopicAnswer::Unreadable;
    EXPECT_EQ(toldText(counters), "unreadable");
    counters.counters = {{"A", 1}, {"B", 20}};
    EXPECT_EQ(toldText(counters), "A: 1\nB: 20");
}

TEST(PrintingReports, ShowWhatAModuleTellsOfItself)
{
    InfoReport info;
    EXPECT_EQ(toldText(info), "");
    info.erotan = "E1";
    EXPECT_EQ(toldText(info), "Type approval: E1");
    info.description = "Engine";
    info.standard = "EOBD";
    info.protocol = "CAN";
    info.vin = "V";
    info.calibrations = {{"C1", "00"}, {"C2", "11"}};
    info.engineSerialNumber = "N";
    info.sinceCleared.distance = InfoReport::Reading{"12", "km"};
    EXPECT_EQ(toldText(info), "Description: Engine\nStandard: EOBD\nProtocol: CAN\nVIN: V\nCalibration: C1 00\n"
                              "Calibration: C2 11\nEngine number: N\nType approval: E1\nDistance since cleared: 12 km");
    InfoReport bare;
    bare.sinceCleared.distance = InfoReport::Reading{"12", ""};
    EXPECT_EQ(toldText(bare), "Distance since cleared: 12");
}

TEST(PrintingReports, ShowRoutinesAndClearing)
{
    Routine const leak{1, "Leak test", "Closes the valve."};
    EXPECT_EQ(toldText(leak), "01 Leak test");
    EXPECT_EQ(toldText(RoutinesReport{TopicAnswer::Read, {leak, leak}}), "01 Leak test\n01 Leak test");
    EXPECT_EQ(toldText(RoutinesReport{TopicAnswer::Read, {}}), "read");
    EXPECT_EQ(toldText(RoutineRun{leak, RoutineRun::Result::Refused, "busy (21)"}), "01 Leak test: refused: busy (21)");
    EXPECT_EQ(toldText(RoutineRun{leak, RoutineRun::Result::NoAnswer, ""}), "01 Leak test: no answer");
    EXPECT_EQ(toldText(ClearReport{ClearReport::Result::Cleared, ""}), "cleared");
    EXPECT_EQ(toldText(ClearReport{ClearReport::Result::Refused, "busy"}), "refused: busy");
    EXPECT_EQ(toldText(ModuleTopic<ClearReport>{0x7E9, "TCM", {ClearReport::Result::NoAnswer, ""}}),
              "7E9 TCM\nno answer");
}

} // namespace
