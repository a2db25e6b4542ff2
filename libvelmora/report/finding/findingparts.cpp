#include "libvelmora/report/finding/findingparts.h"

#include <fmt/format.h>

#include <algorithm>
#include <array>
#include <string_view>

namespace velmora {

namespace {

bool isOneOf(std::string const& name, std::initializer_list<std::string_view> names)
{
    return std::find(names.begin(), names.end(), name) != names.end();
}

} // namespace

std::string nameOf(ModuleReport const& module)
{
    return fmt::format("{:X}{}{}", module.id, module.name.empty() ? "" : " ", module.name);
}

LiveValue const* findValue(ModuleReport const& module, unsigned int pid, int part)
{
    auto const found = std::find_if(module.values.begin(), module.values.end(),
                                    [&](LiveValue const& value) { return value.pid == pid && value.part == part; });
    return found != module.values.end() ? &*found : nullptr;
}

std::optional<double> numberOf(ModuleReport const& module, unsigned int pid, int part)
{
    LiveValue const* const value = findValue(module, pid, part);
    return value != nullptr && !value->samples.empty() ? std::optional(value->samples.back()) : std::nullopt;
}

std::string shownValue(ModuleReport const& module, unsigned int pid)
{
    LiveValue const* const value = findValue(module, pid);
    return value == nullptr ? "-" : value->value + (value->unit.empty() ? "" : " " + value->unit);
}

CodeList const* readList(ModuleReport const& module, CodeKind kind)
{
    auto const found = std::find_if(module.codes.lists.begin(), module.codes.lists.end(), [kind](CodeList const& list) {
        return list.kind == kind && list.answer == CodeList::Answer::Read;
    });
    return found != module.codes.lists.end() ? &*found : nullptr;
}

bool isContinuous(std::string const& monitor)
{
    return isOneOf(monitor, {"Misfire", "Fuel System", "Comprehensive Component"});
}

bool hasDieselMonitors(ModuleReport const& module)
{
    return std::any_of(module.readiness.monitors.begin(), module.readiness.monitors.end(),
                       [](ReadinessMonitor const& each) {
                           return isOneOf(each.name, {"NMHC Catalyst", "NOx Aftertreatment", "Boost Pressure",
                                                      "Exhaust Gas Sensor", "PM filter"});
                       });
}

std::vector<std::string> incompleteMonitors(ModuleReport const& module)
{
    std::vector<std::string> names;
    for (ReadinessMonitor const& monitor : module.readiness.monitors) {
        if (!isContinuous(monitor.name) && monitor.sinceCleared == ReadinessStatus::NotComplete) {
            names.push_back(monitor.name);
        }
    }
    return names;
}

std::optional<bool> isIncomplete(ModuleReport const& module, std::string const& monitor)
{
    for (ReadinessMonitor const& each : module.readiness.monitors) {
        if (each.name == monitor && each.sinceCleared != ReadinessStatus::NotAvailable) {
            return each.sinceCleared == ReadinessStatus::NotComplete;
        }
    }
    return std::nullopt;
}

char const* severityKey(Severity severity)
{
    static constexpr std::array keys = {"note", "warning", "bad"};
    return keys[static_cast<std::size_t>(severity)];
}

namespace {

char const* topicKey(DataTopic topic)
{
    static constexpr std::array keys = {"adapter", "info",     "codes",  "readiness",
                                        "values",  "monitors", "oxygen", "info"};
    return keys[static_cast<std::size_t>(topic)];
}

char const* memberKey(DataTopic topic)
{
    return topic == DataTopic::Supported ? "supported" : topicKey(topic);
}

} // namespace

std::string anchorOf(Evidence const& evidence)
{
    return evidence.topic == DataTopic::Adapter ? topicKey(evidence.topic)
                                                : fmt::format("{}-{:X}", topicKey(evidence.topic), evidence.module);
}

std::string pointerTo(Evidence const& evidence, VehicleReport const& report)
{
    auto const found = std::find_if(report.modules.begin(), report.modules.end(),
                                    [&](ModuleReport const& module) { return module.id == evidence.module; });
    if (evidence.topic == DataTopic::Adapter || found == report.modules.end()) {
        return "/adapter";
    }
    return fmt::format("/modules/{}/{}", found - report.modules.begin(), memberKey(evidence.topic));
}

Json toJsonValue(std::vector<Finding> const& findings, VehicleReport const& report)
{
    Json list = Json::array();
    for (Finding const& finding : findings) {
        Json evidence = Json::array();
        for (Evidence const& each : finding.evidence) {
            evidence.push_back({{"text", textOrNull(each.text)}, {"data", pointerTo(each, report)}});
        }
        list.push_back({{"kind", finding.kind},
                        {"severity", severityKey(finding.severity)},
                        {"module", textOrNull(finding.module)},
                        {"what", finding.what},
                        {"text", finding.text},
                        {"suggestion", isSuggestion(finding)},
                        {"evidence", evidence},
                        {"otherwise", finding.otherwise}});
    }
    return list;
}

} // namespace velmora
