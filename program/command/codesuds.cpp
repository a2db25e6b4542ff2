#include "program/command/codesuds.h"

#include "libvelmora/read/makerreader.h"
#include "libvelmora/report/codereport.h"
#include "libvelmora/report/json.h"
#include "libvelmora/report/troublecode.h"
#include "libvelmora/uds/failuretype.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/modulestore.h"
#include "libvelmora/uds/signalchoice.h"
#include "libvelmora/uds/udscodes.h"
#include "program/command/commandsession.h"
#include "program/terminal/output.h"
#include "program/view/layout.h"

#include <obd/troublecodecatalogue.h>
#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>

namespace velmora::cli {

namespace {

// A module that is asked, with its two identifiers.
struct AskedModule
{
    std::string request;
    std::string reply;
    std::string name;
    UdsCodeReport report;
};

std::vector<AskedModule> modulesOf(CommandSession& session)
{
    std::vector<AskedModule> modules;
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        if (std::optional<std::string> const request = standardRequest(ecu->id())) {
            modules.push_back({*request, identifierText(ecu->id()), ecu->name(), {}});
        }
    }
    if (session.options().ecu) {
        return modules;
    }
    ModuleStore const store(ModuleStore::besides(session.settingsFile()));
    for (FoundModule const& each : store.find(vehicleVin(*session.proxy())).value_or(std::vector<FoundModule>())) {
        bool const known = std::any_of(modules.begin(), modules.end(),
                                       [&each](AskedModule const& module) { return module.reply == each.reply; });
        if (!known) {
            modules.push_back({each.request, each.reply, each.name, {}});
        }
    }
    return modules;
}

// Texts are of codes that are written as the standard has it; a maker's own numbering means something else, as far as
// the standard does not settle the code's meaning.
std::string meaningOf(UdsCodeReport const& report, UdsCode const& code, MakerChoice const& maker)
{
    CodeReport all;
    all.lists.push_back({CodeKind::Confirmed,
                         CodeList::Answer::Read,
                         {},
                         groupByCode(obd::TroubleCodeCatalogue::getTroubleCodes(code.code()))});
    applyMaker(all, maker);
    bool const standard = isStandardFormat(report);
    if (all.lists.front().codes.empty() || (!standard && isMakersCode(code.code()))) {
        return {};
    }
    return meaningText(all.lists.front().codes.front());
}

std::string typeText(UdsCodeReport const& report, UdsCode const& code)
{
    return isStandardFormat(report) ? failureTypeText(code.failureType()) : std::string();
}

std::vector<Cell> row(UdsCodeReport const& report, UdsCode const& code, MakerChoice const& maker)
{
    std::string const meaning = meaningOf(report, code, maker);
    std::string const type = typeText(report, code);
    std::string const hex = isStandardFormat(report) ? std::string() : " (" + code.hex() + ")";
    std::string const states =
        fmt::format("{}", fmt::join(statusWords(code.status, report.available.value_or(0)), ", "));
    std::string const text = meaning + (meaning.empty() || type.empty() ? "" : "; ") + type;
    return {
        {fmt::format("{}-{:02X}{}", code.code(), code.failureType(), hex)}, {states.empty() ? "-" : states}, {text}};
}

std::string udsModuleText(AskedModule const& module, MakerChoice const& maker, GlobalOptions const& options)
{
    std::string text =
        fmt::format("Control module {}{}\n", module.reply, module.name.empty() ? "" : ": " + module.name);
    if (module.report.answer != TopicAnswer::Read) {
        return text + fmt::format("  service 19 {}\n", module.report.reason);
    }
    if (module.report.codes.empty()) {
        return text + "  no codes\n";
    }
    std::vector<std::vector<Cell>> rows;
    for (UdsCode const& code : module.report.codes) {
        rows.push_back(row(module.report, code, maker));
    }
    return text + drawColumns(rows, "  ", outputStyle(options));
}

Json codeJson(UdsCodeReport const& report, UdsCode const& code, MakerChoice const& maker)
{
    return {{"code", code.code()},
            {"type", fmt::format("{:02X}", code.failureType())},
            {"hex", code.hex()},
            {"status", fmt::format("{:02X}", code.status)},
            {"states", statusWords(code.status, report.available.value_or(0))},
            {"meaning", textOrNull(meaningOf(report, code, maker))},
            {"failure", textOrNull(typeText(report, code))}};
}

Json moduleJson(AskedModule const& module, MakerChoice const& maker)
{
    Json codes = nullptr;
    if (module.report.answer == TopicAnswer::Read) {
        codes = Json::array();
        for (UdsCode const& code : module.report.codes) {
            codes.push_back(codeJson(module.report, code, maker));
        }
    }
    UdsCodeReport const& report = module.report;
    return {{"module", module.reply},
            {"name", textOrNull(module.name)},
            {"reason", textOrNull(report.reason)},
            {"format", report.format ? Json(fmt::format("{:02X}", *report.format)) : Json(nullptr)},
            {"available", report.available ? Json(fmt::format("{:02X}", *report.available)) : Json(nullptr)},
            {"codes", codes}};
}

} // namespace

ExitCode udsCodes(std::string const& named, GlobalOptions const& options)
{
    CommandSession session(options);
    session.connect();
    if (!isCanBus(session.proxy()->protocol())) {
        throw Error(ErrorKind::NotSupported, "Service 19 is asked on CAN only",
                    {"`velmora codes` reads this vehicle's codes"});
    }
    std::vector<AskedModule> modules = modulesOf(session);
    ModuleAsker asker(*session.proxy(), session.channel());
    bool read = false;
    bool refused = false;
    for (AskedModule& module : modules) {
        AddressOrReason const reached = addressOf(module.request, module.reply, {}, session.proxy()->protocol());
        if (reached.address) {
            module.report = readUdsCodes(asker, *reached.address);
        }
        session.checkAdapter();
        read = read || module.report.answer == TopicAnswer::Read;
        refused = refused || module.report.answer == TopicAnswer::Refused;
    }
    MakerChoice const maker = readMaker(session, named);
    Json document = Json::array();
    for (AskedModule const& module : modules) {
        if (options.json) {
            document.push_back(moduleJson(module, maker));
        } else {
            fmt::print("{}", udsModuleText(module, maker, options));
        }
    }
    if (options.json) {
        fmt::print("{}", printed(document));
    }
    flushOutput();
    if (!read) {
        std::vector<std::string> const hints = {"`velmora codes` asks the way that every OBD vehicle knows"};
        if (refused) {
            throw Error(ErrorKind::NotSupported, "No control module tells its codes by service 19", hints);
        }
        throw silentVehicle(session, "No control module answered service 19", hints);
    }
    return ExitCode::Done;
}

} // namespace velmora::cli
