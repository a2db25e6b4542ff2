#include "libvelmora/report/finding/findings.h"

#include "libvelmora/report/finding/findingparts.h"
#include "libvelmora/report/texts/findingtexts.h"
#include "libvelmora/report/texts/labels.h"

#include <fmt/format.h>

#include <algorithm>
#include <array>

namespace velmora {

namespace {

char const* kindWord(CodeKind kind)
{
    static constexpr std::array all = {texts::confirmedWord, texts::pendingWord, texts::permanentWord};
    return all[static_cast<std::size_t>(kind)];
}

void addLamp(std::vector<Finding>& list, ModuleReport const& module)
{
    if (module.codes.lamp.value_or(false)) {
        list.push_back({Severity::Bad,
                        nameOf(module),
                        texts::finding::lamp,
                        texts::finding::lampOn,
                        "lamp-on",
                        {{DataTopic::Codes, module.id}}});
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
            list.push_back(
                {severity, nameOf(module), kindWord(codes.kind), text, "code", {{DataTopic::Codes, module.id}}});
        }
    }
}

void addFailed(std::vector<Finding>& list, ModuleReport const& module, std::string const& what, DataTopic topic,
               std::vector<LimitTest> const& tests)
{
    for (LimitTest const& test : tests) {
        if (test.verdict == LimitTest::Verdict::Failed) {
            list.push_back({Severity::Bad,
                            nameOf(module),
                            texts::finding::failedTest,
                            what + ": " + test.description,
                            "test-failed",
                            {{topic, module.id}}});
        }
    }
}

void addTests(std::vector<Finding>& list, ModuleReport const& module)
{
    for (OnBoardMonitor const& monitor : module.monitors.monitors) {
        addFailed(list, module, monitor.description, DataTopic::Monitors, monitor.tests);
    }
    for (OxygenSensor const& sensor : module.oxygen.sensors) {
        addFailed(list, module, locationName(sensor.location), DataTopic::Oxygen, sensor.tests);
    }
}

void addReadiness(std::vector<Finding>& list, ModuleReport const& module)
{
    for (ReadinessMonitor const& monitor : module.readiness.monitors) {
        if (monitor.sinceCleared == ReadinessStatus::NotComplete) {
            list.push_back({Severity::Warning,
                            nameOf(module),
                            texts::finding::notComplete,
                            monitor.name,
                            "not-complete",
                            {{DataTopic::Readiness, module.id}}});
        }
    }
}

// Silence is no sign of health.
void addUntold(std::vector<Finding>& list, ModuleReport const& module)
{
    std::vector<std::string> topics = untold(module.codes);
    std::vector<Evidence> evidence;
    if (!topics.empty()) {
        evidence.push_back({DataTopic::Codes, module.id});
    }
    if (!toldOffers(module)) {
        topics.push_back(fmt::format(texts::finding::supportsTopic, answerWord(module.offers)));
        evidence.push_back({DataTopic::Supported, module.id});
    }
    if (!topics.empty()) {
        list.push_back({Severity::Warning, nameOf(module), texts::finding::untold,
                        fmt::format("{}", fmt::join(topics, texts::finding::joinAnd)), "not-told",
                        std::move(evidence)});
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
    for (auto const add : {addClearedCodes, addLampsWithoutCode, addDifferingVins, addNearLimits, addFuelTrims,
                           addTemperatures, addVoltages, addMisfires, addMissingVerification}) {
        add(list, report);
    }
    return list;
}

} // namespace velmora
