#include "program/command/commandcar.h"
#include "program/command/commands.h"
#include "program/command/keepscan.h"
#include "program/command/makeoption.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/document.h>
#include <velmora/error.h>
#include <velmora/findings.h>

#include <fmt/format.h>

#include <algorithm>

namespace velmora::cli {

namespace {

// The modules that have a lamp or confirmed codes and did not tell them, as "7E8 lamp and confirmed codes".
std::string listUntold(VehicleReport const& report)
{
    std::string text;
    for (ModuleReport const& module : report.modules) {
        std::vector<std::string> const topics = untold(module.codes);
        if (!topics.empty()) {
            text += fmt::format("{}{:X} {}", text.empty() ? "" : "; ", module.id, fmt::join(topics, " and "));
        }
    }
    return text;
}

// A car that does not tell all of its codes is not known to be free of them.
ExitCode check(VehicleReport const& report, std::string const& trouble)
{
    auto const anyModule = [&report](bool (*holds)(CodeReport const&)) {
        return std::any_of(report.modules.begin(), report.modules.end(),
                           [holds](ModuleReport const& module) { return holds(module.codes); });
    };
    if (anyModule(hasFindings)) {
        return ExitCode::Findings;
    }
    std::string const missing = listUntold(report);
    if (!missing.empty()) {
        flushOutput();
        throw Error(ErrorKind::Failed,
                    "Nothing was found, but not all was told: " + missing +
                        (trouble.empty() ? "" : "; the adapter reports " + trouble),
                    {"is the ignition on?", "try again: a reply may have been lost on the bus"});
    }
    if (!anyModule(canBeChecked)) {
        flushOutput();
        throw Error(ErrorKind::NotSupported,
                    "No control module reported its trouble codes, so there is nothing to check",
                    {"is the ignition on?"});
    }
    return ExitCode::Done;
}

struct ScanOptions
{
    bool checking = false;
    std::string maker;
    std::vector<std::string> reports;
    bool maskVin = false;
    bool force = false;
    InspectionRule inspection = InspectionRule::None;
    std::optional<int> modelYear;
    KeepWish keeping;
};

DocumentOptions documentOf(ScanOptions const& chosen, std::string const& port)
{
    DocumentOptions document;
    document.port = port;
    document.vehicle = chosen.keeping.vehicle;
    document.maskVin = chosen.maskVin;
    document.inspection = chosen.inspection;
    document.modelYear = chosen.modelYear;
    return document;
}

// What can be told before minutes are spent with the vehicle.
void checkReports(ScanOptions const& chosen)
{
    for (std::string const& path : chosen.reports) {
        checkDocument(path, chosen.force);
    }
}

ExitCode scan(ScanOptions& chosen, GlobalOptions const& options)
{
    checkReports(chosen);
    bool const keeps = decidesToKeep(chosen.keeping, options);
    CommandCar car(options);
    DocumentOptions const document = documentOf(chosen, car.port());
    VehicleReport const report = car.report(chosen.maker);
    for (std::string const& path : chosen.reports) {
        writeDocument(path, report, document, chosen.force);
    }
    if (options.json) {
        fmt::print("{}", toJson(report, document));
    } else {
        printText(toText(report, document, textStyle(options)));
    }
    if (keeps) {
        flushOutput();
        keepScan(report, chosen.keeping, options);
    }
    return chosen.checking ? check(report, car.trouble()) : ExitCode::Done;
}

// The rules of the USA go by the model year; the others ignore it.
void addInspectionOptions(CLI::App& command, ScanOptions& chosen)
{
    command
        .add_option_function<std::string>(
            "--inspection",
            [&chosen](std::string const& text) {
                auto const rule = parseInspectionRule(text);
                if (!rule) {
                    throw CLI::ValidationError(
                        "\"" + text + "\" is no rule; known are us-epa, us-california, uk-mot, de-au and none");
                }
                chosen.inspection = *rule;
            },
            "What the report suggests for an inspection: us-epa, us-california, uk-mot, de-au or none (none)")
        ->type_name("RULE");
    command
        .add_option("--model-year", chosen.modelYear,
                    "Model year, for the rules of the USA (by the VIN, where it tells the year for sure)")
        ->type_name("YEAR")
        ->check(CLI::Range(1980, 2100));
}

} // namespace

void addScanCommand(CommandLine& commandLine)
{
    auto const chosen = std::make_shared<ScanOptions>();
    CLI::App* const command =
        commandLine.addCommand("scan", "Report on the adapter and all control modules",
                               [chosen](GlobalOptions const& options) { return scan(*chosen, options); });
    command->add_flag("--check", chosen->checking,
                      "Exit with code 10 if the lamp is on or a code is confirmed or permanent; a pending one is none");
    addMakeOption(*command, chosen->maker);
    command->add_option("--report", chosen->reports, "Write the report there as well: .html, .md, .json or .txt")
        ->type_name("FILE");
    command->add_flag("--mask-vin", chosen->maskVin, "Show the last six characters of the VIN as zeros");
    command->add_flag("--force", chosen->force, "Let --report replace a file");
    addInspectionOptions(*command, *chosen);
    addKeepOptions(*command, chosen->keeping);
}

} // namespace velmora::cli
