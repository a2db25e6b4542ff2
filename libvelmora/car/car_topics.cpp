// What a car tells, topic by topic, and what it can be made to do.

#include "libvelmora/car/carcore.h"
#include "libvelmora/car/carsensors.h"
#include "libvelmora/read/codeclearing.h"
#include "libvelmora/read/codereader.h"
#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/read/freezereader.h"
#include "libvelmora/read/makerreader.h"
#include "libvelmora/read/modulereader.h"
#include "libvelmora/read/routinereader.h"
#include "libvelmora/read/vehiclereader.h"
#include "libvelmora/text/text.h"

#include <obd/iecu.h>
#include <velmora/car.h>

#include <algorithm>

namespace velmora {

namespace {

std::vector<ModuleTopic<CodeReport>> readCodes(Session& session)
{
    CodeReader reader(session);
    auto modules = readModules(session, [&reader](Session&, obd::IEcu const& ecu) {
        return reader.read(ecu, {CodeKind::Confirmed, CodeKind::Pending, CodeKind::Permanent});
    });
    if (std::any_of(modules.begin(), modules.end(), [](auto const& module) { return hasMakersCodes(module.report); })) {
        MakerChoice const maker = readMaker(session, {});
        for (ModuleTopic<CodeReport>& module : modules) {
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
    return m_core->call(readCodes);
}

std::vector<ModuleTopic<FreezeReport>> Car::freezeFrame(unsigned char frame)
{
    return m_core->call([frame](Session& session) {
        return readModules(session,
                           [frame](Session& each, obd::IEcu const& ecu) { return readFreeze(each, ecu, frame); });
    });
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
    return m_core->call([](Session& session) { return readVehicle(session); });
}

std::vector<ModuleTopic<ClearReport>> Car::clearCodes()
{
    auto modules = m_core->call(velmora::clearCodes);
    requireCleared(modules);
    return modules;
}

std::vector<ModuleTopic<RoutinesReport>> Car::routines()
{
    return m_core->call([](Session& session) { return readModules(session, readRoutines); });
}

ModuleTopic<RoutineRun> Car::runRoutine(int id)
{
    auto const run = m_core->call([id](Session& session) {
        RoutineChoice const choice = findRoutine(session, id);
        return ModuleTopic<RoutineRun>{choice.ecu->id(), readable(choice.ecu->name()),
                                       velmora::runRoutine(session, *choice.ecu, choice.routine)};
    });
    requireAccepted(run.report);
    return run;
}

} // namespace velmora
