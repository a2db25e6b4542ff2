// What is told of an inspection: each reason that a rule finds, in the order in which it looks.
#include "libvelmora/report/finding/inspection.h"
#include "tests/libvelmora/report/carbuilder.h"

#include <gtest/gtest.h>

namespace {

using namespace velmora;
using namespace testsupport;

using Reasons = std::vector<std::string>;

InspectionReport inspected(std::vector<ModuleReport> const& modules, InspectionRule rule, std::optional<int> year = {})
{
    return inspect(vehicleOf(modules), {rule, year}, 2026);
}

Reasons reasonsOf(std::vector<ModuleReport> const& modules, InspectionRule rule, std::optional<int> year = {})
{
    return inspected(modules, rule, year).reasons;
}

ModuleReport codedModule(bool lamp)
{
    ModuleReport module = soundModule();
    module.codes.lamp = lamp;
    module.codes.lists[0] = readCodes(CodeKind::Confirmed, {"P0420", "P0300"});
    module.codes.lists[1] = readCodes(CodeKind::Pending, {"P0171"});
    module.codes.lists[2] = readCodes(CodeKind::Permanent, {"P0421"});
    setIncomplete(module, "Catalyst");
    setIncomplete(module, "Oxygen Sensor");
    return module;
}

ModuleReport dieselOf(std::vector<std::string> const& incomplete)
{
    ModuleReport module = soundModule();
    module.readiness.monitors = {{"NMHC Catalyst", ReadinessStatus::Complete, {}},
                                 {"PM filter", ReadinessStatus::Complete, {}}};
    for (std::string const& monitor : incomplete) {
        setIncomplete(module, monitor);
    }
    return module;
}

TEST(InspectionReasons, OfTheEpa)
{
    constexpr InspectionRule rule = InspectionRule::UsEpa;
    EXPECT_EQ(reasonsOf({codedModule(false)}, rule, 2000),
              (Reasons{"the lamp is not commanded on", "2 confirmed codes: P0420, P0300",
                       "not complete: Catalyst, Oxygen Sensor", "for this model year up to 2 may be incomplete"}));
    EXPECT_EQ(reasonsOf({soundModule()}, rule, 2001),
              (Reasons{"the lamp is not commanded on", "all monitors that count have run",
                       "for this model year up to 1 may be incomplete"}));
    EXPECT_EQ(reasonsOf({soundModule()}, rule, 1995), Reasons{"the rule begins with model year 1996"});
    Reasons const untold = {"what the rule says of diesels before model year 1998 is not known here"};
    EXPECT_EQ(reasonsOf({dieselOf({})}, rule, 1997), untold);
    EXPECT_EQ(inspected({dieselOf({})}, rule, 1998).verdict, InspectionReport::Verdict::Ready);
    EXPECT_EQ(inspected({soundModule()}, rule, 1996).verdict, InspectionReport::Verdict::Ready);
    EXPECT_EQ(reasonsOf({dieselOf({})}, InspectionRule::UsCalifornia, 1997), untold);
    ModuleReport const nothing{0x7E8, "ECM", {}, {}, {}, {}, {}, {}, {}, {}};
    EXPECT_EQ(reasonsOf({nothing}, rule, 2010),
              (Reasons{"no module told whether the lamp is commanded on", "no module told which monitors have run"}));
}

TEST(InspectionReasons, OfCalifornia)
{
    constexpr InspectionRule rule = InspectionRule::UsCalifornia;
    std::string const lamp = "the lamp is commanded on";
    std::string const off = "the lamp is not commanded on";
    std::string const stored = "2 confirmed codes: P0420, P0300";
    std::string const two = "not complete: Catalyst, Oxygen Sensor";
    EXPECT_EQ(reasonsOf({codedModule(true)}, rule, 2010),
              (Reasons{lamp, stored, "1 permanent codes: P0421", two,
                       "for this model year only these may be incomplete: Evaporative System"}));
    EXPECT_EQ(reasonsOf({codedModule(true)}, rule, 1999),
              (Reasons{lamp, stored, two, "for this model year up to 1 may be incomplete"}));
    EXPECT_EQ(inspected({soundModule()}, rule, 1997).verdict, InspectionReport::Verdict::Ready) << "petrol";
    EXPECT_EQ(reasonsOf({dieselOf({})}, rule, 1998),
              (Reasons{off, "all monitors that count have run", "for this model year none may be incomplete"}));
    EXPECT_EQ(inspected({dieselOf({})}, rule, 2006).verdict, InspectionReport::Verdict::Ready);
    EXPECT_EQ(reasonsOf({dieselOf({"PM filter"})}, rule, 2007),
              (Reasons{off, "not complete: PM filter",
                       "for this model year only these may be incomplete: PM filter, NMHC Catalyst"}));
    ModuleReport silent = codedModule(true);
    silent.codes.lists[0] = {CodeKind::Confirmed, CodeList::Answer::Silent, {}, {}};
    InspectionReport const report = inspected({silent}, rule, 2009);
    EXPECT_EQ(report.reasons.at(1), "7E8 ECM did not tell its confirmed codes");
    EXPECT_EQ(report.verdict, InspectionReport::Verdict::NotReady) << "what is not known makes no failure good";
    silent = soundModule();
    silent.codes.lists[0] = {CodeKind::Confirmed, CodeList::Answer::Refused, {}, {}, false};
    EXPECT_EQ(inspected({silent}, rule, 2009).verdict, InspectionReport::Verdict::Ready) << "it has no such list";
}

TEST(InspectionReasons, OfEurope)
{
    std::string const free = "which monitors have run does not count";
    EXPECT_EQ(reasonsOf({codedModule(true)}, InspectionRule::UkMot), (Reasons{"the lamp is commanded on", free}));
    EXPECT_EQ(reasonsOf({codedModule(false)}, InspectionRule::DeAu),
              (Reasons{"the lamp is not commanded on", "2 confirmed codes: P0420, P0300", free}));
    EXPECT_EQ(reasonsOf({soundModule()}, InspectionRule::DeAu), (Reasons{"the lamp is not commanded on", free}));
    EXPECT_FALSE(inspected({soundModule()}, InspectionRule::UkMot).yearByVin);
    EXPECT_FALSE(inspected({soundModule()}, InspectionRule::UkMot, 2012).modelYear) << "it does not go by the year";
}

TEST(InspectionReasons, OfAllModulesTogether)
{
    ModuleReport off = soundModule();
    ModuleReport on = soundModule(0x7E9);
    ModuleReport untold = soundModule(0x7EA);
    on.codes.lamp = true;
    untold.codes.lamp.reset();
    untold.readiness = {};
    for (std::vector<ModuleReport> const& modules : {std::vector{on, off}, {off, on, untold}}) {
        EXPECT_EQ(inspected(modules, InspectionRule::UkMot).verdict, InspectionReport::Verdict::NotReady);
    }
    EXPECT_EQ(inspected({off, untold}, InspectionRule::UkMot).verdict, InspectionReport::Verdict::Ready);
    EXPECT_EQ(inspected({off, untold}, InspectionRule::UsEpa, 2010).verdict, InspectionReport::Verdict::Ready);
    EXPECT_EQ(inspected({dieselOf({}), untold}, InspectionRule::UsEpa, 1997).verdict,
              InspectionReport::Verdict::Unknown);
    setIncomplete(off, "Catalyst");
    setIncomplete(on, "Catalyst");
    EXPECT_EQ(reasonsOf({off, on}, InspectionRule::UsEpa, 2010).at(1), "not complete: Catalyst") << "told once";
}

TEST(InspectionReasons, GoByTheYearThatAllNumbersTell)
{
    ModuleReport first = soundModule();
    ModuleReport second = soundModule(0x7E9);
    auto const year = [&](char const* one, char const* other) {
        first.info.vin = one;
        second.info.vin = other;
        return inspected({first, second}, InspectionRule::UsEpa).modelYear;
    };
    char const* const of2010 = "1FTEX1C85AF000001";
    EXPECT_EQ(year("", of2010), 2010);
    EXPECT_EQ(year("nonsense", of2010), 2010);
    EXPECT_EQ(year(of2010, of2010), 2010);
    EXPECT_EQ(year(of2010, "1G1JC5444R7252367"), std::nullopt) << "modules that disagree";
    EXPECT_EQ(year(of2010, "WVWZZZ1JZXW000001"), std::nullopt) << "and one that does not tell it for sure";
    EXPECT_EQ(year("1FTEX1C85UF000001", ""), std::nullopt) << "no year in its place";
}

TEST(InspectionReasons, AreToldToPrograms)
{
    ModuleReport module = soundModule();
    module.info.vin = "1FTEX1C85AF000001";
    Json const ready = toJsonValue(inspected({module}, InspectionRule::UsEpa));
    EXPECT_EQ(ready["rule"], "us-epa");
    EXPECT_EQ(ready["modelYear"], 2010);
    EXPECT_EQ(ready["modelYearBy"], "VIN");
    EXPECT_EQ(ready["suggests"], "ready");
    EXPECT_EQ(ready["reasons"].size(), 3U);
    EXPECT_EQ(ready["notes"].size(), 2U);
    EXPECT_EQ(toJsonValue(inspected({module}, InspectionRule::UsEpa, 2003))["modelYearBy"], "option");
    Json const german = toJsonValue(inspected({module}, InspectionRule::DeAu));
    EXPECT_TRUE(german["suggests"].is_null() && german["modelYear"].is_null() && german["modelYearBy"].is_null());
}

} // namespace
