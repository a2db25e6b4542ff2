#include "common/text/layout.h"
#include "common/text/text.h"
#include "program/command/commands.h"
#include "program/command/confirm.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/json.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/document.h>
#include <velmora/error.h>
#include <velmora/history.h>
#include <velmora/settingsfile.h>

#include <fmt/format.h>

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <fstream>
#include <sstream>
#include <unistd.h>

namespace velmora::cli {

namespace {

constexpr std::uintmax_t largestImport = 1'000'000'000; // bytes, of some hundred thousand scans

struct HistoryOptions
{
    CLI::App* show = nullptr;
    CLI::App* forget = nullptr;
    CLI::App* exporting = nullptr;
    CLI::App* importing = nullptr;
    std::int64_t number = 0;
    std::string vehicle;
    std::string file;
};

ExitCode listScans(GlobalOptions const& global)
{
    std::vector<KeptScan> const scans = History(History::Access::Look).scans();
    if (!global.json) {
        printText(toText(scans, textStyle(global)));
        return ExitCode::Done;
    }
    Json list = Json::array();
    for (KeptScan const& scan : scans) {
        list.push_back(Json::parse(toJson(scan)));
    }
    fmt::print("{}", printed(list));
    return ExitCode::Done;
}

ExitCode showScan(HistoryOptions const& options, GlobalOptions const& global)
{
    KeptScan const scan = History(History::Access::Look).scan(options.number);
    VehicleReport const report = reportOf(scan);
    if (global.json) {
        fmt::print("{}", report.toJson());
    } else {
        printText(toText(std::vector{scan}, textStyle(global)) + "\n" +
                  toText(report, DocumentOptions(), textStyle(global)));
    }
    return ExitCode::Done;
}

ExitCode forgetVehicle(HistoryOptions const& options, GlobalOptions const& global)
{
    requireConsent(global, "Forgetting", "forgets without asking");
    History history(History::Access::Keep);
    std::size_t const count = history.scans(options.vehicle).size();
    std::string const warning =
        fmt::format("{} of {} would be gone for good.\n", counted(count, "scan"), options.vehicle);
    if (count != 0 && !confirmed(global, warning, "Forget them?")) {
        tell("Nothing was forgotten\n");
        return ExitCode::Failed;
    }
    std::size_t const forgotten = history.forget(options.vehicle);
    fmt::print("{}", global.json ? printed(Json{{"forgotten", forgotten}})
                                 : fmt::format("Forgot {}\n", counted(forgotten, "scan")));
    return ExitCode::Done;
}

// What is exported names people's cars: only its owner may read it.
void writePrivately(std::string const& path, std::string const& text)
{
    int const file = ::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600);
    if (file < 0) {
        throw Error(ErrorKind::Failed, "Could not write " + path + ": " + std::strerror(errno),
                    {errno == EEXIST ? "name a file that does not stand yet" : "does its folder exist?"});
    }
    std::size_t written = 0;
    int error = 0;
    while (written < text.size() && error == 0) {
        ssize_t const count = ::write(file, text.data() + written, text.size() - written);
        error = count < 0 && errno != EINTR ? errno : 0;
        written += count > 0 ? static_cast<std::size_t>(count) : 0;
    }
    error = ::close(file) != 0 && error == 0 ? errno : error;
    if (error != 0) {
        ::unlink(path.c_str());
        throw Error(ErrorKind::Failed, "Could not write " + path + ": " + std::strerror(error),
                    {"is there room on the disk?"});
    }
}

ExitCode exportScans(HistoryOptions const& options, GlobalOptions const& global)
{
    std::ostringstream lines;
    std::size_t const count = History(History::Access::Look).exportTo(lines);
    if (options.file == "-") {
        writeOutput(lines.str());
        return ExitCode::Done;
    }
    writePrivately(options.file, lines.str());
    fmt::print("{}", global.json ? printed(Json{{"exported", count}})
                                 : fmt::format("Exported {} to {}\n", counted(count, "scan"), options.file));
    return ExitCode::Done;
}

ExitCode importScans(HistoryOptions const& options, GlobalOptions const& global)
{
    std::string why = whyUnreadable(options.file, largestImport);
    std::ifstream in;
    if (why.empty()) {
        in.open(options.file, std::ios::binary);
        why = in ? "" : std::strerror(errno);
    }
    if (!why.empty()) {
        throw Error(ErrorKind::WrongUse, "Could not read " + options.file + ": " + why,
                    {"velmora history export FILE writes one"});
    }
    History::Imported const result = History(History::Access::Keep).importFrom(in);
    fmt::print("{}", global.json ? printed(Json{{"added", result.added}, {"known", result.known}})
                                 : fmt::format("Imported {}, {} known already\n", counted(result.added, "scan"),
                                               counted(result.known, "scan")));
    return ExitCode::Done;
}

ExitCode runHistory(HistoryOptions const& options, GlobalOptions const& global)
{
    if (options.show->parsed()) {
        return showScan(options, global);
    }
    if (options.forget->parsed()) {
        return forgetVehicle(options, global);
    }
    if (options.exporting->parsed()) {
        return exportScans(options, global);
    }
    return options.importing->parsed() ? importScans(options, global) : listScans(global);
}

} // namespace

void addHistoryCommand(CommandLine& commandLine)
{
    auto const options = std::make_shared<HistoryOptions>();
    CLI::App* const command =
        commandLine.addCommand("history", "List the scans that were kept, and the vehicles they are of",
                               [options](GlobalOptions const& global) { return runHistory(*options, global); });
    command->require_subcommand(0, 1);
    options->show = command->add_subcommand("show", "Show the report of one scan");
    options->show->add_option("N", options->number, "Its number")->required()->type_name("");
    options->forget = command->add_subcommand("forget", "Drop all scans of a vehicle");
    options->forget->add_option("VIN", options->vehicle, "Its identification number, or name")->required();
    options->exporting = command->add_subcommand("export", "Write all scans to a file, one JSON object a line");
    options->exporting->add_option("FILE", options->file, "File, which must not stand yet; - for standard output")
        ->required();
    options->importing = command->add_subcommand("import", "Add the scans of an exported file; known ones are skipped");
    options->importing->add_option("FILE", options->file, "File of history export")->required();
}

} // namespace velmora::cli
