#include "common/text/text.h"
#include "libvelmora/report/finding/findingparts.h"
#include "libvelmora/report/finding/testlimits.h"
#include "libvelmora/report/oxygenreport.h"
#include "libvelmora/report/texts/findingtexts.h"

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

namespace {

constexpr int firstMakersMonitor = 0xE1;
constexpr int firstMisfireMonitor = 0xA1;
constexpr int lastMisfireMonitor = 0xB1;
constexpr int averageMisfires = 0x0B; // of the last ten driving cycles
constexpr int cycleMisfires = 0x0C;   // of this cycle or the last one

std::string valueWithUnit(std::string const& value, std::string const& unit)
{
    return unit.empty() ? value : value + " " + unit;
}

void addNearTest(std::vector<Evidence>& list, ModuleReport const& module, DataTopic topic, std::string const& what,
                 LimitTest const& test)
{
    std::string const value = valueWithUnit(test.value, test.unit);
    switch (closenessOf(test)) {
    case Closeness::NearMinimum:
        list.push_back({topic, module.id,
                        fmt::format(texts::finding::nearMin, what, test.description, value,
                                    valueWithUnit(test.minimum, test.unit))});
        return;
    case Closeness::NearMaximum:
        list.push_back({topic, module.id,
                        fmt::format(texts::finding::nearMax, what, test.description, value,
                                    valueWithUnit(test.maximum, test.unit))});
        return;
    case Closeness::Far:
        return;
    }
}

bool isMisfireCount(OnBoardMonitor const& monitor, LimitTest const& test)
{
    return monitor.id >= firstMisfireMonitor && monitor.id <= lastMisfireMonitor &&
           (test.id == averageMisfires || test.id == cycleMisfires);
}

// A result from before the codes were cleared says nothing of the car as it is.
bool resultsCount(ModuleReport const& module, OnBoardMonitor const& monitor)
{
    char const* const name = readinessNameOf(monitor.id, hasDieselMonitors(module));
    return name == nullptr || !isIncomplete(module, name).value_or(false);
}

std::vector<Evidence> nearTests(ModuleReport const& module)
{
    std::vector<Evidence> list;
    for (OnBoardMonitor const& monitor : module.monitors.monitors) {
        if (!resultsCount(module, monitor)) {
            continue;
        }
        for (LimitTest const& test : monitor.tests) {
            // Nobody but the maker knows what a number without a unit counts there.
            if (monitor.id < firstMakersMonitor || !test.unit.empty()) {
                addNearTest(list, module, DataTopic::Monitors, monitor.description, test);
            }
        }
    }
    if (module.oxygen.complete.value_or(true)) {
        for (OxygenSensor const& sensor : module.oxygen.sensors) {
            for (LimitTest const& test : sensor.tests) {
                addNearTest(list, module, DataTopic::Oxygen, locationName(sensor.location), test);
            }
        }
    }
    return list;
}

} // namespace

void addNearLimits(std::vector<Finding>& list, VehicleReport const& report)
{
    for (ModuleReport const& module : report.modules) {
        std::vector<Evidence> evidence = nearTests(module);
        if (evidence.empty()) {
            continue;
        }
        std::string const count =
            evidence.size() == 1 ? texts::finding::nearTest : fmt::format(texts::finding::nearTests, evidence.size());
        list.push_back({Severity::Note,
                        nameOf(module),
                        texts::finding::nearLimit,
                        fmt::format(texts::finding::nearText, count),
                        "close-to-limit",
                        std::move(evidence),
                        {texts::finding::nearElse}});
    }
}

void addMisfires(std::vector<Finding>& list, VehicleReport const& report)
{
    for (ModuleReport const& module : report.modules) {
        std::vector<Evidence> evidence;
        for (OnBoardMonitor const& monitor : module.monitors.monitors) {
            for (LimitTest const& test : monitor.tests) {
                if (isMisfireCount(monitor, test) && test.verdict == LimitTest::Verdict::Passed &&
                    numberIn(test.value).value_or(0.0) > 0.0) {
                    evidence.push_back(
                        {DataTopic::Monitors, module.id,
                         fmt::format(texts::finding::misfireCount, monitor.description, test.description, test.value)});
                }
            }
        }
        if (!evidence.empty()) {
            list.push_back({Severity::Note,
                            nameOf(module),
                            texts::finding::misfires,
                            texts::finding::misfireText,
                            "misfire-counts",
                            std::move(evidence),
                            {texts::finding::misfireElse}});
        }
    }
}

} // namespace velmora
