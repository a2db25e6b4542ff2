#include "libvelmora/report/finding/inspection.h"
#include "tests/libvelmora/report/carbuilder.h"

#include <gtest/gtest.h>

#include <algorithm>

namespace {

using namespace velmora;
using namespace testsupport;
using InspectionVerdict = InspectionReport::Verdict;

constexpr int thisYear = 2026;

ModuleReport incompleteModule(std::vector<std::string> const& monitors)
{
    ModuleReport module = soundModule();
    for (std::string const& monitor : monitors) {
        setIncomplete(module, monitor);
    }
    return module;
}

ModuleReport dieselModule(std::vector<std::string> const& incomplete)
{
    ModuleReport module = soundModule();
    module.readiness.monitors = {{"NMHC Catalyst", ReadinessStatus::Complete, {}},
                                 {"Boost Pressure", ReadinessStatus::Complete, {}},
                                 {"PM filter", ReadinessStatus::Complete, {}}};
    for (std::string const& monitor : incomplete) {
        setIncomplete(module, monitor);
    }
    return module;
}

InspectionVerdict verdict(ModuleReport const& module, InspectionRule rule, std::optional<int> year)
{
    return inspect(vehicleOf({module}), {rule, year}, thisYear).verdict;
}

TEST(Inspection, OfTheEpaCountsMonitorsByModelYear)
{
    constexpr InspectionRule rule = InspectionRule::UsEpa;
    ModuleReport const one = incompleteModule({"Catalyst"});
    ModuleReport const two = incompleteModule({"Catalyst", "Evaporative System"});
    ModuleReport const three = incompleteModule({"Catalyst", "Evaporative System", "Oxygen Sensor"});
    EXPECT_EQ(verdict(soundModule(), rule, 2005), InspectionVerdict::Ready);
    EXPECT_EQ(verdict(one, rule, 2001), InspectionVerdict::Ready);
    EXPECT_EQ(verdict(two, rule, 2001), InspectionVerdict::NotReady);
    EXPECT_EQ(verdict(two, rule, 2000), InspectionVerdict::Ready);
    EXPECT_EQ(verdict(three, rule, 1996), InspectionVerdict::NotReady);
    EXPECT_EQ(verdict(soundModule(), rule, 1995), InspectionVerdict::Unknown);
    EXPECT_EQ(verdict(incompleteModule({"Misfire", "Catalyst"}), rule, 2005), InspectionVerdict::Ready)
        << "not counted";
    ModuleReport coded = soundModule();
    coded.codes.lists[0] = readCodes(CodeKind::Confirmed, {"P0420"});
    EXPECT_EQ(verdict(coded, rule, 2005), InspectionVerdict::Ready) << "a code without the lamp";
    coded.codes.lamp = true;
    EXPECT_EQ(verdict(coded, rule, 2005), InspectionVerdict::NotReady);
    EXPECT_EQ(verdict(dieselModule({}), rule, 1997), InspectionVerdict::Unknown);
    ModuleReport silent = soundModule();
    silent.readiness = {TopicAnswer::Silent, {}, {}};
    EXPECT_EQ(verdict(silent, rule, 2005), InspectionVerdict::Unknown);
}

TEST(Inspection, OfCaliforniaNamesWhatMayBeIncomplete)
{
    constexpr InspectionRule rule = InspectionRule::UsCalifornia;
    ModuleReport const evap = incompleteModule({"Evaporative System"});
    ModuleReport const catalyst = incompleteModule({"Catalyst"});
    EXPECT_EQ(verdict(evap, rule, 2000), InspectionVerdict::Ready);
    EXPECT_EQ(verdict(catalyst, rule, 2000), InspectionVerdict::NotReady);
    EXPECT_EQ(verdict(catalyst, rule, 1999), InspectionVerdict::Ready);
    EXPECT_EQ(verdict(incompleteModule({"Catalyst", "Evaporative System"}), rule, 1999), InspectionVerdict::NotReady);
    EXPECT_EQ(verdict(dieselModule({"PM filter"}), rule, 2006), InspectionVerdict::NotReady);
    EXPECT_EQ(verdict(dieselModule({"PM filter", "NMHC Catalyst"}), rule, 2007), InspectionVerdict::Ready);
    EXPECT_EQ(verdict(dieselModule({"Boost Pressure"}), rule, 2007), InspectionVerdict::NotReady);
    ModuleReport module = soundModule();
    module.codes.lists[2] = readCodes(CodeKind::Permanent, {"P0420"});
    EXPECT_EQ(verdict(module, rule, 2009), InspectionVerdict::Ready);
    EXPECT_EQ(verdict(module, rule, 2010), InspectionVerdict::NotReady);
    module = soundModule();
    module.codes.lists[0] = readCodes(CodeKind::Confirmed, {"P0420"});
    EXPECT_EQ(verdict(module, rule, 2005), InspectionVerdict::NotReady) << "a stored code without the lamp";
    module.codes.lists[0] = {CodeKind::Confirmed, CodeList::Answer::Silent, {}, {}};
    EXPECT_EQ(verdict(module, rule, 2005), InspectionVerdict::Unknown);
}

TEST(Inspection, TakesTheModelYearOfANorthAmericanVinOrAsksForIt)
{
    ModuleReport module = soundModule();
    module.info.vin = "1FTEX1C85AF000001"; // position 7 is a letter: 2010
    InspectionReport const american = inspect(vehicleOf({module}), {InspectionRule::UsEpa, {}}, thisYear);
    EXPECT_EQ(american.modelYear, 2010);
    EXPECT_TRUE(american.yearByVin);
    EXPECT_EQ(inspect(vehicleOf({module}), {InspectionRule::UsEpa, 2003}, thisYear).modelYear, 2003);
    module.info.vin = "WVWZZZ1JZXW000001";
    InspectionReport const european = inspect(vehicleOf({module}), {InspectionRule::UsEpa, {}}, thisYear);
    EXPECT_EQ(european.verdict, InspectionVerdict::Unknown);
    EXPECT_NE(european.reasons.at(0).find("--model-year"), std::string::npos);
}

TEST(Inspection, ElsewhereLooksAtTheLamp)
{
    ModuleReport module = incompleteModule({"Catalyst", "Evaporative System"});
    EXPECT_EQ(verdict(module, InspectionRule::UkMot, {}), InspectionVerdict::Ready);
    EXPECT_EQ(verdict(module, InspectionRule::DeAu, {}), InspectionVerdict::Unknown) << "the exhaust decides";
    module.codes.lamp = true;
    EXPECT_EQ(verdict(module, InspectionRule::UkMot, {}), InspectionVerdict::NotReady);
    module.codes.lamp.reset();
    EXPECT_EQ(verdict(module, InspectionRule::UkMot, {}), InspectionVerdict::Unknown);
}

TEST(Inspection, ToldWithTheDateOfItsRule)
{
    for (char const* const word : {"us-epa", "us-california", "uk-mot", "de-au"}) {
        InspectionRule const rule = parseInspectionRule(word).value();
        EXPECT_STREQ(inspectionKey(rule), word);
        InspectionReport const report = inspect(vehicleOf({soundModule()}), {rule, 2012}, thisYear);
        EXPECT_NE(report.date.find("20"), std::string::npos) << word;
        EXPECT_EQ(report.notes.back(), "Rules change; ask the station.");
    }
    EXPECT_EQ(parseInspectionRule("none"), InspectionRule::None);
    EXPECT_EQ(parseInspectionRule("texas"), std::nullopt);
}

} // namespace
