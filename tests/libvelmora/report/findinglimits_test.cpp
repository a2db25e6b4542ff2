// Where each thing that data may suggest begins and ends: the value that is just enough, and the one that is not.
#include "libvelmora/report/finding/findings.h"
#include "libvelmora/report/finding/testlimits.h"
#include "tests/libvelmora/report/carbuilder.h"

#include <gtest/gtest.h>

#include <optional>

namespace {

using namespace velmora;
using namespace testsupport;

// "fuel-trim warning", one for each thing that the vehicle suggests.
std::string suggestedBy(VehicleReport const& report)
{
    std::string text;
    for (Finding const& each : findings(report)) {
        if (isSuggestion(each)) {
            text += (text.empty() ? "" : ", ") + std::string(each.kind) + " " + severityKey(each.severity);
        }
    }
    return text;
}

std::string suggestedBy(ModuleReport const& module)
{
    return suggestedBy(vehicleOf({module}));
}

ModuleReport trimmedModule(std::vector<double> const& quick, std::vector<double> const& slow,
                           std::vector<double> const& coolant = {88, 89})
{
    ModuleReport module = soundModule();
    setValue(module, 0x03, {}, "Closed loop (1)");
    setValue(module, 0x05, coolant);
    setValue(module, 0x06, quick);
    setValue(module, 0x07, slow);
    return module;
}

TEST(FindingLimits, OfFuelTrims)
{
    EXPECT_EQ(suggestedBy(trimmedModule({25, 25}, {0, 0})), "fuel-trim note") << "25 % is not far yet";
    EXPECT_EQ(suggestedBy(trimmedModule({25.1, 25.1}, {0, 0})), "fuel-trim warning");
    EXPECT_EQ(suggestedBy(trimmedModule({-10, -10}, {0, 0})), "");
    EXPECT_EQ(suggestedBy(trimmedModule({-10.1, -10.1}, {0, 0})), "fuel-trim note");
    EXPECT_EQ(suggestedBy(trimmedModule({15, 15}, {0, 0}, {70, 71})), "fuel-trim note") << "warm from 70 degrees on";
    EXPECT_EQ(suggestedBy(trimmedModule({15, 15, 15}, {0, 0})), "") << "readings that are not of the same moments";
    ModuleReport quickAlone = trimmedModule({15, 15}, {0, 0});
    quickAlone.values.pop_back();
    EXPECT_EQ(suggestedBy(quickAlone), "");
    ModuleReport slowAlone = trimmedModule({15, 15}, {15, 15});
    slowAlone.values.erase(slowAlone.values.begin() + 2);
    EXPECT_EQ(suggestedBy(slowAlone), "");
    ModuleReport unread = trimmedModule({}, {15, 15});
    EXPECT_EQ(suggestedBy(unread), "") << "a value without samples";
    ModuleReport shortened = trimmedModule({15, 15, -99}, {0, 0, 0});
    shortened.values[2].samples.pop_back();
    shortened.values[3].samples.pop_back();
    EXPECT_EQ(suggestedBy(shortened), "fuel-trim note") << "readings that were dropped don't count";
    ModuleReport coolantless = trimmedModule({15, 15}, {0, 0});
    coolantless.values.erase(coolantless.values.begin() + 1);
    EXPECT_EQ(suggestedBy(coolantless), "") << "nobody knows whether it is warm";
}

TEST(FindingLimits, OfTemperatures)
{
    auto const car = [](std::optional<double> seconds, std::vector<double> const& coolant) {
        ModuleReport module = soundModule();
        if (seconds) {
            setValue(module, 0x1F, {*seconds});
        }
        setValue(module, 0x05, coolant);
        setValue(module, 0x46, {20});
        return suggestedBy(module);
    };
    EXPECT_EQ(car(900, {60, 69}), "coolant-not-warm warning");
    EXPECT_EQ(car(900, {60, 70}), "") << "it is about to be warm";
    EXPECT_EQ(car(900, {-40, -39}), "coolant-not-warm warning");
    EXPECT_EQ(car(std::nullopt, {60, 61}), "") << "it may have been started just now";
    EXPECT_EQ(car(10, {115, 116}), "");
    EXPECT_EQ(car(10, {116, 117}), "coolant-hot warning");
    EXPECT_EQ(car(900, {}), "");
}

TEST(FindingLimits, OfVoltages)
{
    auto const car = [](double rpm, std::vector<double> const& volts, std::optional<float> adapter = 13.8F) {
        ModuleReport module = soundModule();
        setValue(module, 0x0C, {rpm, rpm});
        if (!volts.empty()) {
            setValue(module, 0x42, volts);
        }
        VehicleReport report = vehicleOf({soundModule(0x7E9), module});
        report.adapter.volts = adapter;
        return suggestedBy(report);
    };
    EXPECT_EQ(car(800, {13.0, 13.0}), "");
    EXPECT_EQ(car(800, {12.9, 12.9}), "voltage warning");
    EXPECT_EQ(car(800, {15.0, 15.5}), "") << "not at both readings";
    EXPECT_EQ(car(800, {15.1, 18.0}), "voltage warning");
    EXPECT_EQ(car(800, {15.1, 18.1}), "") << "two batteries in a row";
    EXPECT_EQ(car(0, {12.0, 12.0}), "");
    EXPECT_EQ(car(0, {11.9, 11.9}), "voltage warning");
    EXPECT_EQ(car(0, {16, 16}), "") << "a charger, perhaps";
    EXPECT_EQ(car(800, {}, std::nullopt), "") << "nobody tells a voltage";
    EXPECT_EQ(car(800, {}, 15.5F), "voltage warning");
}

LimitTest passedTest(int id, std::string const& value, std::string const& min, std::string const& max,
                     std::string const& unit = "V")
{
    return {id, "Test", value, min, max, unit, LimitTest::Verdict::Passed};
}

ModuleReport monitoringModule(int monitor, LimitTest const& test)
{
    ModuleReport module = soundModule();
    module.monitors = {TopicAnswer::Read, {{monitor, "Monitor", {test}}}};
    return module;
}

TEST(FindingLimits, OfResultsThatCountAsClose)
{
    LimitTest const close = passedTest(0x80, "9", "", "10");
    EXPECT_EQ(suggestedBy(monitoringModule(0x31, close)), "close-to-limit note") << "no readiness of that monitor";
    LimitTest const bare = passedTest(0x80, "9", "", "10", "");
    EXPECT_EQ(suggestedBy(monitoringModule(0xE0, bare)), "close-to-limit note");
    EXPECT_EQ(suggestedBy(monitoringModule(0xE1, bare)), "") << "the maker's, and of no unit";
    EXPECT_EQ(suggestedBy(monitoringModule(0xE1, close)), "close-to-limit note");
    ModuleReport none = monitoringModule(0x21, close);
    none.readiness.monitors[1].sinceCleared = ReadinessStatus::NotAvailable;
    EXPECT_EQ(suggestedBy(none), "close-to-limit note") << "a monitor that is not told apart is not incomplete";

    ModuleReport legacy = soundModule();
    legacy.oxygen = {TopicAnswer::Read, std::nullopt, false, {{obd::OxygenSensorLocation::Bank1Sensor1, {close}}}};
    EXPECT_EQ(suggestedBy(legacy), "close-to-limit note") << "nobody told that the sensors' monitor has not run";
    legacy.oxygen.complete = true;
    EXPECT_EQ(suggestedBy(legacy), "close-to-limit note");
    EXPECT_EQ(anchorOf(findings(vehicleOf({legacy})).at(0).evidence.at(0)), "oxygen-7E8");
    EXPECT_EQ(findings(vehicleOf({legacy})).at(0).text,
              "passed, yet suggests that what is tested comes close to its limit: one result");
    legacy.oxygen.complete = false;
    EXPECT_EQ(suggestedBy(legacy), "");
}

TEST(FindingLimits, OfMisfires)
{
    for (int const monitor : {0xA1, 0xA2, 0xB1}) {
        EXPECT_EQ(suggestedBy(monitoringModule(monitor, passedTest(0x0B, "1", "", ""))), "misfire-counts note");
        EXPECT_EQ(suggestedBy(monitoringModule(monitor, passedTest(0x0C, "1", "", ""))), "misfire-counts note");
        EXPECT_EQ(suggestedBy(monitoringModule(monitor, passedTest(0x0D, "1", "", ""))), "") << "counts something else";
        EXPECT_EQ(suggestedBy(monitoringModule(monitor, passedTest(0x0B, "", "", ""))), "");
    }
    for (int const monitor : {0xA0, 0xB2}) {
        EXPECT_EQ(suggestedBy(monitoringModule(monitor, passedTest(0x0B, "1", "", ""))), "");
    }
    ModuleReport failed = monitoringModule(0xA2, passedTest(0x0B, "1", "", ""));
    failed.monitors.monitors[0].tests[0].verdict = LimitTest::Verdict::Failed;
    EXPECT_EQ(suggestedBy(failed), "") << "which is told as a failed test";
}

TEST(FindingLimits, OfLampsAndNumbersOfModules)
{
    ModuleReport first = soundModule();
    ModuleReport second = soundModule(0x7E9);
    first.info.vin = "1M8GDM9AXKP042788";
    for (char const* const other : {"", "WVWZZZ", "1M8GDM9AXKP04278I"}) {
        second.info.vin = other;
        EXPECT_EQ(suggestedBy(vehicleOf({first, second})), "") << "no number of a vehicle: " << other;
    }
    first.info.calibrations = {{"", ""}, {"A", "0F"}};
    second.info.vin.clear();
    EXPECT_EQ(suggestedBy(vehicleOf({first, second})), "");
    first.info.calibrations = {{"A", "fFFf"}};
    EXPECT_EQ(suggestedBy(vehicleOf({first, second})), "no-verification-number note");
    first.info.calibrations.clear();
    first.codes.lamp = second.codes.lamp = true;
    std::vector<Finding> const list = findings(vehicleOf({first, second}));
    EXPECT_EQ(list.back().module, "7E8 ECM, 7E9 ECM");
    EXPECT_EQ(list.back().evidence.size(), 2U);
}

} // namespace
