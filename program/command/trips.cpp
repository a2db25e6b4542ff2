#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/tripstext.h"

#include <velmora/trips.h>

namespace velmora::cli {

namespace {

struct TripsOptions
{
    std::string file;
    bool csv = false;
};

ExitCode trips(GlobalOptions const& global, TripsOptions const& chosen)
{
    std::vector<Trip> const list = readTrips(chosen.file);
    writeOutput(global.json ? toJson(list) : chosen.csv ? tripsCsv(list) : tripsText(list));
    return ExitCode::Done;
}

} // namespace

void addTripsCommand(CommandLine& commandLine)
{
    auto const chosen = std::make_shared<TripsOptions>();
    CLI::App* const command =
        commandLine.addCommand("trips", "List the trips in a database of watch, with totals by day and month",
                               [chosen](GlobalOptions const& global) { return trips(global, *chosen); });
    command->add_option("DB", chosen->file, "The file of watch's output sqlite:FILE")->required();
    command->add_flag("--csv", chosen->csv, "Comma separated, one line a trip");
}

} // namespace velmora::cli
