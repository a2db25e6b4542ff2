// What a car tells, topic by topic.

#include "common/text/text.h"
#include "libvelmora/car/carcore.h"
#include "libvelmora/car/carmodules.h"
#include "libvelmora/car/caroffers.h"
#include "libvelmora/car/carprobe.h"
#include "libvelmora/car/carsensors.h"
#include "libvelmora/read/codereader.h"
#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/read/freezereader.h"
#include "libvelmora/read/makerreader.h"
#include "libvelmora/read/modulereader.h"
#include "libvelmora/read/vehiclereader.h"

#include <obd/iecu.h>
#include <velmora/car.h>

#include <algorithm>

namespace velmora {

namespace {

// The vehicle identification number is asked for only where it matters.
std::vector<ModuleTopic<CodeReport>> readCodes(Session& session, std::vector<CodeKind> const& kinds,
                                               std::string const& named)
{
    CodeReader reader(session);
    auto modules =
        readModules(session, [&](Session& /*session*/, obd::IEcu const& ecu) { return reader.read(ecu, kinds); });
    bool const needed =
        std::any_of(modules.begin(), modules.end(), [](auto const& module) { return hasMakersCodes(module.report); });
    MakerChoice const maker = needed ? readMaker(session, named) : chooseMaker(named, {});
    for (ModuleTopic<CodeReport>& module : modules) {
        applyMaker(module.report, maker);
    }
    return modules;
}

// Whether the code of any frame means something else with each maker.
bool needsMaker(std::vector<ModuleTopic<FreezeReport>> const& modules)
{
    return std::any_of(modules.begin(), modules.end(), [](ModuleTopic<FreezeReport> const& module) {
        return module.report.frame && isMakersCode(module.report.frame->code.code);
    });
}

std::vector<ModuleTopic<FreezeReport>> readFrames(Session& session, unsigned char frame, std::string const& named)
{
    auto modules =
        readModules(session, [frame](Session& each, obd::IEcu const& ecu) { return readFreeze(each, ecu, frame); });
    if (needsMaker(modules)) {
        MakerChoice const maker = readMaker(session, named);
        for (ModuleTopic<FreezeReport>& module : modules) {
            applyMaker(module.report, maker);
        }
    }
    return modules;
}

bool anyRefused(std::vector<ModuleTopic<CodeReport>> const& modules)
{
    return std::any_of(modules.begin(), modules.end(), [](ModuleTopic<CodeReport> const& module) {
        return std::any_of(module.report.lists.begin(), module.report.lists.end(),
                           [](CodeList const& list) { return list.answer == CodeList::Answer::Refused; });
    });
}

void requireCodes(std::vector<ModuleTopic<CodeReport>> const& modules)
{
    if (std::any_of(modules.begin(), modules.end(), [](auto const& module) { return hasAnswer(module.report); })) {
        return;
    }
    if (anyRefused(modules)) {
        throw Error(ErrorKind::Refused, "The vehicle refused to report its trouble codes",
                    {"try again with the ignition on and the engine off"});
    }
    throw Error(ErrorKind::NotSupported, "No control module reported its trouble codes", {"is the ignition on?"});
}

} // namespace

std::vector<StoredCode> Car::codes()
{
    auto const modules = codeReports();
    requireCodes(modules);
    std::vector<StoredCode> codes;
    for (ModuleTopic<CodeReport> const& module : modules) {
        for (CodeList const& list : module.report.lists) {
            for (TroubleCode const& code : list.codes) {
                codes.push_back({module.id, list.kind, code});
            }
        }
    }
    return codes;
}

std::vector<ModuleTopic<CodeReport>> Car::codeReports()
{
    return codeReports({CodeKind::Confirmed, CodeKind::Pending, CodeKind::Permanent});
}

std::vector<ModuleTopic<CodeReport>> Car::codeReports(std::vector<CodeKind> const& kinds, std::string const& maker)
{
    return m_core->call([&](Session& session) { return readCodes(session, kinds, maker); });
}

std::vector<ModuleTopic<FreezeReport>> Car::freezeFrame(unsigned char frame)
{
    return freezeFrame(frame, {});
}

std::vector<ModuleTopic<FreezeReport>> Car::freezeFrame(unsigned char frame, std::string const& maker)
{
    return m_core->call([&](Session& session) { return readFrames(session, frame, maker); });
}

std::vector<ModuleTopic<ReadinessReport>> Car::readiness()
{
    return m_core->call([](Session& session) { return readModules(session, readReadiness); });
}

std::vector<ModuleTopic<MonitorsReport>> Car::monitors()
{
    return m_core->call([](Session& session) { return readModules(session, readMonitors); });
}

std::vector<ModuleTopic<OxygenReport>> Car::oxygen()
{
    return m_core->call([](Session& session) { return readModules(session, readOxygen); });
}

std::vector<ModuleTopic<CountersReport>> Car::counters()
{
    return m_core->call([](Session& session) { return readModules(session, readCounters); });
}

std::vector<ModuleTopic<InfoReport>> Car::info()
{
    return m_core->call([](Session& session) { return readModules(session, readInfo); });
}

std::vector<Module> Car::modules()
{
    return m_core->call([](Session& session) {
        std::vector<Module> modules;
        for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
            modules.push_back({ecu->id(), readable(ecu->name()), readable(ecu->description())});
        }
        return modules;
    });
}

std::vector<FoundModule> Car::findModules(ModuleSearch const& search)
{
    return m_core->call([&search](Session& session) { return velmora::findModules(session, search); });
}

std::vector<ModuleTopic<ModuleIdentifiers>> Car::identifiers()
{
    return m_core->call(readIdentifiers);
}

std::vector<UdsModuleReport> Car::udsCodes(std::string const& maker)
{
    return m_core->call([&maker](Session& session) { return readUdsReports(session, maker); });
}

ProbeReport Car::probe(ProbeRequest const& request, std::function<void(std::string const& at)> const& onResumed)
{
    return ProbeReport(m_core->call([&](Session& session) { return probeModule(session, request, onResumed); }));
}

std::vector<ModuleOffers> Car::offers(bool all)
{
    return m_core->call([all](Session& session) { return readOffers(session, all); });
}

std::vector<Sensor> Car::sensors()
{
    return m_core->call(sensorsOf);
}

AdapterReport Car::adapter()
{
    return m_core->call(readAdapter);
}

ProtocolReport Car::protocol()
{
    return m_core->call(readProtocol);
}

VehicleReport Car::report()
{
    return report({});
}

VehicleReport Car::report(std::string const& maker)
{
    return m_core->call([&maker](Session& session) { return readVehicle(session, maker); });
}

} // namespace velmora
