#include "libvelmora/report/reportdocument.h"

#include "libvelmora/report/findings.h"
#include "libvelmora/report/texts.h"
#include "libvelmora/report/vinreport.h"
#include "libvelmora/vehicle/vin.h"

#include <fmt/format.h>

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

DocumentSection vehicleSection(VehicleReport const& report, ReportFacts const& facts)
{
    DocumentFacts rows;
    std::string const vin = firstVin(report);
    rows.rows.push_back({texts::vin, DocumentCell(shownVin(vin, facts.maskVin))});
    if (isVin(vin)) {
        rows.rows.push_back({texts::maker, DocumentCell(makerText(decodeVin(vin, facts.year)))});
    }
    rows.rows.push_back({texts::made, DocumentCell(facts.date)});
    return {1, texts::vehicle, {rows}};
}

DocumentSection findingSection(VehicleReport const& report)
{
    DocumentSection section{1, texts::findings, {}};
    std::vector<Finding> const list = findings(report);
    if (list.empty()) {
        section.blocks.push_back(DocumentParagraph{{texts::noFindings, DocumentMark::Good}});
        return section;
    }
    DocumentTable table{{{texts::kind}, {texts::module}, {texts::meaning}}, {}};
    for (Finding const& each : list) {
        table.rows.push_back({{each.what, each.severity == Severity::Bad ? DocumentMark::Bad : DocumentMark::Warning},
                              {each.module},
                              {each.text}});
    }
    section.blocks.push_back(table);
    return section;
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
    rows.rows.push_back({texts::protocol, DocumentCell(report.protocol.name)});
    return {1, texts::howRead, {rows}};
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
    ReportDocument document{
        texts::title, {vehicleSection(report, facts), findingSection(report)}, texts::footer + facts.version};
    for (ModuleReport const& module : report.modules) {
        for (DocumentSection& section : moduleSections(module, facts)) {
            document.sections.push_back(std::move(section));
        }
    }
    document.sections.push_back(sourceSection(report, facts));
    return document;
}

} // namespace velmora
