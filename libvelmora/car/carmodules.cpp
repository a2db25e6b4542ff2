#include "libvelmora/car/carmodules.h"

#include "common/text/text.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/moduleidentity.h"
#include "libvelmora/uds/modulescan.h"
#include "libvelmora/uds/modulestore.h"
#include "libvelmora/uds/vehiclevin.h"

#include <obd/iecu.h>

#include <fmt/format.h>

namespace velmora {

namespace {

std::vector<FoundModule> scanForModules(Session& session, ModuleAsker& asker)
{
    session.tellProgress("Listening for 3 s, then asking each identifier that nobody uses; it only reads. The vehicle "
                         "has to stand\n");
    auto const draw = session.options().onPhase;
    std::function<void(ScanProgress const&)> tell;
    if (draw) {
        tell = [&draw](ScanProgress const& progress) {
            draw(
                fmt::format("Asking each identifier: {} of {}, {} found", progress.done, progress.all, progress.found));
        };
    }
    std::vector<FoundModule> modules = ModuleScan(
                                           asker, [&session] { session.check(); }, tell)
                                           .find();
    if (draw) {
        draw({});
    }
    return modules;
}

// On legacy buses, modules beyond those that the connection has started each need a start of their own, which would
// end it.
std::vector<FoundModule> modulesOfConnection(Session& session)
{
    session.tellProgress("On this bus those that the connection has started; others would need a start of their own\n");
    std::vector<FoundModule> modules;
    for (std::shared_ptr<obd::IEcu> const& ecu : session.proxy()->ecus()) {
        if (std::optional<std::string> const request = standardRequest(ecu->id(), session.proxy()->protocol())) {
            modules.push_back({*request, swappedReply(*request).value_or(std::string()), ecu->name(), {}, {}, {}});
        }
    }
    return modules;
}

std::vector<FoundModule> knownModules(Session& session, std::optional<std::vector<FoundModule>> remembered, bool anew,
                                      ModuleAsker& asker)
{
    if (session.proxy()->protocol() == obd::ObdProtocolIso14230) {
        return modulesOfConnection(session);
    }
    if (anew || !remembered) {
        return scanForModules(session, asker);
    }
    session.tellProgress("These are remembered of this vehicle; --scan looks anew\n");
    return std::move(*remembered);
}

} // namespace

std::vector<FoundModule> findModules(Session& session, ModuleSearch const& search)
{
    std::string const vin = vehicleVin(*session.proxy());
    ModuleStore const store(ModuleStore::besides(session.settingsFile()));
    ModuleAsker asker(*session.proxy(), session.channel());
    ModuleIdentity identity(asker, [&session] { session.check(); });
    std::vector<FoundModule> found = knownModules(session, store.find(vin), search.anew, asker);
    for (FoundModule& each : found) {
        identity.identify(each);
        if (search.identifiers) {
            identity.readIdentifiers(each);
        }
    }
    session.checkAdapter();
    if (!vin.empty()) {
        store.keep(vin, found);
    } else {
        session.tellProgress("The vehicle tells no VIN, so the modules are not remembered\n");
    }
    return found;
}

std::vector<ModuleTopic<ModuleIdentifiers>> readIdentifiers(Session& session)
{
    std::vector<ModuleTopic<ModuleIdentifiers>> modules;
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        ModuleTopic<ModuleIdentifiers> told{ecu->id(), readable(ecu->name()), {}};
        if (std::optional<std::string> const request = standardRequest(ecu->id(), session.proxy()->protocol())) {
            ModuleAsker asker(*session.proxy(), session.channel());
            FoundModule found{*request, swappedReply(*request).value_or(std::string()), {}, {}, {}, {}};
            ModuleIdentity(asker, [&session] { session.check(); }).readIdentifiers(found);
            told.report = found.identifiers;
        }
        modules.push_back(std::move(told));
    }
    session.checkAdapter();
    return modules;
}

} // namespace velmora
