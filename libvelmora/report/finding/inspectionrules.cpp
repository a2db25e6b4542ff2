#include "libvelmora/report/finding/inspectionrules.h"

#include "libvelmora/report/finding/findingparts.h"
#include "libvelmora/report/texts/inspectiontexts.h"

#include <fmt/format.h>

#include <algorithm>
#include <set>

namespace velmora {

namespace {

constexpr int firstStrictYear = 2000;        // California, petrol
constexpr int firstOneIncompleteYear = 2001; // of the EPA
constexpr int firstDieselYear = 1998;
constexpr int firstFilterYear = 2007;
constexpr int firstPermanentYear = 2010;

// What the rules look at, of the whole vehicle.
struct VehicleState
{
    std::optional<bool> lamp;
    std::vector<std::string> stored;
    std::vector<std::string> permanent;
    std::vector<std::string> silent; // modules whose confirmed codes are not known
    std::vector<std::string> incomplete;
    bool toldReadiness = false;
    bool diesel = false;

    explicit VehicleState(VehicleReport const& report)
    {
        std::set<std::string> names;
        for (ModuleReport const& module : report.modules) {
            if (module.codes.lamp) {
                lamp = lamp.value_or(false) || *module.codes.lamp;
            }
            addCodes(module);
            for (std::string const& name : incompleteMonitors(module)) {
                names.insert(name);
            }
            toldReadiness = toldReadiness || !module.readiness.monitors.empty();
            diesel = diesel || hasDieselMonitors(module);
        }
        incomplete.assign(names.begin(), names.end());
    }

private:
    void addCodes(ModuleReport const& module)
    {
        for (CodeList const& list : module.codes.lists) {
            bool const confirmed = list.kind == CodeKind::Confirmed;
            if (confirmed && list.answer != CodeList::Answer::Read && list.offered) {
                silent.push_back(nameOf(module));
            }
            for (TroubleCode const& code : list.codes) {
                if (list.kind != CodeKind::Pending) {
                    (confirmed ? stored : permanent).push_back(code.code);
                }
            }
        }
    }
};

// One rule at work on one vehicle.
class RuleJudge
{
public:
    RuleJudge(VehicleState const& state, InspectionReport& report) : m_state(state), m_report(report)
    {
        m_report.verdict = InspectionReport::Verdict::Ready;
    }

    void fail(std::string reason)
    {
        m_report.verdict = InspectionReport::Verdict::NotReady;
        m_report.reasons.push_back(std::move(reason));
    }

    // What is not known does not make a failure good.
    void doubt(std::string reason)
    {
        if (m_report.verdict == InspectionReport::Verdict::Ready) {
            m_report.verdict = InspectionReport::Verdict::Unknown;
        }
        m_report.reasons.push_back(std::move(reason));
    }

    void tell(std::string reason) { m_report.reasons.push_back(std::move(reason)); }

    void lamp()
    {
        if (!m_state.lamp) {
            doubt(texts::inspection::untoldLamp);
        } else if (*m_state.lamp) {
            fail(texts::inspection::lampOn);
        } else {
            tell(texts::inspection::lampOff);
        }
    }

    void storedCodes()
    {
        if (!m_state.stored.empty()) {
            fail(storedText());
        }
        for (std::string const& module : m_state.silent) {
            doubt(fmt::format(texts::inspection::untoldCodes, module));
        }
    }

    void permanentCodes()
    {
        if (!m_state.permanent.empty()) {
            fail(fmt::format(texts::inspection::permanent, m_state.permanent.size(),
                             fmt::join(m_state.permanent, ", ")));
        }
    }

    std::string storedText() const
    {
        return fmt::format(texts::inspection::stored, m_state.stored.size(), fmt::join(m_state.stored, ", "));
    }

    // At most that many of the monitors may be incomplete.
    void incompleteUpTo(std::size_t allowed)
    {
        if (readinessIsTold()) {
            bool const tooMany = m_state.incomplete.size() > allowed;
            judgeIncomplete(tooMany, fmt::format(texts::inspection::allowedCount, allowed));
        }
    }

    // Only those may be incomplete.
    void incompleteOf(std::vector<std::string> const& allowed)
    {
        if (readinessIsTold()) {
            bool const other =
                std::any_of(m_state.incomplete.begin(), m_state.incomplete.end(), [&allowed](std::string const& name) {
                    return std::find(allowed.begin(), allowed.end(), name) == allowed.end();
                });
            judgeIncomplete(other, allowed.empty()
                                       ? std::string(texts::inspection::allowedNone)
                                       : fmt::format(texts::inspection::allowedNames, fmt::join(allowed, ", ")));
        }
    }

private:
    bool readinessIsTold()
    {
        if (!m_state.toldReadiness) {
            doubt(texts::inspection::untoldReadiness);
        }
        return m_state.toldReadiness;
    }

    void judgeIncomplete(bool failed, std::string const& rule)
    {
        std::string const names = m_state.incomplete.empty()
                                      ? std::string(texts::inspection::noneIncomplete)
                                      : fmt::format(texts::inspection::incomplete, fmt::join(m_state.incomplete, ", "));
        failed ? fail(names) : tell(names);
        tell(rule);
    }

    VehicleState const& m_state;
    InspectionReport& m_report;
};

void judgeUsEpa(RuleJudge& judge, VehicleState const& state, int year)
{
    if (state.diesel && year < firstDieselYear) {
        judge.doubt(fmt::format(texts::inspection::dieselUntold, firstDieselYear));
        return;
    }
    judge.lamp();
    if (!state.stored.empty()) {
        judge.tell(judge.storedText()); // codes without the lamp pass
    }
    judge.incompleteUpTo(year >= firstOneIncompleteYear ? 1 : 2);
}

void judgeCalifornia(RuleJudge& judge, VehicleState const& state, int year)
{
    if (state.diesel && year < firstDieselYear) {
        judge.doubt(fmt::format(texts::inspection::dieselUntold, firstDieselYear));
        return;
    }
    judge.lamp();
    judge.storedCodes();
    if (year >= firstPermanentYear) {
        judge.permanentCodes();
    }
    if (!state.diesel && year < firstStrictYear) {
        judge.incompleteUpTo(1);
    } else if (!state.diesel) {
        judge.incompleteOf({"Evaporative System"});
    } else if (year < firstFilterYear) {
        judge.incompleteOf({});
    } else {
        judge.incompleteOf({"PM filter", "NMHC Catalyst"});
    }
}

void judgeUkMot(RuleJudge& judge)
{
    judge.lamp();
    judge.tell(texts::inspection::readinessFree);
}

void tellDeAu(RuleJudge& judge, VehicleState const& state)
{
    judge.lamp();
    if (!state.stored.empty()) {
        judge.tell(judge.storedText());
    }
    judge.tell(texts::inspection::readinessFree);
}

} // namespace

void judgeInspection(VehicleReport const& vehicle, InspectionReport& report)
{
    VehicleState const state(vehicle);
    RuleJudge judge(state, report);
    switch (report.rule) {
    case InspectionRule::UsEpa:
        judgeUsEpa(judge, state, *report.modelYear);
        break;
    case InspectionRule::UsCalifornia:
        judgeCalifornia(judge, state, *report.modelYear);
        break;
    case InspectionRule::UkMot:
        judgeUkMot(judge);
        break;
    default:
        tellDeAu(judge, state);
        report.verdict = InspectionReport::Verdict::Unknown; // the exhaust decides
        break;
    }
}

} // namespace velmora
