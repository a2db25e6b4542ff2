#include "libvelmora/report/document/reportdocument.h"

#include "libvelmora/report/document/reportsections.h"
#include "libvelmora/report/document/vehiclereportjson.h"
#include "libvelmora/report/texts/labels.h"

#include <fmt/format.h>

namespace velmora {

namespace {

constexpr std::size_t vinSerial = 6;

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
