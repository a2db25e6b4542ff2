#include "libvelmora/car/carmodules.h"
#include "libvelmora/read/makerreader.h"
#include "libvelmora/report/codereport.h"
#include "libvelmora/uds/failuretype.h"
#include "libvelmora/uds/kwpcodes.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/modulestore.h"
#include "libvelmora/uds/vehiclevin.h"

#include <obd/iecu.h>
#include <obd/protocolfamily.h>
#include <obd/troublecodecatalogue.h>
#include <velmora/error.h>

#include <algorithm>

namespace velmora {

namespace {

// A module that is asked, with its two identifiers.
struct AskedModule
{
    std::string request;
    std::string reply;
    std::string name;
    CodesByService codes;
};

std::vector<AskedModule> modulesToAsk(Session& session)
{
    std::vector<AskedModule> modules;
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        if (std::optional<std::string> const request = standardRequest(ecu->id(), session.proxy()->protocol())) {
            modules.push_back({*request, swappedReply(*request).value_or(identifierText(ecu->id())), ecu->name(), {}});
        }
    }
    if (session.options().module) {
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
std::string meaningOf(std::string const& code, bool standard, MakerChoice const& maker)
{
    CodeReport all;
    all.lists.push_back({CodeKind::Confirmed,
                         CodeList::Answer::Read,
                         {},
                         groupByCode(obd::TroubleCodeCatalogue::getTroubleCodes(code))});
    applyMaker(all, maker);
    if (all.lists.front().codes.empty() || (!standard && isMakersCode(code))) {
        return {};
    }
    return meaningText(all.lists.front().codes.front());
}

void addUdsCodes(UdsModuleReport& report, UdsCodeReport const& told, MakerChoice const& maker)
{
    report.standard = isStandardFormat(told);
    for (UdsCode const& code : told.codes) {
        report.codes.push_back({code.code(), code.failureType(), code.hex(), code.status,
                                statusWords(code.status, told.available.value_or(0)),
                                meaningOf(code.code(), report.standard, maker),
                                report.standard ? failureTypeText(code.failureType()) : std::string()});
    }
}

UdsModuleReport toReport(AskedModule const& module, MakerChoice const& maker)
{
    UdsCodeReport const& uds = module.codes.uds;
    UdsModuleReport report{shownModule(module.reply), module.name, module.codes.answer(), uds.reason};
    report.format = uds.format;
    report.available = uds.available;
    if (module.codes.kwp) {
        report.byService18 = true;
        report.reason = module.codes.kwp->reason;
        for (KwpCode const& code : module.codes.kwp->codes) {
            report.codes.push_back({{}, 0, code.hex(), code.status, {}});
        }
    } else {
        addUdsCodes(report, uds, maker);
    }
    return report;
}

} // namespace

std::vector<UdsModuleReport> readUdsReports(Session& session, std::string const& named)
{
    obd::ObdProtocol const protocol = session.proxy()->protocol();
    if (!obd::isCan(protocol) && protocol != obd::ObdProtocolIso14230) {
        throw Error(ErrorKind::NotSupported, "Services 19 and 18 are asked on CAN and ISO 14230 only",
                    {"`velmora codes` reads this vehicle's codes"});
    }
    std::vector<AskedModule> modules = modulesToAsk(session);
    ModuleAsker asker(*session.proxy(), session.channel());
    for (AskedModule& module : modules) {
        AddressOrReason const reached = addressOf(module.request, module.reply, {}, protocol);
        if (reached.address) {
            module.codes = readModuleCodes(asker, *reached.address);
        }
        session.checkAdapter();
    }
    MakerChoice const maker = readMaker(session, named);
    std::vector<UdsModuleReport> reports;
    for (AskedModule const& module : modules) {
        reports.push_back(toReport(module, maker));
    }
    return reports;
}

} // namespace velmora
