#include "libvelmora/read/vehiclereader.h"
#include "program/command/commands.h"
#include "program/command/commandsession.h"
#include "program/command/makeoption.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/reporttext.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>

namespace velmora::cli {

namespace {

// A car that tells none of its codes is not known to be free of them.
ExitCode check(VehicleReport const& report)
{
    auto const anyModule = [&report](bool (*holds)(CodeReport const&)) {
        return std::any_of(report.modules.begin(), report.modules.end(),
                           [holds](ModuleReport const& module) { return holds(module.codes); });
    };
    if (anyModule(hasFindings)) {
        return ExitCode::Findings;
    }
    if (!anyModule(canBeChecked)) {
        flushOutput();
        throw Error(ErrorKind::NotSupported, "No control module told its trouble codes, so there is nothing to check",
                    {"is the ignition on?"});
    }
    return ExitCode::Done;
}

struct ScanOptions
{
    bool checking = false;
    std::string maker;
};

ExitCode scan(ScanOptions const& chosen, GlobalOptions const& options)
{
    CommandSession session(options);
    session.connect();
    VehicleReport const report = readVehicle(session, chosen.maker);
    fmt::print("{}", options.json ? toJson(report) : toText(report, outputStyle(options)));
    return chosen.checking ? check(report) : ExitCode::Done;
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
}

} // namespace velmora::cli
