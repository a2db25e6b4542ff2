#include "program/command/codesuds.h"

#include "common/text/layout.h"
#include "libvelmora/read/makerreader.h"
#include "libvelmora/report/codereport.h"
#include "libvelmora/report/troublecode.h"
#include "libvelmora/uds/failuretype.h"
#include "libvelmora/uds/kwpcodes.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/modulestore.h"
#include "libvelmora/uds/vehiclevin.h"
#include "program/command/commandsession.h"
#include "program/terminal/output.h"
#include "program/view/json.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <obd/protocolfamily.h>
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
    CodesByService codes;
};

std::vector<AskedModule> modulesOf(CommandSession& session)
{
    std::vector<AskedModule> modules;
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        if (std::optional<std::string> const request = standardRequest(ecu->id(), session.proxy()->protocol())) {
            modules.push_back({*request, swappedReply(*request).value_or(identifierText(ecu->id())), ecu->name(), {}});
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

// Texts are of codes that are written as the standard has it; a maker's own numbering means something else, as far
// as the standard does not settle the code's meaning.
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
    bool const told = (report.available.value_or(0) & mattersMask) != 0;
    std::string const text = meaning + (meaning.empty() || type.empty() ? "" : "; ") + type;
    return {{fmt::format("{}-{:02X}{}", code.code(), code.failureType(), hex)},
            {!states.empty() ? states
             : told          ? "-"
                             : "not told"},
            {text}};
}

// Numbers and states as the module writes them: neither is settled by ISO 14230-3.
std::string kwpText(KwpCodeReport const& report, GlobalOptions const& options)
{
    if (report.answer != TopicAnswer::Read) {
        return fmt::format("  service 18 {}\n", report.reason);
    }
    std::vector<std::vector<Cell>> rows;
    for (KwpCode const& code : report.codes) {
        rows.push_back({{code.hex()}, {fmt::format("status {:02X}", code.status)}});
    }
    return rows.empty() ? "  no codes\n"
                        : "  by service 18, in numbers that may be the maker's own:\n" +
                              drawColumns(rows, "  ", outputStyle(options));
}

std::string udsModuleText(AskedModule const& module, MakerChoice const& maker, GlobalOptions const& options)
{
    std::string text =
        fmt::format("Control module {}{}\n", shownModule(module.reply), module.name.empty() ? "" : ": " + module.name);
    if (module.codes.kwp) {
        return text + kwpText(*module.codes.kwp, options);
    }
    UdsCodeReport const& report = module.codes.uds;
    if (report.answer != TopicAnswer::Read) {
        return text + fmt::format("  service 19 {}\n", report.reason);
    }
    if (report.codes.empty()) {
        return text + "  no codes\n";
    }
    std::vector<std::vector<Cell>> rows;
    for (UdsCode const& code : report.codes) {
        rows.push_back(row(report, code, maker));
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

Json kwpJson(KwpCodeReport const& report)
{
    Json codes = Json::array();
    for (KwpCode const& code : report.codes) {
        codes.push_back({{"hex", code.hex()}, {"status", fmt::format("{:02X}", code.status)}});
    }
    return codes;
}

Json moduleJson(AskedModule const& module, MakerChoice const& maker)
{
    UdsCodeReport const& report = module.codes.uds;
    std::optional<KwpCodeReport> const& kwp = module.codes.kwp;
    Json codes = nullptr;
    if (!kwp && report.answer == TopicAnswer::Read) {
        codes = Json::array();
        for (UdsCode const& code : report.codes) {
            codes.push_back(codeJson(report, code, maker));
        }
    }
    Json json = {{"module", shownModule(module.reply)},
                 {"name", textOrNull(module.name)},
                 {"reason", textOrNull(kwp ? kwp->reason : report.reason)},
                 {"format", report.format ? Json(fmt::format("{:02X}", *report.format)) : Json(nullptr)},
                 {"available", report.available ? Json(fmt::format("{:02X}", *report.available)) : Json(nullptr)},
                 {"codes", codes}};
    if (kwp && kwp->answer == TopicAnswer::Read) {
        json["byService18"] = kwpJson(*kwp);
    }
    return json;
}

void printUdsCodes(std::vector<AskedModule> const& modules, MakerChoice const& maker, GlobalOptions const& options)
{
    Json document = Json::array();
    for (AskedModule const& module : modules) {
        if (options.json) {
            document.push_back(moduleJson(module, maker));
        } else {
            printText(udsModuleText(module, maker, options));
        }
    }
    if (options.json) {
        fmt::print("{}", printed(document));
    }
    flushOutput();
}

void requireCodes(CommandSession& session, std::vector<AskedModule> const& modules)
{
    auto const any = [&modules](TopicAnswer answer) {
        return std::any_of(modules.begin(), modules.end(),
                           [answer](AskedModule const& module) { return module.codes.answer() == answer; });
    };
    if (any(TopicAnswer::Read)) {
        return;
    }
    std::vector<std::string> const hints = {"`velmora codes` asks the way that every OBD vehicle knows"};
    if (any(TopicAnswer::Refused)) {
        throw Error(ErrorKind::NotSupported, "No control module tells its codes by service 19 or 18", hints);
    }
    throw silentVehicle(session, "No control module answered service 19 or 18", hints);
}

} // namespace

ExitCode udsCodes(std::string const& named, GlobalOptions const& options)
{
    CommandSession session(options);
    session.connect();
    obd::ObdProtocol const protocol = session.proxy()->protocol();
    if (!obd::isCan(protocol) && protocol != obd::ObdProtocolIso14230) {
        throw Error(ErrorKind::NotSupported, "Services 19 and 18 are asked on CAN and ISO 14230 only",
                    {"`velmora codes` reads this vehicle's codes"});
    }
    std::vector<AskedModule> modules = modulesOf(session);
    ModuleAsker asker(*session.proxy(), session.channel());
    for (AskedModule& module : modules) {
        AddressOrReason const reached = addressOf(module.request, module.reply, {}, protocol);
        if (reached.address) {
            module.codes = readModuleCodes(asker, *reached.address);
        }
        session.checkAdapter();
    }
    printUdsCodes(modules, readMaker(session, named), options);
    requireCodes(session, modules);
    return ExitCode::Done;
}

} // namespace velmora::cli
