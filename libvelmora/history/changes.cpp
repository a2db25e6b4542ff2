#include "libvelmora/history/changeparts.h"
#include "libvelmora/report/finding/findingparts.h"
#include "libvelmora/report/json.h"
#include "libvelmora/report/texts/changetexts.h"
#include "libvelmora/report/texts/labels.h"

#include <fmt/format.h>

#include <algorithm>
#include <array>

namespace velmora {

namespace {

ModuleReport const* findModule(VehicleReport const& report, unsigned int id)
{
    auto const found = std::find_if(report.modules.begin(), report.modules.end(),
                                    [id](ModuleReport const& module) { return module.id == id; });
    return found != report.modules.end() ? &*found : nullptr;
}

bool countsLess(ModuleReport const& older, ModuleReport const& newer, unsigned int pid, double most)
{
    auto const before = numberOf(older, pid);
    auto const after = numberOf(newer, pid);
    return before && after && *after < *before && *before < most;
}

bool wasCleared(ModuleReport const& older, ModuleReport const& newer)
{
    constexpr double mostWarmUps = 255.0;
    constexpr double mostOfTwoBytes = 65535.0;
    return countsLess(older, newer, 0x30, mostWarmUps) || countsLess(older, newer, 0x31, mostOfTwoBytes) ||
           countsLess(older, newer, 0x4E, mostOfTwoBytes);
}

char const* lampWord(bool on)
{
    return on ? texts::on : texts::off;
}

void compareLamp(ModulePair const& pair)
{
    std::optional<bool> const before = pair.older.codes.lamp;
    std::optional<bool> const after = pair.newer.codes.lamp;
    if (before && after && *before != *after) {
        pair.add(*after ? "lamp-on" : "lamp-off", *after ? ChangeWeight::Worse : ChangeWeight::Better,
                 texts::change::lamp, {}, lampWord(*before), lampWord(*after));
    }
}

std::string changedCode(TroubleCode const& code)
{
    return code.code + " " + meaningText(code);
}

bool holdsCode(CodeList const& list, std::string const& code)
{
    return std::any_of(list.codes.begin(), list.codes.end(),
                       [&code](TroubleCode const& each) { return each.code == code; });
}

void compareList(ModulePair const& pair, CodeKind kind, char const* word)
{
    CodeList const* const before = readList(pair.older, kind);
    CodeList const* const after = readList(pair.newer, kind);
    if (before == nullptr || after == nullptr) {
        return;
    }
    std::string const what = fmt::format(texts::change::code, word);
    ChangeWeight const worse = kind == CodeKind::Pending ? ChangeWeight::Neutral : ChangeWeight::Worse;
    for (TroubleCode const& code : after->codes) {
        if (!holdsCode(*before, code.code)) {
            pair.add("code-new", worse, what, changedCode(code), texts::change::absent, texts::change::present);
        }
    }
    for (TroubleCode const& code : before->codes) {
        if (!holdsCode(*after, code.code)) {
            pair.add("code-gone", ChangeWeight::Better, what, changedCode(code), texts::change::present,
                     texts::change::absent);
        }
    }
}

void compareCodes(ModulePair const& pair)
{
    compareList(pair, CodeKind::Confirmed, texts::confirmedWord);
    compareList(pair, CodeKind::Pending, texts::pendingWord);
    compareList(pair, CodeKind::Permanent, texts::permanentWord);
}

// After a clear all monitors begin anew, which is no worsening of the car.
void compareReadiness(ModulePair const& pair)
{
    for (ReadinessMonitor const& after : pair.newer.readiness.monitors) {
        auto const& list = pair.older.readiness.monitors;
        auto const before = std::find_if(list.begin(), list.end(),
                                         [&after](ReadinessMonitor const& each) { return each.name == after.name; });
        if (before == list.end() || before->sinceCleared == after.sinceCleared) {
            continue;
        }
        bool const lost =
            before->sinceCleared == ReadinessStatus::Complete && after.sinceCleared == ReadinessStatus::NotComplete;
        bool const done = after.sinceCleared == ReadinessStatus::Complete;
        ChangeWeight const weight = lost && !pair.cleared ? ChangeWeight::Worse
                                    : done                ? ChangeWeight::Better
                                                          : ChangeWeight::Neutral;
        pair.add(lost ? "monitor-incomplete" : "monitor", weight, texts::change::readiness, after.name,
                 texts::statuses[before->sinceCleared], texts::statuses[after.sinceCleared]);
    }
}

// A counter that is 0 is not in the list.
unsigned int countOf(CountersReport const& report, std::string const& name)
{
    auto const found = std::find_if(report.counters.begin(), report.counters.end(),
                                    [&name](CountersReport::Counter const& each) { return each.name == name; });
    return found != report.counters.end() ? found->value : 0;
}

void compareCounters(ModulePair const& pair)
{
    if (pair.older.counters.answer != TopicAnswer::Read || pair.newer.counters.answer != TopicAnswer::Read) {
        return;
    }
    for (CountersReport::Counter const& after : pair.newer.counters.counters) {
        unsigned int const before = countOf(pair.older.counters, after.name);
        if (before != after.value) {
            pair.add("counter", ChangeWeight::Neutral, texts::change::counter, after.name, std::to_string(before),
                     std::to_string(after.value));
        }
    }
}

std::string softwareText(InfoReport const& info)
{
    std::string text;
    for (InfoReport::Calibration const& each : info.calibrations) {
        text += (text.empty() ? "" : ", ") + each.id + (each.verification.empty() ? "" : " " + each.verification);
    }
    return text;
}

void compareNumbers(ModulePair const& pair)
{
    std::string const before = softwareText(pair.older.info);
    std::string const after = softwareText(pair.newer.info);
    if (!before.empty() && !after.empty() && before != after) {
        pair.add("software", ChangeWeight::Neutral, texts::change::software, {}, before, after);
    }
    std::string const& vin = pair.newer.info.vin;
    if (!pair.older.info.vin.empty() && !vin.empty() && pair.older.info.vin != vin) {
        pair.add("vin", ChangeWeight::Neutral, texts::change::vin, {}, pair.older.info.vin, vin);
    }
}

void compareModules(std::vector<Change>& list, VehicleReport const& older, VehicleReport const& newer)
{
    auto const addMissing = [&list](VehicleReport const& from, VehicleReport const& in, bool isNew) {
        for (ModuleReport const& module : from.modules) {
            if (findModule(in, module.id) == nullptr) {
                list.push_back({isNew ? "module-new" : "module-gone",
                                ChangeWeight::Neutral,
                                nameOf(module),
                                texts::change::module,
                                {},
                                isNew ? texts::change::absent : texts::change::present,
                                isNew ? texts::change::present : texts::change::absent});
            }
        }
    };
    addMissing(newer, older, true);
    addMissing(older, newer, false);
}

} // namespace

bool wereCleared(VehicleReport const& older, VehicleReport const& newer)
{
    return std::any_of(newer.modules.begin(), newer.modules.end(), [&older](ModuleReport const& module) {
        ModuleReport const* const before = findModule(older, module.id);
        return before != nullptr && wasCleared(*before, module);
    });
}

std::vector<Change> changesBetween(VehicleReport const& older, VehicleReport const& newer)
{
    std::vector<Change> list;
    bool const cleared = wereCleared(older, newer);
    if (cleared) {
        list.push_back(
            {"cleared", ChangeWeight::Neutral, {}, texts::change::cleared, texts::change::clearedText, {}, {}});
    }
    compareModules(list, older, newer);
    for (auto const compare :
         {compareLamp, compareCodes, compareReadiness, compareTests, compareNumbers, compareCounters}) {
        for (ModuleReport const& module : newer.modules) {
            if (ModuleReport const* const before = findModule(older, module.id)) {
                compare({*before, module, nameOf(module), cleared, list});
            }
        }
    }
    return list;
}

bool hasWorse(std::vector<Change> const& changes)
{
    return std::any_of(changes.begin(), changes.end(),
                       [](Change const& each) { return each.weight == ChangeWeight::Worse; });
}

std::string toJson(std::vector<Change> const& changes)
{
    static constexpr std::array<char const*, 3> weights = {"neutral", "better", "worse"};
    Json list = Json::array();
    for (Change const& each : changes) {
        list.push_back({{"kind", each.kind},
                        {"weight", weights[static_cast<std::size_t>(each.weight)]},
                        {"module", textOrNull(each.module)},
                        {"what", each.what},
                        {"name", textOrNull(each.name)},
                        {"before", textOrNull(each.before)},
                        {"after", textOrNull(each.after)}});
    }
    return printed(list);
}

} // namespace velmora
