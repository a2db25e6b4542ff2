#include "libvelmora/report/finding/findings.h"
#include "libvelmora/report/plain/reporttext.h"

#include <velmora/findings.h>

#include <gtest/gtest.h>

namespace {

using namespace velmora;

TroubleCode const slowSensor{"P0133", "Powertrain", {{"Generic", "Slow"}, {"Ford", "Slower"}}};
TroubleCode const lean{"P0171", "Powertrain", {{"Generic", "Lean"}}};

ModuleReport module(unsigned int id, std::string const& name)
{
    ModuleReport report{id, name, {}, {}, {}, {}, {}, {}, {}, {}};
    report.codes.lamp = false;
    return report;
}

CodeList list(CodeKind kind, std::vector<TroubleCode> const& codes)
{
    return {kind, CodeList::Answer::Read, {}, codes};
}

LimitTest monitorTest(std::string const& description, LimitTest::Verdict verdict)
{
    return {1, description, "1", "0", "2", "", verdict};
}

TEST(Findings, AreNoneForAHealthyVehicle)
{
    VehicleReport report;
    report.modules = {module(0x7E8, "ECM")};
    report.modules[0].codes = {false, {list(CodeKind::Confirmed, {})}};
    report.modules[0].readiness = {
        TopicAnswer::Read,
        false,
        {{"Catalyst", ReadinessStatus::Complete, {}}, {"EGR", ReadinessStatus::NotAvailable, {}}}};
    report.modules[0].monitors = {
        TopicAnswer::Read,
        {{1, "A", {monitorTest("B", LimitTest::Verdict::Passed), monitorTest("C", LimitTest::Verdict::NoResult)}}}};
    EXPECT_TRUE(findings(report).empty());
    EXPECT_EQ(toText(findings(report), Style()), "Findings\n  none in what the vehicle told\n");
}

TEST(Findings, TellACodeOnceWithItsKinds)
{
    VehicleReport report;
    report.modules = {module(0x7E8, "ECM"), module(0x7E9, "")};
    report.modules[0].codes = {true,
                               {list(CodeKind::Confirmed, {slowSensor, lean}), list(CodeKind::Pending, {lean}),
                                list(CodeKind::Permanent, {slowSensor})}};
    report.modules[1].codes = {false, {list(CodeKind::Pending, {slowSensor})}};
    EXPECT_EQ(toText(findings(report), Style()), "Findings\n"
                                                 "  7E8 ECM  lamp                  the malfunction indicator is on\n"
                                                 "  7E8 ECM  confirmed, permanent  P0133 Slow\n"
                                                 "  7E8 ECM  confirmed, pending    P0171 Lean\n"
                                                 "  7E9      pending               P0133 Slow\n");
}

TEST(Findings, TellFailedTestsAndWhatIsNotComplete)
{
    VehicleReport report;
    report.modules = {module(0x10, "ECM")};
    report.modules[0].readiness = {TopicAnswer::Read, false, {{"Catalyst", ReadinessStatus::NotComplete, {}}}};
    report.modules[0].monitors = {
        TopicAnswer::Read,
        {{1,
          "Monitor",
          {monitorTest("Count", LimitTest::Verdict::Failed), monitorTest("C", LimitTest::Verdict::Passed)}}}};
    report.modules[0].oxygen = {
        TopicAnswer::Read,
        true,
        false,
        {{obd::OxygenSensorLocation::Bank1Sensor2, {monitorTest("Voltage", LimitTest::Verdict::Failed)}}}};
    EXPECT_EQ(toText(findings(report), Style()), "Findings\n"
                                                 "  10 ECM  failed test   Monitor: Count\n"
                                                 "  10 ECM  failed test   Bank 1 sensor 2: Voltage\n"
                                                 "  10 ECM  not complete  Catalyst\n");
}

TEST(Findings, TellAModuleThatHidesItsCodes)
{
    VehicleReport report;
    report.modules = {module(0x7E8, "ECM")};
    report.modules[0].codes = {{}, {{CodeKind::Confirmed, CodeList::Answer::Silent, {}, {}}}};
    EXPECT_EQ(toText(findings(report), Style()), "Findings\n  7E8 ECM  not reported  lamp and confirmed codes\n");
    report.modules[0].codes.lamp = false;
    EXPECT_EQ(toText(findings(report), Style()), "Findings\n  7E8 ECM  not reported  confirmed codes\n");
    report.modules[0].codes.lists[0].offered = false;
    EXPECT_TRUE(findings(report).empty()) << "the module has no such list";
    report.modules[0].codes.lamp.reset();
    report.modules[0].codes.lampAnswer = TopicAnswer::NotOffered;
    EXPECT_TRUE(untold(report.modules[0].codes).empty()) << "nor a lamp";
    report.modules[0].offers = TopicAnswer::Silent;
    EXPECT_EQ(toText(findings(report), Style()),
              "Findings\n  7E8 ECM  not reported  all that it supports (no answer)\n");
}

TEST(Findings, ShowWhatTheDataSuggestsWithReasonsAndDoubts)
{
    VehicleReport report;
    report.modules = {module(0x7E8, "ECM")};
    report.modules[0].codes = {true, {list(CodeKind::Confirmed, {})}};
    EXPECT_EQ(toText(findings(report), Style()),
              "Findings\n"
              "  7E8 ECM  lamp  the malfunction indicator is on\n"
              "\n"
              "What the data suggests\n"
              "  7E8 ECM  lamp without code\n"
              "    the lamp is commanded on, and no module that commands it has a confirmed\n"
              "    code\n"
              "    because\n"
              "    - 7E8 ECM commands the lamp on and tells no confirmed code\n"
              "    it may also be\n"
              "    - a reason outside of OBD, which the maker's own tool would show\n"
              "    - a code that came or went while the report was made\n");
}

TEST(Findings, AreMarkedByWeight)
{
    VehicleReport report;
    report.modules = {module(0x7E8, "ECM")};
    report.modules[0].codes = {true, {list(CodeKind::Confirmed, {slowSensor}), list(CodeKind::Pending, {lean})}};
    std::vector<Finding> const found = findings(report);
    ASSERT_EQ(found.size(), 3U);
    EXPECT_EQ(found[0].severity, Severity::Bad);
    EXPECT_EQ(found[1].severity, Severity::Bad);
    EXPECT_EQ(found[2].severity, Severity::Warning) << "a pending code is none yet";
}

TEST(Findings, TellNoMakersMeaningAsAFact)
{
    VehicleReport report;
    report.modules = {module(0x10, "ECM")};
    report.modules[0].codes.lists = {
        list(CodeKind::Confirmed, {{"P1105", "Powertrain", {{"Acura", "A"}, {"Ford", "F"}}, {}}})};
    EXPECT_EQ(findings(report).at(0).text, "P1105 maker-specific, 2 meanings");
    applyMaker(report.modules[0].codes, {MakerChoice::By::Vin, "Ford"});
    EXPECT_EQ(findings(report).at(0).text, "P1105 F");
}

} // namespace
