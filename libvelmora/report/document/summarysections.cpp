// The vehicle at a glance, as a whole and by its control modules.

#include "libvelmora/report/document/reportsections.h"
#include "libvelmora/report/finding/findingparts.h"
#include "libvelmora/report/texts/labels.h"
#include "libvelmora/report/vinreport.h"
#include "libvelmora/vehicle/vin.h"

#include <fmt/format.h>

#include <algorithm>
#include <set>

namespace velmora {

namespace {

// The first VIN that a module told.
std::string firstVin(VehicleReport const& report)
{
    for (ModuleReport const& module : report.modules) {
        if (!module.info.vin.empty()) {
            return module.info.vin;
        }
    }
    return {};
}

std::string yearsText(VinFacts const& vin)
{
    std::string const years = fmt::format("{}", fmt::join(vin.years, texts::orYear));
    return vin.yearBasis == VinFacts::YearBasis::Perhaps ? fmt::format(texts::yearPerhaps, years) : years;
}

DocumentCell lampTile(VehicleReport const& report)
{
    bool told = false;
    for (ModuleReport const& module : report.modules) {
        if (module.codes.lamp.value_or(false)) {
            return {texts::on, DocumentMark::Bad};
        }
        told = told || module.codes.lamp;
    }
    return told ? DocumentCell{texts::off, DocumentMark::Good} : DocumentCell{texts::notTold, DocumentMark::Faint};
}

// Confirmed and permanent ones, each once a module; "0" only where a list of confirmed ones was told.
DocumentCell codesTile(VehicleReport const& report)
{
    std::set<std::pair<unsigned int, std::string>> codes;
    bool told = false;
    for (ModuleReport const& module : report.modules) {
        for (CodeKind const kind : {CodeKind::Confirmed, CodeKind::Permanent}) {
            CodeList const* const list = readList(module, kind);
            told = told || (list != nullptr && kind == CodeKind::Confirmed);
            for (TroubleCode const& code : list != nullptr ? list->codes : std::vector<TroubleCode>()) {
                codes.emplace(module.id, code.code);
            }
        }
    }
    if (!told && codes.empty()) {
        return {texts::notTold, DocumentMark::Faint};
    }
    return {std::to_string(codes.size()), codes.empty() ? DocumentMark::Good : DocumentMark::Bad};
}

DocumentCell readinessTile(VehicleReport const& report)
{
    std::size_t count = 0;
    bool told = false;
    for (ModuleReport const& module : report.modules) {
        told = told || isReady(module.readiness).has_value();
        count += countNotComplete(module.readiness);
    }
    if (!told) {
        return {texts::notTold, DocumentMark::Faint};
    }
    return {std::to_string(count), count == 0 ? DocumentMark::Good : DocumentMark::Warning};
}

DocumentTiles tilesOf(VehicleReport const& report, std::vector<Finding> const& list)
{
    auto const suggestions = std::count_if(list.begin(), list.end(), isSuggestion);
    return {{{texts::lampShort, lampTile(report)},
             {texts::codeCount, codesTile(report)},
             {texts::incompleteCount, readinessTile(report)},
             {texts::suggestionCount,
              {std::to_string(suggestions), suggestions == 0 ? DocumentMark::None : DocumentMark::Warning}},
             {texts::moduleCount, {std::to_string(report.modules.size())}}}};
}

} // namespace

DocumentSection vehicleSection(VehicleReport const& report, ReportFacts const& facts, std::vector<Finding> const& list)
{
    DocumentFacts rows;
    std::string const vin = firstVin(report);
    if (!vin.empty() || facts.vehicle.empty()) {
        rows.rows.push_back({texts::vin, DocumentCell(shownVin(vin, facts.maskVin))});
    }
    if (!facts.vehicle.empty()) {
        rows.rows.push_back({texts::name, DocumentCell(facts.vehicle)});
    }
    if (isVin(vin)) {
        VinFacts const decoded = decodeVin(vin, facts.year);
        rows.rows.push_back({texts::maker, DocumentCell(makerText(decoded))});
        rows.rows.push_back({texts::modelYear, DocumentCell(yearsText(decoded))});
    }
    rows.rows.push_back({texts::made, DocumentCell(facts.date)});
    rows.rows.push_back({texts::adapter, DocumentCell(report.adapter.device)});
    return {1, texts::vehicle, {tilesOf(report, list), rows}, "vehicle"};
}

DocumentSection modulesSection(VehicleReport const& report)
{
    DocumentTable table{{{texts::module},
                         {texts::lampShort},
                         {texts::codeCount, DocumentMark::None, true},
                         {texts::incompleteCount, DocumentMark::None, true},
                         {texts::sensors, DocumentMark::None, true},
                         {texts::calibration}},
                        {}};
    for (ModuleReport const& module : report.modules) {
        VehicleReport const alone{{}, {}, {module}};
        DocumentCell name(nameOf(module));
        name.link = anchorOf({DataTopic::Info, module.id});
        DocumentCell codes = codesTile(alone);
        DocumentCell incomplete = readinessTile(alone);
        codes.isNumber = incomplete.isNumber = true;
        std::string calibrations;
        for (InfoReport::Calibration const& each : module.info.calibrations) {
            calibrations += (calibrations.empty() ? "" : ", ") + each.id;
        }
        table.rows.push_back({name,
                              lampTile(alone),
                              codes,
                              incomplete,
                              {std::to_string(module.supported.size()), DocumentMark::None, true},
                              {calibrations}});
    }
    return {1, texts::modules, {table}, "modules"};
}

} // namespace velmora
