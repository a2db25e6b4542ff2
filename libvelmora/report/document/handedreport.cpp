// A report as applications hand it over; see <velmora/document.h>.

#include "libvelmora/report/document/reportfile.h"
#include "libvelmora/report/plain/reporttext.h"

#include <velmora/document.h>
#include <velmora/version.h>

#include <fmt/chrono.h>
#include <fmt/format.h>

#include <ctime>

namespace velmora {

namespace {

ReportFacts factsOf(DocumentOptions const& options)
{
    std::time_t const made = std::chrono::system_clock::to_time_t(options.made);
    std::tm local{};
    localtime_r(&made, &local);
    return {fmt::format("{:%Y-%m-%d %H:%M}", local), options.port,   versionText, options.maskVin, local.tm_year + 1900,
            {options.inspection, options.modelYear}, options.vehicle};
}

std::string plainText(VehicleReport const& report, ReportFacts const& facts, Style const& style)
{
    VehicleReport const shown = withShownVins(report, facts);
    if (facts.inspection.rule == InspectionRule::None) {
        return toText(shown, style);
    }
    return toText(shown, style, inspect(shown, facts.inspection, facts.year));
}

} // namespace

std::string toText(VehicleReport const& report, DocumentOptions const& options, TextStyle const& style)
{
    return plainText(report, factsOf(options), styleOf(style));
}

std::string toJson(VehicleReport const& report, DocumentOptions const& options)
{
    ReportFacts const facts = factsOf(options);
    return reportJson(withShownVins(report, facts), facts);
}

void checkDocument(std::string const& file, bool replace)
{
    checkReportPath(file, replace);
}

void writeDocument(std::string const& file, VehicleReport const& report, DocumentOptions const& options, bool replace)
{
    ReportFacts const facts = factsOf(options);
    writeReport(file, withShownVins(report, facts), facts, plainText(report, facts, Style(false)), replace);
}

} // namespace velmora
