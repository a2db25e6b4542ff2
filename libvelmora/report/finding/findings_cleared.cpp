#include "libvelmora/report/finding/findingparts.h"
#include "libvelmora/report/texts/findingtexts.h"

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

namespace {

constexpr double fewWarmUps = 5;
constexpr double shortDistanceKm = 80;
constexpr double mostMinutes = 65535; // and more, or not kept
constexpr std::size_t manyIncomplete = 2;

// What speaks for codes that were cleared not long ago, in one module.
struct ClearSigns
{
    std::optional<double> warmUps;
    std::optional<double> distanceKm;
    std::vector<std::string> incomplete;
    std::vector<std::string> permanentAlone;
    bool diesel;

    explicit ClearSigns(ModuleReport const& module)
        : warmUps(numberOf(module, 0x30)), distanceKm(numberOf(module, 0x31)), incomplete(incompleteMonitors(module)),
          diesel(hasDieselMonitors(module))
    {
        CodeList const* const stored = readList(module, CodeKind::Confirmed);
        CodeList const* const permanent = readList(module, CodeKind::Permanent);
        if (stored != nullptr && stored->codes.empty() && permanent != nullptr) {
            for (TroubleCode const& code : permanent->codes) {
                permanentAlone.push_back(code.code);
            }
        }
    }

    bool hasFewWarmUps() const { return warmUps && *warmUps <= fewWarmUps; }
    bool isNear() const { return distanceKm && *distanceKm <= shortDistanceKm; }
    bool hasManyIncomplete() const { return incomplete.size() >= manyIncomplete; }
    int count() const { return int(hasFewWarmUps()) + int(isNear()) + int(hasManyIncomplete()); }
};

bool hasNoResults(ModuleReport const& module)
{
    bool any = false;
    for (OnBoardMonitor const& monitor : module.monitors.monitors) {
        for (LimitTest const& test : monitor.tests) {
            any = true;
            if (test.verdict != LimitTest::Verdict::NoResult) {
                return false;
            }
        }
    }
    return any;
}

Evidence permanentEvidence(ModuleReport const& module, ClearSigns const& signs)
{
    return {DataTopic::Codes, module.id,
            fmt::format(texts::finding::permanentUnstored, fmt::join(signs.permanentAlone, ", "))};
}

std::vector<Evidence> clearEvidence(ModuleReport const& module, ClearSigns const& signs)
{
    std::vector<Evidence> list;
    if (signs.hasFewWarmUps()) {
        list.push_back(
            {DataTopic::Values, module.id, fmt::format(texts::finding::warmUps, findValue(module, 0x30)->value)});
    }
    if (signs.isNear()) {
        list.push_back({DataTopic::Values, module.id, fmt::format(texts::finding::distance, shownValue(module, 0x31))});
    }
    if (signs.hasManyIncomplete()) {
        list.push_back(
            {DataTopic::Readiness, module.id,
             fmt::format(texts::finding::incomplete, signs.incomplete.size(), fmt::join(signs.incomplete, ", "))});
    }
    if (!signs.permanentAlone.empty()) {
        list.push_back(permanentEvidence(module, signs));
    }
    if (std::optional<double> const minutes = numberOf(module, 0x4E); minutes && *minutes < mostMinutes) {
        list.push_back({DataTopic::Values, module.id, fmt::format(texts::finding::runTime, shownValue(module, 0x4E))});
    }
    if (hasNoResults(module)) {
        list.push_back({DataTopic::Monitors, module.id, texts::finding::noResults});
    }
    return list;
}

std::vector<std::string> clearOtherwise(ClearSigns const& signs)
{
    std::vector<std::string> list = {texts::finding::clearedByWork, texts::finding::clearedByShop,
                                     texts::finding::clearedByTrips};
    if (signs.diesel) {
        list.emplace_back(texts::finding::clearedDiesel);
    } else if (!signs.isNear()) {
        list.emplace_back(texts::finding::clearedHybrid);
    }
    if (signs.warmUps == 0.0 || signs.distanceKm == 0.0) {
        list.emplace_back(texts::finding::clearedZeros);
    }
    return list;
}

// The distance is that of the drive since then, whatever else is few.
std::string clearText(ModuleReport const& module, ClearSigns const& signs)
{
    std::string const text = signs.isNear() ? fmt::format(texts::finding::clearedWithin, shownValue(module, 0x31))
                                            : std::string(texts::finding::clearedLately);
    return (signs.permanentAlone.empty() ? "" : texts::finding::clearedStrongly) + text;
}

} // namespace

void addClearedCodes(std::vector<Finding>& list, VehicleReport const& report)
{
    for (ModuleReport const& module : report.modules) {
        ClearSigns const signs(module);
        if (signs.count() >= 2) {
            list.push_back({Severity::Warning, nameOf(module), texts::finding::cleared, clearText(module, signs),
                            "codes-cleared-recently", clearEvidence(module, signs), clearOtherwise(signs)});
        } else if (!signs.permanentAlone.empty()) {
            list.push_back({Severity::Warning,
                            nameOf(module),
                            texts::finding::permanentAlone,
                            texts::finding::permanentText,
                            "permanent-code-alone",
                            {permanentEvidence(module, signs)},
                            {texts::finding::permanentElse}});
        }
    }
}

// The lamp is one for all: a code in any module that commands it explains it.
void addLampsWithoutCode(std::vector<Finding>& list, VehicleReport const& report)
{
    std::vector<Evidence> evidence;
    std::vector<std::string> names;
    for (ModuleReport const& module : report.modules) {
        if (!module.codes.lamp.value_or(false)) {
            continue;
        }
        CodeList const* const stored = readList(module, CodeKind::Confirmed);
        if (stored == nullptr || !stored->codes.empty()) {
            return;
        }
        names.push_back(nameOf(module));
        evidence.push_back({DataTopic::Codes, module.id, fmt::format(texts::finding::lampCommanded, nameOf(module))});
    }
    if (!evidence.empty()) {
        list.push_back({Severity::Warning,
                        fmt::format("{}", fmt::join(names, ", ")),
                        texts::finding::lampAlone,
                        texts::finding::lampAloneText,
                        "lamp-without-code",
                        std::move(evidence),
                        {texts::finding::lampAloneElse, texts::finding::lampAloneMoment}});
    }
}

} // namespace velmora
