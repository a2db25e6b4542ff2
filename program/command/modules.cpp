#include "common/text/layout.h"
#include "libvelmora/uds/identification.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/moduleidentity.h"
#include "libvelmora/uds/modulescan.h"
#include "libvelmora/uds/modulestore.h"
#include "libvelmora/uds/vehiclevin.h"
#include "program/command/commands.h"
#include "program/command/commandsession.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/terminal/promptreader.h"
#include "program/view/json.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/error.h>

#include <fmt/format.h>

namespace velmora::cli {

namespace {

struct ModulesOptions
{
    bool scan = false;
    bool all = false;
};

void tellScan(ScanProgress const& progress)
{
    tell(
        fmt::format("\r\033[KAsking each identifier: {} of {}, {} found", progress.done, progress.all, progress.found));
}

std::vector<FoundModule> scan(ModuleScan& scan, GlobalOptions const& options)
{
    if (!options.quiet) {
        tell("Listening for 3 s, then asking each identifier that nobody uses; it only reads. The vehicle has to "
             "stand\n");
    }
    std::vector<FoundModule> modules = scan.find();
    if (!options.quiet && PromptReader::canRedraw()) {
        tell("\r\033[K");
    }
    return modules;
}

std::string modulesText(std::vector<FoundModule> const& modules, GlobalOptions const& options)
{
    auto const shown = [](std::string const& text) { return text.empty() ? "-" : text; };
    std::vector<std::vector<Cell>> rows{{{"asked"}, {"answers"}, {"name"}, {"part"}, {"software"}, {"codes"}}};
    for (FoundModule const& each : modules) {
        rows.push_back({{each.request},
                        {shownModule(each.reply)},
                        {shown(each.name)},
                        {shown(each.part)},
                        {shown(each.software)},
                        {each.codes ? std::to_string(*each.codes) : "-", Mark::None, true}});
    }
    std::string text = drawColumns(rows, "  ", outputStyle(options));
    for (FoundModule const& each : modules) {
        if (each.identifiers.empty()) {
            continue;
        }
        text += fmt::format("\nControl module {}\n", shownModule(each.reply));
        for (auto const& [did, told] : each.identifiers) {
            text += fmt::format("  {:04X}  {:<58}  {}\n", did, identifierName(did), told);
        }
    }
    return text;
}

// On legacy buses, modules beyond those that the connection has started each need a start of their own, which would end
// it.
std::vector<FoundModule> modulesOfConnection(CommandSession& session)
{
    std::vector<FoundModule> modules;
    for (std::shared_ptr<obd::IEcu> const& ecu : session.proxy()->ecus()) {
        if (std::optional<std::string> const request = standardRequest(ecu->id(), session.proxy()->protocol())) {
            modules.push_back({*request, swappedReply(*request).value_or(std::string()), ecu->name(), {}, {}, {}});
        }
    }
    return modules;
}

void keep(ModuleStore const& store, std::string const& vin, std::vector<FoundModule> const& modules, bool quiet)
{
    if (!vin.empty()) {
        store.keep(vin, modules);
    } else if (!quiet) {
        tell("The vehicle tells no VIN, so the modules are not remembered\n");
    }
}

std::vector<FoundModule> foundModules(CommandSession& session, std::optional<std::vector<FoundModule>> known, bool anew,
                                      ModuleScan& finder)
{
    GlobalOptions const& options = session.options();
    if (session.proxy()->protocol() == obd::ObdProtocolIso14230) {
        if (!options.quiet) {
            tell("On this bus those that the connection has started; others would need a start of their own\n");
        }
        return modulesOfConnection(session);
    }
    if (anew || !known) {
        return scan(finder, options);
    }
    if (!options.quiet) {
        tell("These are remembered of this vehicle; --scan looks anew\n");
    }
    return std::move(*known);
}

ExitCode modules(ModulesOptions const& chosen, GlobalOptions const& options)
{
    CommandSession session(options);
    session.connect();
    std::string const vin = vehicleVin(*session.proxy());
    ModuleStore const store(ModuleStore::besides(session.settingsFile()));
    ModuleAsker asker(*session.proxy(), session.channel());
    bool const drawn = !options.quiet && PromptReader::canRedraw();
    ModuleScan finder(
        asker, [&session] { session.check(); },
        drawn ? std::function<void(ScanProgress const&)>(tellScan) : std::function<void(ScanProgress const&)>());
    ModuleIdentity identity(asker, [&session] { session.check(); });
    std::vector<FoundModule> found = foundModules(session, store.find(vin), chosen.scan, finder);
    for (FoundModule& each : found) {
        identity.identify(each);
        if (chosen.all) {
            identity.readIdentifiers(each);
        }
    }
    session.checkAdapter();
    keep(store, vin, found, options.quiet);
    if (options.json) {
        Json document = Json::array();
        for (FoundModule const& each : found) {
            document.push_back(toJsonValue(each));
        }
        fmt::print("{}", printed(document));
    } else {
        printText(modulesText(found, options));
    }
    flushOutput();
    if (found.empty()) {
        throw Error(ErrorKind::NotSupported, "No control module answered",
                    {"a gateway may keep them behind it", "is the ignition on?"});
    }
    return ExitCode::Done;
}

} // namespace

void addModulesCommand(CommandLine& commandLine)
{
    auto const chosen = std::make_shared<ModulesOptions>();
    CLI::App* const command = commandLine.addCommand(
        "modules", "List the control modules beyond OBD, looked for on CAN and remembered by VIN",
        [chosen](GlobalOptions const& options) { return modules(*chosen, options); });
    command->add_flag("--scan", chosen->scan, "Look for them anew: half a minute, with the vehicle standing");
    command->add_flag("--all", chosen->all, "Also all that ISO 14229 has identifiers for, F180 to F19F");
}

} // namespace velmora::cli
