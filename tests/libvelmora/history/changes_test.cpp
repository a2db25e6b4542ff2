#include "tests/libvelmora/report/carbuilder.h"

#include <velmora/history.h>

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <algorithm>

namespace {

using namespace velmora;
using namespace testsupport;

// "code-new worse", one for each change.
std::vector<std::string> changed(ModuleReport const& older, ModuleReport const& newer)
{
    static constexpr char const* weights[] = {"neutral", "better", "worse"};
    std::vector<std::string> list;
    std::vector<Change> const changes = changesBetween(vehicleOf({older}), vehicleOf({newer}));
    for (Change const& each : changes) {
        list.push_back(each.kind + " " + weights[static_cast<int>(each.weight)]);
    }
    bool const worse =
        std::any_of(list.begin(), list.end(), [](std::string const& each) { return each.ends_with(" worse"); });
    EXPECT_EQ(hasWorse(changes), worse);
    return list;
}

using List = std::vector<std::string>;

TEST(Changes, AreNoneBetweenEqualScans)
{
    EXPECT_EQ(changed(soundModule(), soundModule()), List());
}

TEST(Changes, OfCodesGoByKind)
{
    ModuleReport const sound = soundModule();
    ModuleReport module = soundModule();
    module.codes.lists[0] = readCodes(CodeKind::Confirmed, {"P0420"});
    EXPECT_EQ(changed(sound, module), List{"code-new worse"});
    EXPECT_EQ(changed(module, sound), List{"code-gone better"});
    ModuleReport pending = soundModule();
    pending.codes.lists[1] = readCodes(CodeKind::Pending, {"P0420"});
    EXPECT_EQ(changed(sound, pending), List{"code-new neutral"});
    EXPECT_EQ(changed(pending, module), (List{"code-new worse", "code-gone better"}));
    ModuleReport permanent = soundModule();
    permanent.codes.lists[2] = readCodes(CodeKind::Permanent, {"P0420"});
    EXPECT_EQ(changed(sound, permanent), List{"code-new worse"});
    ModuleReport silent = soundModule();
    silent.codes.lists[0].answer = CodeList::Answer::Silent;
    EXPECT_EQ(changed(silent, module), List()) << "nobody knows whether it is new";
    EXPECT_EQ(changed(module, silent), List()) << "nor whether it is gone";
}

TEST(Changes, OfTheLamp)
{
    ModuleReport on = soundModule();
    on.codes.lamp = true;
    EXPECT_EQ(changed(soundModule(), on), List{"lamp-on worse"});
    EXPECT_EQ(changed(on, soundModule()), List{"lamp-off better"});
    on.codes.lamp.reset();
    EXPECT_EQ(changed(soundModule(), on), List());
}

TEST(Changes, OfReadinessAreNoWorseningAfterAClear)
{
    ModuleReport older = soundModule();
    ModuleReport newer = soundModule();
    setIncomplete(newer, "Catalyst");
    EXPECT_EQ(changed(older, newer), List{"monitor-incomplete worse"});
    EXPECT_EQ(changed(newer, older), List{"monitor better"});
    setValue(older, 0x31, {500});
    setValue(newer, 0x31, {12});
    EXPECT_EQ(changed(older, newer), (List{"cleared neutral", "monitor-incomplete neutral"}));
}

TEST(Changes, KnowAClearByWhatCountsLess)
{
    struct Case
    {
        unsigned int pid;
        double before;
        double after;
        bool cleared;
    };
    for (Case const& each :
         {Case{0x31, 500, 499, true}, Case{0x31, 500, 500, false}, Case{0x31, 65535, 10, false},
          Case{0x30, 254, 0, true}, Case{0x30, 255, 0, false}, Case{0x4E, 100, 5, true}, Case{0x4E, 65535, 5, false}}) {
        ModuleReport older = soundModule();
        ModuleReport newer = soundModule();
        setValue(older, each.pid, {each.before});
        setValue(newer, each.pid, {each.after});
        EXPECT_EQ(wereCleared(vehicleOf({older}), vehicleOf({newer})), each.cleared) << each.pid << " " << each.before;
    }
}

ModuleReport moduleWithTest(std::string const& value, LimitTest::Verdict verdict, std::string const& unit = "V")
{
    ModuleReport module = soundModule();
    module.monitors = {TopicAnswer::Read, {{0x21, "Catalyst", {{0x80, "A", value, "0", "1", unit, verdict}}}}};
    return module;
}

TEST(Changes, OfResultsAndTheirLimits)
{
    using enum LimitTest::Verdict;
    ModuleReport const passed = moduleWithTest("0.5", Passed);
    EXPECT_EQ(changed(passed, moduleWithTest("1.5", Failed)), List{"test-outside worse"});
    EXPECT_EQ(changed(moduleWithTest("1.5", Failed), passed), List{"test-inside better"});
    EXPECT_EQ(changed(passed, moduleWithTest("0.6", Passed)), List{"test-value neutral"});
    EXPECT_EQ(changed(moduleWithTest("1.5", Failed), moduleWithTest("1.6", Failed)), List{"test-value neutral"});
    EXPECT_EQ(changed(moduleWithTest("0", NoResult), moduleWithTest("1.5", Failed)), List{"test-outside worse"});
    EXPECT_EQ(changed(passed, moduleWithTest("0", NoResult)), List());
    EXPECT_EQ(changed(passed, moduleWithTest("0.3", Passed, "psi")), List()) << "another unit system";
}

TEST(Changes, OfCountersSoftwareNumbersAndModules)
{
    ModuleReport older = soundModule();
    ModuleReport newer = soundModule();
    older.counters = {TopicAnswer::Read, {{"Ignition Cycle Counter", 5}}};
    newer.counters = {TopicAnswer::Read, {{"Ignition Cycle Counter", 9}, {"EVAP", 1}}};
    EXPECT_EQ(changed(older, newer), (List{"counter neutral", "counter neutral"}));
    newer.counters.answer = TopicAnswer::Silent;
    EXPECT_EQ(changed(older, newer), List());
    older.info.calibrations = {{"A", "1"}};
    newer.info.calibrations = {{"A", "2"}};
    older.info.vin = "1M8GDM9AXKP042788";
    newer.info.vin = "1G1JC5444R7252367";
    EXPECT_EQ(changed(older, newer), (List{"software neutral", "vin neutral"}));
    ModuleReport const gearbox = soundModule(0x7E9);
    std::vector<Change> const more = changesBetween(vehicleOf({older}), vehicleOf({older, gearbox}));
    ASSERT_EQ(more.size(), 1U);
    EXPECT_EQ(more[0].kind, "module-new");
    EXPECT_EQ(changesBetween(vehicleOf({older, gearbox}), vehicleOf({older})).at(0).kind, "module-gone");
}

// Everything that may change, as programs get it: one line each.
TEST(Changes, AreToldWithWhatWasAndWhatIs)
{
    using enum LimitTest::Verdict;
    ModuleReport older = soundModule();
    ModuleReport newer = soundModule();
    older.codes.lists[0] = readCodes(CodeKind::Confirmed, {"P0300"});
    newer.codes.lists[0] = readCodes(CodeKind::Confirmed, {"P0420"});
    newer.codes.lamp = true;
    setIncomplete(newer, "Catalyst");
    setIncomplete(older, "Misfire");
    older.readiness.monitors[2].sinceCleared = ReadinessStatus::NotAvailable;
    newer.readiness.monitors[2].sinceCleared = ReadinessStatus::NotComplete;
    older.monitors = {TopicAnswer::Read,
                      {{0x21,
                        "Catalyst",
                        {{0x80, "A", "1", "0", "2", "V", Passed},
                         {0x80, "A", "5", "", "", "", Passed},
                         {0x81, "B", "0", "", "", "V", NoResult},
                         {0x82, "C", "1", "", "", "V", Passed}}}}};
    newer.monitors = {TopicAnswer::Read,
                      {{0x21,
                        "Catalyst",
                        {{0x80, "A", "1", "0", "2", "V", Passed},
                         {0x80, "A", "6", "", "", "", Passed},
                         {0x81, "B", "3", "", "2", "V", Failed},
                         {0x82, "C", "1", "", "", "V", Passed}}}}};
    older.oxygen.sensors = {{obd::OxygenSensorLocation::Bank1Sensor2, {{0x01, "D", "3", "", "", "V", Failed}}}};
    newer.oxygen.sensors = {{obd::OxygenSensorLocation::Bank1Sensor2, {{0x01, "D", "2", "", "", "V", Passed}}}};
    older.info.calibrations = {{"A", "1"}, {"B", ""}};
    newer.info.calibrations = {{"A", "2"}};
    std::string all;
    for (nlohmann::json const& each :
         nlohmann::json::parse(toJson(changesBetween(vehicleOf({older}), vehicleOf({newer}))))) {
        all += each["kind"].get<std::string>() + " " + each["weight"].get<std::string>() + ": " +
               each["module"].get<std::string>() + " | " + each["what"].get<std::string>() + " | " +
               (each["name"].is_null() ? "-" : each["name"].get<std::string>()) + " | " +
               each["before"].get<std::string>() + " | " + each["after"].get<std::string>() + "\n";
    }
    EXPECT_EQ(all,
              "lamp-on worse: 7E8 ECM | lamp | - | off | on\n"
              "code-new worse: 7E8 ECM | confirmed code | P0420 Meaning of P0420 | not there | there\n"
              "code-gone better: 7E8 ECM | confirmed code | P0300 Meaning of P0300 | there | not there\n"
              "monitor better: 7E8 ECM | monitor | Misfire | not complete | complete\n"
              "monitor-incomplete worse: 7E8 ECM | monitor | Catalyst | complete | not complete\n"
              "monitor neutral: 7E8 ECM | monitor | Evaporative System | not available | not complete\n"
              "test-inside better: 7E8 ECM | within its limits | Bank 1 sensor 2, 01 D | 3 V (- to -) | 2 V (- to -)\n"
              "test-value neutral: 7E8 ECM | test result | Catalyst, 80 A (2) | 5 (- to -) | 6 (- to -)\n"
              "test-outside worse: 7E8 ECM | outside its limits | Catalyst, 81 B | - | 3 V (- to 2)\n"
              "software neutral: 7E8 ECM | software | - | A 1, B | A 2\n");
}

} // namespace
