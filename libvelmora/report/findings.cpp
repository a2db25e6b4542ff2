#include "libvelmora/report/findings.h"

#include <fmt/format.h>

#include <algorithm>
#include <array>

namespace velmora {

namespace {

std::string nameOf(ModuleReport const& module)
{
    return fmt::format("{:X}{}{}", module.id, module.name.empty() ? "" : " ", module.name);
}

char const* kindWord(CodeKind kind)
{
    static constexpr std::array words = {"confirmed", "pending", "permanent"};
    return words[static_cast<std::size_t>(kind)];
}

void addLamp(std::vector<Finding>& list, ModuleReport const& module)
{
    if (module.codes.lamp.value_or(false)) {
        list.push_back({Severity::Bad, nameOf(module), "lamp", "the malfunction indicator is on"});
    }
}

std::string described(TroubleCode const& code)
{
    return code.code + " " + meaningText(code);
}

// A code may be confirmed and permanent at once: it is told once, with all its kinds.
void addCodes(std::vector<Finding>& list, ModuleReport const& module)
{
    std::size_t const first = list.size();
    for (CodeList const& codes : module.codes.lists) {
        for (TroubleCode const& code : codes.codes) {
            std::string const text = described(code);
            auto const known = std::find_if(list.begin() + static_cast<std::ptrdiff_t>(first), list.end(),
                                            [&text](Finding const& finding) { return finding.text == text; });
            if (known != list.end()) {
                known->what += std::string(", ") + kindWord(codes.kind);
                continue;
            }
            Severity const severity = codes.kind == CodeKind::Pending ? Severity::Warning : Severity::Bad;
            list.push_back({severity, nameOf(module), kindWord(codes.kind), text});
        }
    }
}

void addFailed(std::vector<Finding>& list, ModuleReport const& module, std::string const& what,
               std::vector<LimitTest> const& tests)
{
    for (LimitTest const& test : tests) {
        if (test.verdict == LimitTest::Verdict::Failed) {
            list.push_back({Severity::Bad, nameOf(module), "failed test", what + ": " + test.description});
        }
    }
}

void addTests(std::vector<Finding>& list, ModuleReport const& module)
{
    for (OnBoardMonitor const& monitor : module.monitors.monitors) {
        addFailed(list, module, monitor.description, monitor.tests);
    }
    for (OxygenSensor const& sensor : module.oxygen.sensors) {
        addFailed(list, module, locationName(sensor.location), sensor.tests);
    }
}

void addReadiness(std::vector<Finding>& list, ModuleReport const& module)
{
    for (ReadinessMonitor const& monitor : module.readiness.monitors) {
        if (monitor.sinceCleared == ReadinessStatus::NotComplete) {
            list.push_back({Severity::Warning, nameOf(module), "not complete", monitor.name});
        }
    }
}

// Silence is no sign of health.
void addUntold(std::vector<Finding>& list, ModuleReport const& module)
{
    std::vector<std::string> topics = untold(module.codes);
    if (!toldOffers(module)) {
        topics.push_back(fmt::format("all that it supports ({})", answerWord(module.offers)));
    }
    if (!topics.empty()) {
        list.push_back({Severity::Warning, nameOf(module), "not told", fmt::format("{}", fmt::join(topics, " and "))});
    }
}

} // namespace

std::vector<Finding> findings(VehicleReport const& report)
{
    std::vector<Finding> list;
    for (auto const add : {addLamp, addCodes, addTests, addReadiness, addUntold}) {
        for (ModuleReport const& module : report.modules) {
            add(list, module);
        }
    }
    return list;
}

} // namespace velmora
