#include "common/text/layout.h"
#include "program/command/commands.h"
#include "program/command/signalsprobe.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/json.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/error.h>
#include <velmora/signals.h>

#include <CLI/App.hpp>
#include <fmt/format.h>

#include <memory>

namespace velmora::cli {

namespace {

struct SignalOptions
{
    CLI::App* import = nullptr;
    CLI::App* check = nullptr;
    CLI::App* list = nullptr;
    std::string source;
    std::vector<std::string> files;
    CLI::App* probe = nullptr;
    ProbeOptions probing;
};

void tellAll(std::vector<SignalMistake> const& mistakes, std::string const& path)
{
    for (SignalMistake const& each : mistakes) {
        tell(toText(each, path) + "\n");
    }
}

ExitCode importFile(SignalOptions const& options, bool json)
{
    SignalListing const import = convertSignals(options.source);
    tellAll(import.notes, options.source);
    tellAll(import.mistakes, options.source);
    tell(fmt::format("{} taken, {} left out\n", counted(import.signals.size(), "signal"), import.mistakes.size()));
    fmt::print("{}", json ? import.json : import.toml);
    if (import.signals.empty()) {
        throw Error(ErrorKind::Failed, "Nothing of " + options.source + " could be taken");
    }
    return ExitCode::Done;
}

ExitCode checkFiles(SignalOptions const& options)
{
    bool sound = true;
    for (std::string const& path : options.files) {
        SignalListing const listing = checkSignals(path);
        tellAll(listing.mistakes, path);
        sound = sound && listing.mistakes.empty();
        if (listing.mistakes.empty()) {
            fmt::print("{}: {}\n", path, counted(listing.signals.size(), "signal"));
        }
    }
    return sound ? ExitCode::Done : ExitCode::WrongUse;
}

std::vector<Cell> row(SignalOutline const& signal)
{
    std::string const how = signal.enabled ? signal.reason : "off: " + signal.reason;
    return {{signal.id},
            {signal.name},
            {signal.header.empty() ? "-" : signal.header},
            {signal.request.empty() ? "-" : fmt::format("{:02X}", fmt::join(signal.request, ""))},
            {signal.unit},
            {how}};
}

ExitCode listFiles(SignalOptions const& options, GlobalOptions const& global)
{
    Json document = Json::array();
    for (std::string const& path : options.files) {
        SignalListing const listing = listSignals(path);
        if (global.json) {
            document.push_back(Json::parse(listing.json));
            continue;
        }
        std::vector<std::vector<Cell>> rows;
        for (SignalOutline const& signal : listing.signals) {
            rows.push_back(row(signal));
        }
        printText(fmt::format("{}\n{}", path, drawColumns(rows, "  ", outputStyle(global))));
    }
    if (global.json) {
        fmt::print("{}", printed(document));
    }
    return ExitCode::Done;
}

ExitCode runSignals(SignalOptions const& options, GlobalOptions const& global)
{
    if (options.import->parsed()) {
        return importFile(options, global.json);
    }
    if (options.probe->parsed()) {
        return probe(options.probing, global);
    }
    return options.check->parsed() ? checkFiles(options) : listFiles(options, global);
}

} // namespace

void addSignalsCommand(CommandLine& commandLine)
{
    auto const options = std::make_shared<SignalOptions>();
    CLI::App* const command =
        commandLine.addCommand("signals", "Signals of your own: read, check and import their files",
                               [options](GlobalOptions const& global) { return runSignals(*options, global); });
    command->require_subcommand(1);
    options->import = command->add_subcommand("import", "Write the signals of another tool's file as a signal file");
    options->import->add_option("FILE", options->source, "CSV of phone apps, or JSON of OBDb, WiCAN or ABRP")
        ->required();
    options->check = command->add_subcommand("check", "Tell all mistakes of signal files");
    options->check->add_option("FILE", options->files, "Signal files")->required();
    options->list = command->add_subcommand("list", "List the signals of signal files");
    options->list->add_option("FILE", options->files, "Signal files")->required();
    options->probe = addProbe(*command, options->probing);
}

} // namespace velmora::cli
