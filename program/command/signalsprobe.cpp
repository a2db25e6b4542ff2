#include "program/command/signalsprobe.h"

#include "common/text/layout.h"
#include "program/command/commandcar.h"
#include "program/terminal/output.h"
#include "program/terminal/promptreader.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/error.h>
#include <velmora/settingsfile.h>

#include <fmt/format.h>

#include <filesystem>
#include <fstream>

namespace velmora::cli {

namespace {

std::string outputOf(ProbeOptions const& options)
{
    std::string const file =
        options.output.empty() ? fmt::format("signals-{}.toml", probedModule(options.request)) : options.output;
    if (std::filesystem::exists(file)) {
        if (!options.force) {
            throw Error(ErrorKind::WrongUse, file + " is there already",
                        {"--output names another file, --force replaces it"});
        }
        requireWritable(file, "signal file");
    }
    return file;
}

void write(std::string const& path, ProbeReport const& report)
{
    std::ofstream out(path, std::ios::trunc);
    out << report.toSignals();
    out.close();
    if (!out) {
        throw Error(ErrorKind::Failed, path + " can't be written", {"is the disk full?"});
    }
    tell(fmt::format("{} in {}\n", counted(report.told(), "signal"), path));
}

ProbeReport ask(ProbeOptions const& given, CommandCar& car)
{
    try {
        return car.probe(given.request, [](std::string const& at) { tell(fmt::format("Going on at {}\n", at)); });
    } catch (Error const& error) {
        if (error.kind() != ErrorKind::NotSupported && error.kind() != ErrorKind::WrongUse && !car.options().quiet) {
            tell(PromptReader::canRedraw() ? "\n" : "");
            tell("What was found is kept: the same command goes on with it if the car tells its VIN\n");
        }
        throw;
    }
}

} // namespace

CLI::App* addProbe(CLI::App& signals, ProbeOptions& options)
{
    CLI::App* const probe =
        signals.add_subcommand("probe", "Ask a module for its identifiers, one by one, five a second");
    probe->add_option("--module", options.request.module, "Identifier of the requests: 7E0, 7B3, 18DA10F1")
        ->type_name("ID");
    probe->add_option("--reply", options.request.reply, "That of the replies, where it does not follow from the module")
        ->type_name("ID");
    probe->add_option("--ext", options.request.extended, "Address byte of the module")->type_name("HEX");
    probe->add_option("--service", options.request.service, "22, 21 or 1A")->type_name("HEX");
    probe->add_option("--from", options.request.from, "First identifier")->type_name("HEX");
    probe->add_option("--to", options.request.to, "Last identifier")->type_name("HEX");
    probe->add_option("-o,--output", options.output, "Signal file to start from (signals-MODULE.toml)")
        ->type_name("FILE");
    probe->add_flag("--fresh", options.request.fresh, "Begin anew where an interrupted run would go on");
    probe->add_flag("--force", options.force, "Replace the file");
    return probe;
}

ExitCode probe(ProbeOptions const& given, GlobalOptions const& options)
{
    probedModule(given.request); // a request that makes no sense is told before anything else
    std::string const output = outputOf(given);
    CommandCar car(options);
    ProbeReport const report = ask(given, car);
    if (options.json) {
        fmt::print("{}", report.toJson());
    } else {
        printText(report.toText(textStyle(options)));
    }
    flushOutput();
    write(output, report);
    return ExitCode::Done;
}

} // namespace velmora::cli
