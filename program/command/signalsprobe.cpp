#include "program/command/signalsprobe.h"

#include "common/text/layout.h"
#include "common/text/text.h"
#include "libvelmora/signal/signalfile.h"
#include "libvelmora/signal/signalhex.h"
#include "libvelmora/uds/identifierprobe.h"
#include "libvelmora/uds/refusalcode.h"
#include "program/command/commandsession.h"
#include "program/terminal/output.h"
#include "program/terminal/promptreader.h"
#include "program/view/json.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/error.h>
#include <velmora/modules.h>
#include <velmora/settingsfile.h>
#include <velmora/vin.h>

#include <fmt/format.h>

#include <filesystem>
#include <fstream>

namespace velmora::cli {

namespace {

unsigned int hexadecimal(std::string const& text, char const* option, unsigned int highest)
{
    std::optional<unsigned int> const number = parseHex(text, highest);
    if (!number) {
        throw Error(ErrorKind::WrongUse, fmt::format("\"{}\" is no hexadecimal number for {}", text, option),
                    {fmt::format("it goes from 0 to {:X}", highest)});
    }
    return *number;
}

ProbeTask taskOf(ProbeOptions const& options)
{
    ProbeTask task;
    std::optional<std::string> const header = hexDigits(options.module);
    if (!header) {
        throw Error(ErrorKind::WrongUse, fmt::format("\"{}\" is no identifier of a module", options.module),
                    {"7E0, 7B3 or 18DA10F1 are"});
    }
    task.header = *header;
    task.reply = hexDigits(options.reply).value_or(std::string());
    if (task.reply.empty()) {
        std::optional<std::string> const standard = standardReply(task.header);
        std::optional<std::string> const swapped = standard ? standard : swappedReply(task.header);
        if (!swapped) {
            throw Error(ErrorKind::WrongUse, "The identifier of this module's replies has to be told, with --reply",
                        {"`velmora modules` finds it"});
        }
        task.reply = *swapped;
    }
    if (!options.extended.empty()) {
        task.extended = static_cast<unsigned char>(hexadecimal(options.extended, "--ext", 0xFF));
    }
    task.service = static_cast<unsigned char>(hexadecimal(options.service, "--service", 0xFF));
    task.from = hexadecimal(options.from, "--from", 0xFFFF);
    task.to = hexadecimal(options.to, "--to", 0xFFFF);
    checkProbe(task);
    return task;
}

std::string outputOf(ProbeOptions const& options, ProbeTask const& task)
{
    std::string const file = options.output.empty() ? fmt::format("signals-{}.toml", task.header) : options.output;
    if (std::filesystem::exists(file)) {
        if (!options.force) {
            throw Error(ErrorKind::WrongUse, file + " is there already",
                        {"--output names another file, --force replaces it"});
        }
        requireWritable(file, "signal file");
    }
    return file;
}

// What an earlier run has left, of the same task and vehicle.
ProbeState begin(ProbeStore const& store, ProbeTask const& task, std::string const& vin, bool fresh)
{
    ProbeState state;
    state.task = task;
    state.vin = vin;
    state.next = task.from;
    std::optional<ProbeState> const kept = fresh ? std::nullopt : store.load();
    if (!kept || kept->task != task) {
        return state;
    }
    if (kept->vin.empty() || kept->vin != vin) {
        throw Error(ErrorKind::WrongUse,
                    fmt::format("An interrupted probe of this module is of another vehicle ({}, this one is {})",
                                kept->vin.empty() ? "no VIN" : kept->vin, vin.empty() ? "without VIN" : vin),
                    {"--fresh drops it and begins anew"});
    }
    tell(fmt::format("Going on at {}\n", probeIdText(task, kept->next)));
    return *kept;
}

std::string shownData(ProbeState const& state, unsigned int id, std::vector<unsigned char> const& data)
{
    std::string const text = state.task.service == 0x22 ? identifierText(id, data) : hexText(data);
    return text == hexText(data) ? std::string() : text;
}

std::string resultText(ProbeState const& state, GlobalOptions const& options)
{
    std::vector<std::vector<Cell>> rows;
    for (auto const& [id, data] : state.told) {
        auto const second = state.second.find(id);
        bool const changes = second != state.second.end() && second->second != data;
        rows.push_back({{probeIdText(state.task, id)},
                        {hexText(data)},
                        {readable(shownData(state, id, data))},
                        {changes ? "changes" : ""}});
    }
    std::string text = drawColumns(rows, "  ", outputStyle(options));
    for (auto const& [codes, title] :
         {std::pair(&state.locked, "There, but locked"), {&state.later, "There, but not under these conditions"}}) {
        text += codes->empty() ? "" : fmt::format("{}:\n", title);
        for (auto const& [id, code] : *codes) {
            text += fmt::format("  {}  {}\n", probeIdText(state.task, id), refusalName(code));
        }
    }
    return text;
}

void write(std::string const& path, ProbeState const& state)
{
    std::ofstream out(path, std::ios::trunc);
    out << toToml(toSignalFile(state));
    out.close();
    if (!out) {
        throw Error(ErrorKind::Failed, path + " can't be written", {"is the disk full?"});
    }
    tell(fmt::format("{} in {}\n", counted(state.told.size(), "signal"), path));
}

} // namespace

CLI::App* addProbe(CLI::App& signals, ProbeOptions& options)
{
    CLI::App* const probe =
        signals.add_subcommand("probe", "Ask a module for its identifiers, one by one, five a second");
    probe->add_option("--module", options.module, "Identifier of the requests: 7E0, 7B3, 18DA10F1")->type_name("ID");
    probe->add_option("--reply", options.reply, "That of the replies, where it does not follow from the module")
        ->type_name("ID");
    probe->add_option("--ext", options.extended, "Address byte of the module")->type_name("HEX");
    probe->add_option("--service", options.service, "22, 21 or 1A")->type_name("HEX");
    probe->add_option("--from", options.from, "First identifier")->type_name("HEX");
    probe->add_option("--to", options.to, "Last identifier")->type_name("HEX");
    probe->add_option("-o,--output", options.output, "Signal file to start from (signals-MODULE.toml)")
        ->type_name("FILE");
    probe->add_flag("--fresh", options.fresh, "Begin anew where an interrupted run would go on");
    probe->add_flag("--force", options.force, "Replace the file");
    return probe;
}

ExitCode probe(ProbeOptions const& given, GlobalOptions const& options)
{
    ProbeTask const task = taskOf(given);
    std::string const output = outputOf(given, task);
    CommandSession session(options);
    session.connect();
    ProbeStore const store(ProbeStore::besides(session.settingsFile(), task));
    ProbeState state = begin(store, task, vehicleVin(*session.proxy()), given.fresh);
    ModuleAsker asker(*session.proxy(), session.channel());
    bool const drawn = !options.quiet && PromptReader::canRedraw();
    IdentifierProbe run(
        asker, [&session] { session.check(); }, [&store](ProbeState const& now) { store.save(now); },
        [drawn](ProbeState const& now) {
            if (drawn) {
                tell(fmt::format("\r\033[KAsked up to {}, {} told, {} locked", probeIdText(now.task, now.next),
                                 now.told.size(), now.locked.size()));
            }
        });
    try {
        run.run(state);
    } catch (Error const& error) {
        if (error.kind() != ErrorKind::NotSupported && error.kind() != ErrorKind::WrongUse && !options.quiet) {
            tell(drawn ? "\n" : "");
            tell("What was found is kept: the same command goes on with it\n");
        }
        throw;
    }
    tell(drawn ? "\r\033[K" : "");
    store.drop();
    if (options.json) {
        fmt::print("{}", printed(toJsonValue(state)));
    } else {
        printText(resultText(state, options));
    }
    flushOutput();
    write(output, state);
    return ExitCode::Done;
}

} // namespace velmora::cli
