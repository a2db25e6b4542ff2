#include "libvelmora/report/document/reportfile.h"

#include "libvelmora/record/checkedfile.h"

#include <velmora/error.h>

#include <array>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <utility>

namespace velmora {

namespace {

std::string contentOf(ReportForm form, VehicleReport const& report, ReportFacts const& facts, std::string const& text)
{
    switch (form) {
    case ReportForm::Html:
        return toHtml(makeDocument(report, facts));
    case ReportForm::Markdown:
        return toMarkdown(makeDocument(report, facts));
    case ReportForm::Data:
        return reportJson(report, facts);
    default:
        return text;
    }
}

} // namespace

ReportForm reportFormOf(std::string const& path)
{
    static constexpr std::array<std::pair<char const*, ReportForm>, 4> forms = {{{".html", ReportForm::Html},
                                                                                 {".md", ReportForm::Markdown},
                                                                                 {".json", ReportForm::Data},
                                                                                 {".txt", ReportForm::Text}}};
    for (auto const& [ending, form] : forms) {
        if (path.ends_with(ending)) {
            return form;
        }
    }
    throw Error(ErrorKind::WrongUse, "The ending of " + path + " names no form of a report",
                {"known are .html, .md, .json and .txt"});
}

void checkReportPath(std::string const& path, bool replace)
{
    reportFormOf(path);
    if (!std::filesystem::exists(path)) {
        return;
    }
    if (!replace) {
        throw Error(ErrorKind::WrongUse, "The report " + path + " exists already", {"--force replaces it"});
    }
    requireWritable(path, "report");
}

VehicleReport withShownVins(VehicleReport report, ReportFacts const& facts)
{
    for (ModuleReport& module : report.modules) {
        module.info.vin = shownVin(module.info.vin, facts.maskVin);
    }
    return report;
}

void writeReport(std::string const& path, VehicleReport const& report, ReportFacts const& facts,
                 std::string const& text, bool replace)
{
    checkReportPath(path, replace);
    std::string const content = contentOf(reportFormOf(path), report, facts, text);
    std::ofstream file(path, std::ios::binary | std::ios::trunc);
    file << content << std::flush;
    if (!file) {
        throw Error(ErrorKind::Failed, "Could not write the report " + path + ": " + std::strerror(errno),
                    {"does its folder exist, and is there room on the disk?"});
    }
}

} // namespace velmora
