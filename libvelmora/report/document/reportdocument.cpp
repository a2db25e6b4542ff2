#include "libvelmora/report/document/reportdocument.h"

#include "libvelmora/report/document/vehiclereportjson.h"
#include "libvelmora/report/finding/findingparts.h"
#include "libvelmora/report/texts/findingtexts.h"
#include "libvelmora/report/texts/inspectiontexts.h"
#include "libvelmora/report/texts/labels.h"
#include "libvelmora/report/vinreport.h"
#include "libvelmora/vehicle/vin.h"

#include <fmt/format.h>

#include <algorithm>
#include <set>

namespace velmora {

namespace {

constexpr std::size_t vinSerial = 6;

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

// Confirmed and permanent ones, each once a module; no number where not even one list was told.
DocumentCell codesTile(VehicleReport const& report)
{
    std::set<std::pair<unsigned int, std::string>> codes;
    bool told = false;
    for (ModuleReport const& module : report.modules) {
        for (CodeKind const kind : {CodeKind::Confirmed, CodeKind::Permanent}) {
            CodeList const* const list = readList(module, kind);
            told = told || list != nullptr;
            for (TroubleCode const& code : list != nullptr ? list->codes : std::vector<TroubleCode>()) {
                codes.emplace(module.id, code.code);
            }
        }
    }
    if (!told) {
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

DocumentSection inspectionSection(InspectionReport const& report)
{
    static constexpr DocumentMark marks[] = {DocumentMark::Faint, DocumentMark::Good, DocumentMark::Warning};
    auto const verdict = static_cast<std::size_t>(report.verdict);
    DocumentFacts rows;
    rows.rows.push_back({texts::inspection::verdictLabel, {texts::inspection::verdicts[verdict], marks[verdict]}});
    for (std::string const& reason : report.reasons) {
        rows.rows.push_back({texts::inspection::reasonLabel, {reason}});
    }
    rows.rows.push_back({texts::inspection::ruleLabel, {report.name}});
    rows.rows.push_back({texts::inspection::dateLabel, {report.date}});
    if (report.modelYear) {
        rows.rows.push_back({texts::inspection::yearLabel,
                             {report.yearByVin ? fmt::format(texts::inspection::yearByVin, *report.modelYear)
                                               : fmt::format(texts::inspection::yearByOption, *report.modelYear)}});
    }
    for (std::string const& note : report.notes) {
        rows.rows.push_back({texts::inspection::noteLabel, {note}});
    }
    return {1, texts::inspection::title, {rows}, "inspection"};
}

DocumentMark markOf(Severity severity)
{
    static constexpr DocumentMark marks[] = {DocumentMark::None, DocumentMark::Warning, DocumentMark::Bad};
    return marks[static_cast<std::size_t>(severity)];
}

DocumentNote noteOf(Finding const& finding)
{
    static constexpr char const* words[] = {texts::finding::note, texts::finding::warning, texts::finding::bad};
    DocumentNote note{{words[static_cast<std::size_t>(finding.severity)], markOf(finding.severity)},
                      finding.module + ", " + finding.what,
                      finding.text,
                      {{texts::finding::because1, {}}, {texts::finding::orElse1, {}}}};
    for (Evidence const& each : finding.evidence) {
        DocumentCell cell(each.text);
        cell.link = anchorOf(each);
        note.lists[0].second.push_back(std::move(cell));
    }
    for (std::string const& each : finding.otherwise) {
        note.lists[1].second.emplace_back(each);
    }
    return note;
}

DocumentTable toldTable(std::vector<Finding> const& list)
{
    DocumentTable table{{{texts::kind}, {texts::module}, {texts::meaning}}, {}};
    for (Finding const& each : list) {
        if (!isSuggestion(each)) {
            DocumentCell text(each.text);
            text.link = each.evidence.empty() ? std::string() : anchorOf(each.evidence.front());
            table.rows.push_back({{each.what, markOf(each.severity)}, {each.module}, text});
        }
    }
    return table;
}

// What the vehicle told, then what that suggests, which may be wrong and says so.
std::vector<DocumentSection> findingSections(std::vector<Finding> const& list)
{
    DocumentSection told{1, texts::findings, {}, "findings"};
    DocumentTable table = toldTable(list);
    if (table.rows.empty()) {
        told.blocks.push_back(DocumentParagraph{{texts::noFindings, DocumentMark::Good}});
    } else {
        told.blocks.push_back(std::move(table));
    }
    DocumentSection suggested{1, texts::suggested, {}, "suggestions"};
    for (Finding const& each : list) {
        if (isSuggestion(each)) {
            suggested.blocks.push_back(noteOf(each));
        }
    }
    return suggested.blocks.empty() ? std::vector{told} : std::vector{told, suggested};
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

DocumentSection sourceSection(VehicleReport const& report, ReportFacts const& facts)
{
    DocumentFacts rows;
    rows.rows.push_back({texts::port, DocumentCell(facts.port)});
    rows.rows.push_back({texts::device, DocumentCell(report.adapter.device)});
    rows.rows.push_back({texts::description, DocumentCell(report.adapter.description)});
    rows.rows.push_back({texts::identifier, DocumentCell(report.adapter.identification)});
    rows.rows.push_back(
        {texts::voltage, DocumentCell(report.adapter.volts ? fmt::format("{:.1f} V", *report.adapter.volts) : "")});
    std::string const number = report.protocol.number ? fmt::format(" ({})", *report.protocol.number) : std::string();
    rows.rows.push_back({texts::protocol, DocumentCell(report.protocol.name + number)});
    rows.rows.push_back({texts::howRun, DocumentCell(texts::program + facts.version)});
    return {1, texts::howRead, {rows}, "adapter"};
}

} // namespace

std::string shownVin(std::string const& vin, bool mask)
{
    if (!mask || vin.size() < vinSerial) {
        return vin;
    }
    return vin.substr(0, vin.size() - vinSerial) + std::string(vinSerial, '0');
}

ReportDocument makeDocument(VehicleReport const& report, ReportFacts const& facts)
{
    std::vector<Finding> const list = findings(report);
    ReportDocument document{
        texts::title, {vehicleSection(report, facts, list)}, texts::footer + facts.version, texts::contents};
    if (facts.inspection.rule != InspectionRule::None) {
        document.sections.push_back(inspectionSection(inspect(report, facts.inspection, facts.year)));
    }
    for (DocumentSection& section : findingSections(list)) {
        document.sections.push_back(std::move(section));
    }
    document.sections.push_back(modulesSection(report));
    for (ModuleReport const& module : report.modules) {
        for (DocumentSection& section : moduleSections(module, facts)) {
            document.sections.push_back(std::move(section));
        }
    }
    document.sections.push_back(sourceSection(report, facts));
    return document;
}

std::string reportJson(VehicleReport const& report, ReportFacts const& facts)
{
    Json document = toJsonValue(report);
    if (facts.inspection.rule != InspectionRule::None) {
        document["inspection"] = toJsonValue(inspect(report, facts.inspection, facts.year));
    }
    return printed(document);
}

} // namespace velmora
