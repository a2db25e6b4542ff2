#include "libvelmora/report/finding/findings.h"
#include "libvelmora/report/finding/testlimits.h"
#include "libvelmora/report/troublecode.h"
#include "tests/libvelmora/report/carbuilder.h"

#include <gtest/gtest.h>

#include <algorithm>

namespace {

using namespace velmora;
using namespace testsupport;

std::vector<Finding> suggestions(VehicleReport const& report)
{
    std::vector<Finding> list = findings(report);
    std::erase_if(list, [](Finding const& each) { return !isSuggestion(each); });
    for (Finding const& each : list) {
        EXPECT_FALSE(each.evidence.empty()) << each.kind;
        for (Evidence const& evidence : each.evidence) {
            EXPECT_FALSE(evidence.text.empty()) << each.kind;
        }
    }
    return list;
}

std::vector<std::string> kinds(VehicleReport const& report)
{
    std::vector<std::string> list;
    for (Finding const& each : suggestions(report)) {
        list.emplace_back(each.kind);
    }
    return list;
}

using Kinds = std::vector<std::string>;

TEST(TroubleCodes, AreOfMakersByTheirBeginning)
{
    for (char const* const code : {"P1000", "P1F", "P3000", "P33FF", "B1000", "B2FFF", "C1234", "U2000"}) {
        EXPECT_TRUE(isMakersCode(code)) << code;
    }
    for (char const* const code : {"P0420", "P2000", "P3400", "P3FFF", "B0001", "B3000", "C0100", "U3FFF", "P1", ""}) {
        EXPECT_FALSE(isMakersCode(code)) << code;
    }
}

TEST(Suggestions, AreNoneForASoundCar)
{
    EXPECT_EQ(kinds(vehicleOf({soundModule()})), Kinds());
}

TEST(Suggestions, TellClearedCodesByTwoOfThreeSigns)
{
    struct Case
    {
        double warmUps;
        double km;
        int incomplete;
        bool found;
    };
    for (Case const& each : {Case{5, 80, 0, true}, Case{6, 80, 0, false}, Case{5, 81, 0, false}, Case{6, 80, 2, true},
                             Case{5, 81, 2, true}, Case{6, 81, 2, false}, Case{5, 500, 1, false},
                             Case{255, 65535, 2, false}, Case{0, 0, 0, true}}) {
        ModuleReport module = soundModule();
        setValue(module, 0x30, {each.warmUps});
        setValue(module, 0x31, {each.km}, {}, "km");
        setIncomplete(module, each.incomplete > 0 ? "Catalyst" : "");
        setIncomplete(module, each.incomplete > 1 ? "Evaporative System" : "");
        std::vector<Finding> const found = suggestions(vehicleOf({module}));
        EXPECT_EQ(!found.empty(), each.found) << each.warmUps << " " << each.km << " " << each.incomplete;
        if (!found.empty()) {
            EXPECT_STREQ(found[0].kind, "codes-cleared-recently");
            EXPECT_NE(found[0].text.find("suggests"), std::string::npos);
            EXPECT_EQ(found[0].text.find("strongly"), std::string::npos);
        }
    }
}

// A counter that stands at its end has gone on for nobody knows how long.
TEST(Suggestions, TellTheRunTimeSinceAClearUnlessItsCounterIsFull)
{
    for (bool const full : {false, true}) {
        ModuleReport module = soundModule();
        setValue(module, 0x30, {3});
        setValue(module, 0x31, {12}, {}, "km");
        setValue(module, 0x4E, {full ? 65535.0 : 65534.0}, "65534", "min");
        std::vector<Finding> const found = suggestions(vehicleOf({module}));
        ASSERT_EQ(found.size(), 1U);
        bool told = false;
        for (Evidence const& each : found[0].evidence) {
            told = told || each.text == "the engine ran for 65534 min since codes were cleared";
        }
        EXPECT_EQ(told, !full);
    }
}

// The monitors that run all the time are complete soon after a clear, and say nothing.
TEST(Suggestions, CountNoContinuousMonitors)
{
    ModuleReport module = soundModule();
    setValue(module, 0x30, {3});
    setIncomplete(module, "Misfire");
    setIncomplete(module, "Catalyst");
    EXPECT_EQ(kinds(vehicleOf({module})), Kinds());
    setIncomplete(module, "Oxygen Sensor");
    EXPECT_EQ(kinds(vehicleOf({module})), Kinds{"codes-cleared-recently"});
}

TEST(Suggestions, AreStrongerWithAPermanentCodeAlone)
{
    ModuleReport module = soundModule();
    module.codes.lists[2] = readCodes(CodeKind::Permanent, {"P0420"});
    EXPECT_EQ(kinds(vehicleOf({module})), Kinds{"permanent-code-alone"});
    setValue(module, 0x30, {1});
    setValue(module, 0x31, {12}, {}, "km");
    std::vector<Finding> const found = suggestions(vehicleOf({module}));
    ASSERT_EQ(found.size(), 1U);
    EXPECT_EQ(found[0].text, "strongly suggests that codes were cleared within about 12 km");
    module.codes.lists[0] = readCodes(CodeKind::Confirmed, {"P0420"});
    EXPECT_EQ(suggestions(vehicleOf({module}))[0].text, "suggests that codes were cleared within about 12 km");
    module.values.clear();
    module.codes.lists[0].answer = CodeList::Answer::Silent;
    module.codes.lists[0].codes.clear();
    EXPECT_EQ(kinds(vehicleOf({module})), Kinds()) << "a list that was not told is not empty";
}

TEST(Suggestions, TellALampThatNoModuleExplains)
{
    ModuleReport engine = soundModule();
    ModuleReport gearbox = soundModule(0x7E9);
    engine.codes.lamp = true;
    EXPECT_EQ(kinds(vehicleOf({engine, gearbox})), Kinds{"lamp-without-code"});
    gearbox.codes.lamp = true;
    gearbox.codes.lists[0] = readCodes(CodeKind::Confirmed, {"P0700"});
    EXPECT_EQ(kinds(vehicleOf({engine, gearbox})), Kinds()) << "the other module explains it";
    gearbox = soundModule(0x7E9);
    engine.codes.lists[0].answer = CodeList::Answer::Silent;
    EXPECT_EQ(kinds(vehicleOf({engine, gearbox})), Kinds()) << "its codes are not known";
}

LimitTest limitTest(std::string const& value, std::string const& min, std::string const& max)
{
    return {0x80, "Test", value, min, max, "V", LimitTest::Verdict::Passed};
}

TEST(Suggestions, KnowHowCloseALimitIs)
{
    struct Case
    {
        char const* value;
        char const* min;
        char const* max;
        Closeness closeness;
    };
    for (Case const& each : {Case{"0.91", "0.10", "1.00", Closeness::NearMaximum}, // exactly a tenth of the span
                             Case{"0.90", "0.10", "1.00", Closeness::Far},         //
                             Case{"0.19", "0.10", "1.00", Closeness::NearMinimum}, //
                             Case{"1.00", "0.10", "1.00", Closeness::Far},         // at the limit has passed
                             Case{"0.02", "0.00", "1.00", Closeness::Far},         // no minimum
                             Case{"0.95", "0.00", "1.00", Closeness::NearMaximum}, // of the limit
                             Case{"65000", "100", "65535", Closeness::Far},        // the end of what can be counted
                             Case{"105", "100", "65535", Closeness::NearMinimum},  // so it has a minimum only
                             Case{"2000", "100", "65535", Closeness::Far},         //
                             Case{"-29.0", "-30.00", "327.67", Closeness::NearMinimum},
                             Case{"39.0", "-327.68", "40.00", Closeness::NearMaximum},
                             Case{"0.5", "2", "1", Closeness::Far}, // limits that can't be
                             Case{"0", "0", "0", Closeness::Far},   //
                             Case{"", "0", "1", Closeness::Far},    //
                             Case{"105", "100", "", Closeness::NearMinimum}}) {
        EXPECT_EQ(closenessOf(limitTest(each.value, each.min, each.max)), each.closeness)
            << each.value << " in " << each.min << " to " << each.max;
    }
    LimitTest notRun = limitTest("0.95", "0.10", "1.00");
    notRun.verdict = LimitTest::Verdict::NoResult;
    EXPECT_EQ(closenessOf(notRun), Closeness::Far);
}

TEST(Suggestions, TellResultsCloseToALimitOfCompleteMonitors)
{
    ModuleReport module = soundModule();
    module.monitors = {TopicAnswer::Read, {{0x21, "Catalyst Monitor Bank 1", {limitTest("0.97", "0.10", "1.00")}}}};
    EXPECT_EQ(kinds(vehicleOf({module})), Kinds{"close-to-limit"});
    setIncomplete(module, "Catalyst");
    EXPECT_EQ(kinds(vehicleOf({module})), Kinds()) << "of an incomplete monitor";
    module.monitors.monitors[0].id = 0xE5;
    EXPECT_EQ(kinds(vehicleOf({module})), Kinds{"close-to-limit"});
    module.monitors.monitors[0].tests[0].unit.clear();
    EXPECT_EQ(kinds(vehicleOf({module})), Kinds()) << "a maker's number of no unit";
}

TEST(Suggestions, TellMisfireCountsAsCounts)
{
    ModuleReport module = soundModule();
    module.monitors = {TopicAnswer::Read,
                       {{0xA2,
                         "Misfire Cylinder 1 Data",
                         {{0x0B, "Average", "0", "0", "65535", "", LimitTest::Verdict::Passed},
                          {0x0C, "This cycle", "7", "0", "65535", "", LimitTest::Verdict::Passed}}}}};
    std::vector<Finding> const found = suggestions(vehicleOf({module}));
    ASSERT_EQ(found.size(), 1U);
    EXPECT_STREQ(found[0].kind, "misfire-counts");
    ASSERT_EQ(found[0].evidence.size(), 1U);
    EXPECT_EQ(found[0].evidence[0].text, "Misfire Cylinder 1 Data, This cycle: 7");
}

ModuleReport drivingModule(std::vector<double> const& shortTrim, std::vector<double> const& longTrim)
{
    ModuleReport module = soundModule();
    setValue(module, 0x03, {}, "Closed loop (1)");
    setValue(module, 0x05, {88, 89}, {}, "\u00B0C");
    setValue(module, 0x06, shortTrim);
    setValue(module, 0x07, longTrim);
    return module;
}

TEST(Suggestions, TellFuelTrimsThatLastAndOnlyThose)
{
    EXPECT_EQ(kinds(vehicleOf({drivingModule({3, 3}, {7, 7})})), Kinds()) << "10 % together";
    std::vector<Finding> away = suggestions(vehicleOf({drivingModule({4, 9}, {7, 7})}));
    ASSERT_EQ(away.size(), 1U);
    EXPECT_STREQ(away[0].kind, "fuel-trim");
    EXPECT_EQ(away[0].severity, Severity::Note);
    EXPECT_NE(away[0].text.find("adds 11.0 %"), std::string::npos) << away[0].text;
    std::vector<Finding> far = suggestions(vehicleOf({drivingModule({-5, -6}, {-21, -21})}));
    ASSERT_EQ(far.size(), 1U);
    EXPECT_EQ(far[0].severity, Severity::Warning);
    EXPECT_NE(far[0].text.find("takes 26.0 %"), std::string::npos) << far[0].text;
    EXPECT_EQ(kinds(vehicleOf({drivingModule({20, -20}, {0, 0})})), Kinds()) << "to and fro";
    EXPECT_EQ(kinds(vehicleOf({drivingModule({30}, {0})})), Kinds()) << "one reading";
    ModuleReport open = drivingModule({30, 30}, {0, 0});
    open.values[0].value = "Open loop (0)";
    EXPECT_EQ(kinds(vehicleOf({open})), Kinds());
    ModuleReport cold = drivingModule({30, 30}, {0, 0});
    cold.values[1].samples = {69, 70};
    EXPECT_EQ(kinds(vehicleOf({cold})), Kinds());
    ModuleReport both = drivingModule({15, 15}, {0, 0});
    setValue(both, 0x08, {14, 14});
    setValue(both, 0x09, {0, 0});
    EXPECT_EQ(kinds(vehicleOf({both})), (Kinds{"fuel-trim", "fuel-trim"}));
    EXPECT_NE(suggestions(vehicleOf({both}))[0].evidence.back().text.find("both banks"), std::string::npos);
}

TEST(Suggestions, TellAnEngineThatStaysCold)
{
    auto const car = [](double seconds, double coolant, std::vector<double> const& ambient) {
        ModuleReport module = soundModule();
        setValue(module, 0x1F, {seconds}, {}, "s");
        setValue(module, 0x05, {coolant, coolant}, {}, "\u00B0C");
        if (!ambient.empty()) {
            setValue(module, 0x46, ambient, {}, "\u00B0C");
        }
        return kinds(vehicleOf({module}));
    };
    EXPECT_EQ(car(900, 69, {20}), Kinds{"coolant-not-warm"});
    EXPECT_EQ(car(900, 69, {}), Kinds{"coolant-not-warm"});
    EXPECT_EQ(car(899, 69, {20}), Kinds());
    EXPECT_EQ(car(900, 70, {20}), Kinds());
    EXPECT_EQ(car(900, 69, {-7}), Kinds());
    EXPECT_EQ(car(900, -40, {20}), Kinds()) << "no sensor";
    EXPECT_EQ(car(10, 116, {20}), Kinds{"coolant-hot"});
}

TEST(Suggestions, TellAVoltageOutOfRangeByTheModuleFirst)
{
    auto const car = [](std::vector<double> const& rpm, std::vector<double> const& volts, float adapter) {
        ModuleReport module = soundModule();
        setValue(module, 0x0C, rpm);
        if (!volts.empty()) {
            setValue(module, 0x42, volts, "12.1", "V");
        }
        VehicleReport report = vehicleOf({module});
        report.adapter.volts = adapter;
        return kinds(report);
    };
    EXPECT_EQ(car({800, 790}, {12.9, 12.8}, 14.0F), Kinds{"voltage"});
    EXPECT_EQ(car({800, 790}, {12.9, 13.0}, 14.0F), Kinds()) << "not at both";
    EXPECT_EQ(car({800, 790}, {15.1, 15.2}, 14.0F), Kinds{"voltage"});
    EXPECT_EQ(car({800, 790}, {}, 12.4F), Kinds{"voltage"});
    EXPECT_EQ(car({0, 0}, {12.1, 12.0}, 12.0F), Kinds());
    EXPECT_EQ(car({0, 0}, {11.9, 11.8}, 12.0F), Kinds{"voltage"});
    EXPECT_EQ(car({0, 700}, {11.9, 11.8}, 12.0F), Kinds()) << "just started";
    EXPECT_EQ(car({800, 800}, {24.1, 24.2}, 24.0F), Kinds()) << "two batteries";
    EXPECT_EQ(car({}, {11.0, 11.0}, 11.0F), Kinds()) << "nobody knows whether the engine runs";
}

TEST(Suggestions, TellVinsThatDifferAndCalibrationsWithoutProof)
{
    ModuleReport engine = soundModule();
    ModuleReport gearbox = soundModule(0x7E9);
    engine.info.vin = "1M8GDM9AXKP042788";
    gearbox.info.vin = "00000000000000000";
    EXPECT_EQ(kinds(vehicleOf({engine, gearbox})), Kinds());
    gearbox.info.vin = "1G1JC5444R7252367";
    EXPECT_EQ(kinds(vehicleOf({engine, gearbox})), Kinds{"vins-differ"});
    gearbox.info.vin = engine.info.vin;
    engine.info.calibrations = {{"A", "1791BC82"}};
    EXPECT_EQ(kinds(vehicleOf({engine, gearbox})), Kinds());
    for (char const* const number : {"", "00000000", "FFFFFFFF"}) {
        engine.info.calibrations = {{"A", number}};
        EXPECT_EQ(kinds(vehicleOf({engine, gearbox})), Kinds{"no-verification-number"}) << number;
    }
}

TEST(Suggestions, LeadToTheirData)
{
    ModuleReport module = soundModule(0x7E9);
    module.codes.lamp = true;
    VehicleReport const report = vehicleOf({soundModule(), module});
    Finding const found = suggestions(report).at(0);
    EXPECT_EQ(anchorOf(found.evidence[0]), "codes-7E9");
    EXPECT_EQ(pointerTo(found.evidence[0], report), "/modules/1/codes");
    EXPECT_EQ(pointerTo({DataTopic::Adapter}, report), "/adapter");
}

} // namespace
