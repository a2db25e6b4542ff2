#include "libvelmora/report/finding/inspection.h"

#include "libvelmora/report/finding/inspectionrules.h"
#include "libvelmora/report/texts/inspectiontexts.h"
#include "libvelmora/vehicle/vin.h"

#include <fmt/format.h>

#include <algorithm>
#include <array>

namespace velmora {

namespace {

constexpr int firstObdYear = 1996;
constexpr std::array<char const*, 5> inspectionKeys = {"none", "us-epa", "us-california", "uk-mot", "de-au"};

// The year of a North American number, which tells it for sure; nothing where modules disagree.
std::optional<int> yearOfVin(VehicleReport const& report, int thisYear)
{
    std::optional<int> year;
    for (ModuleReport const& module : report.modules) {
        if (!isVin(module.info.vin)) {
            continue;
        }
        VinFacts const facts = decodeVin(module.info.vin, thisYear);
        if (facts.yearBasis != VinFacts::YearBasis::Position || facts.years.size() != 1 ||
            (year && *year != facts.years.front())) {
            return std::nullopt;
        }
        year = facts.years.front();
    }
    return year;
}

// Only the rules of the USA go by the model year.
bool takesYear(InspectionReport& report, VehicleReport const& vehicle, InspectionWish const& wish, int thisYear)
{
    report.modelYear = wish.modelYear ? wish.modelYear : yearOfVin(vehicle, thisYear);
    report.yearByVin = !wish.modelYear && report.modelYear;
    if (!report.modelYear) {
        report.reasons.emplace_back(texts::inspection::yearMissing);
        return false;
    }
    if (*report.modelYear < firstObdYear) {
        report.reasons.push_back(fmt::format(texts::inspection::tooOld, firstObdYear));
        return false;
    }
    return true;
}

struct RuleTexts
{
    char const* name;
    char const* date;
    char const* note;
};

RuleTexts textsOf(InspectionRule rule)
{
    namespace all = texts::inspection;
    static constexpr RuleTexts list[] = {{"", "", ""},
                                         {all::usEpa, all::usEpaDate, all::usEpaNote},
                                         {all::california, all::californiaDate, all::californiaNote},
                                         {all::ukMot, all::ukMotDate, all::ukMotNote},
                                         {all::deAu, all::deAuDate, all::deAuNote}};
    return list[static_cast<std::size_t>(rule)];
}

} // namespace

std::optional<InspectionRule> parseInspectionRule(std::string const& text)
{
    auto const found = std::find(inspectionKeys.begin(), inspectionKeys.end(), text);
    return found != inspectionKeys.end() ? std::optional(static_cast<InspectionRule>(found - inspectionKeys.begin()))
                                         : std::nullopt;
}

char const* inspectionKey(InspectionRule rule)
{
    return inspectionKeys[static_cast<std::size_t>(rule)];
}

InspectionReport inspect(VehicleReport const& vehicle, InspectionWish const& wish, int thisYear)
{
    RuleTexts const words = textsOf(wish.rule);
    InspectionReport report{wish.rule, words.name, words.date, {}, false, {}, {}, {}};
    report.notes = {words.note, texts::inspection::rulesChange};
    bool const american = wish.rule == InspectionRule::UsEpa || wish.rule == InspectionRule::UsCalifornia;
    if (american && !takesYear(report, vehicle, wish, thisYear)) {
        return report;
    }
    judgeInspection(vehicle, report);
    return report;
}

Json toJsonValue(InspectionReport const& report)
{
    static constexpr std::array<char const*, 3> verdicts = {nullptr, "ready", "not ready"};
    char const* const verdict = verdicts[static_cast<std::size_t>(report.verdict)];
    return {{"rule", inspectionKey(report.rule)},
            {"name", report.name},
            {"date", report.date},
            {"modelYear", valueOrNull(report.modelYear)},
            {"modelYearBy", report.modelYear ? Json(report.yearByVin ? "VIN" : "option") : Json(nullptr)},
            {"suggests", verdict != nullptr ? Json(verdict) : Json(nullptr)},
            {"reasons", report.reasons},
            {"notes", report.notes}};
}

} // namespace velmora
