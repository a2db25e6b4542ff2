#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/view/json.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/error.h>
#include <velmora/history.h>

#include <fmt/format.h>

#include <optional>
#include <utility>

namespace velmora::cli {

namespace {

struct DiffOptions
{
    std::optional<std::int64_t> older;
    std::optional<std::int64_t> newer;
    std::string vehicle;
    bool checking = false;
};

using ScanPair = std::pair<KeptScan, KeptScan>;

KeptScan newestOf(std::vector<KeptScan> const& scans, std::string const& vehicle)
{
    if (scans.empty()) {
        throw Error(ErrorKind::WrongUse, "Nothing is kept" + (vehicle.empty() ? "" : " of " + vehicle),
                    {"velmora scan --history keeps a scan"});
    }
    return scans.back();
}

// The last two of the vehicle that was scanned last.
ScanPair lastTwo(History const& history, std::string const& wanted)
{
    std::string const vehicle = wanted.empty() ? newestOf(history.scans(), {}).vehicle : wanted;
    std::vector<KeptScan> const scans = history.scans(vehicle);
    KeptScan const newest = newestOf(scans, vehicle);
    if (scans.size() < 2) {
        throw Error(ErrorKind::WrongUse, "Of " + vehicle + " there is one scan only, so there is nothing to compare",
                    {"velmora scan --history keeps another one"});
    }
    return {scans[scans.size() - 2], newest};
}

ScanPair choosePair(DiffOptions const& options)
{
    History const history(History::Access::Look);
    if (!options.older) {
        return lastTwo(history, options.vehicle);
    }
    KeptScan const older = history.scan(*options.older);
    KeptScan const newer = options.newer ? history.scan(*options.newer) : newestOf(history.scans(older.vehicle), {});
    if (older.vehicle != newer.vehicle) {
        throw Error(
            ErrorKind::WrongUse,
            fmt::format("Scan {} is of {}, scan {} of {}", older.number, older.vehicle, newer.number, newer.vehicle),
            {"velmora history lists the scans of each vehicle"});
    }
    if (older.number == newer.number) {
        throw Error(ErrorKind::WrongUse, fmt::format("Scan {} is the newest of its vehicle", older.number),
                    {"name an older one, or two"});
    }
    return {older, newer};
}

ExitCode diff(DiffOptions const& options, GlobalOptions const& global)
{
    auto const [older, newer] = choosePair(options);
    VehicleReport const before = reportOf(older);
    VehicleReport const after = reportOf(newer);
    std::vector<Change> const changes = changesBetween(before, after);
    if (global.json) {
        fmt::print("{}", printed(Json{{"older", Json::parse(toJson(older))},
                                      {"newer", Json::parse(toJson(newer))},
                                      {"cleared", wereCleared(before, after)},
                                      {"worse", hasWorse(changes)},
                                      {"changes", Json::parse(toJson(changes))}}));
    } else {
        printText(toText(older, newer, changes, textStyle(global)));
    }
    return options.checking && hasWorse(changes) ? ExitCode::Findings : ExitCode::Done;
}

} // namespace

void addDiffCommand(CommandLine& commandLine)
{
    auto const options = std::make_shared<DiffOptions>();
    CLI::App* const command =
        commandLine.addCommand("diff", "Tell what changed between two scans of a vehicle that were kept",
                               [options](GlobalOptions const& global) { return diff(*options, global); });
    command->add_option("OLD", options->older, "Number of the older scan (the last but one)")->type_name("");
    command->add_option("NEW", options->newer, "Number of the newer scan (the last of that vehicle)")->type_name("");
    command->add_option("--vehicle", options->vehicle, "Of which vehicle, where no number is given (the last scanned)")
        ->type_name("VIN");
    command->add_flag("--check", options->checking,
                      "Exit with code 10 if something got worse: a new confirmed or permanent code, the lamp on,\n"
                      "a monitor no longer complete without a clear, a result that left its limits");
}

} // namespace velmora::cli
