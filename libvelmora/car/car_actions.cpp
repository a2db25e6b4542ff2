// What a car can be made to do.

#include "common/text/text.h"
#include "libvelmora/car/carcore.h"
#include "libvelmora/read/codeclearing.h"
#include "libvelmora/read/modulereader.h"
#include "libvelmora/read/routinereader.h"

#include <obd/iecu.h>
#include <obd/isensorservice.h>
#include <velmora/car.h>

namespace velmora {

namespace {

// So that a replay can serve live values.
void readEachSensor(Session& session)
{
    auto const service = obd::SensorServiceBuilder::createSensorService();
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        session.select(*ecu);
        for (obd::ParameterIdentifier::Id const id : service->getSupportedIds()) {
            service->fetchSensors(id);
            session.check();
        }
    }
    session.checkAdapter();
}

} // namespace

void Car::askSensors()
{
    m_core->call(readEachSensor);
}

std::vector<ModuleTopic<ClearReport>> Car::tryClearCodes()
{
    return m_core->call(velmora::clearCodes);
}

std::vector<ModuleTopic<ClearReport>> Car::clearCodes()
{
    auto modules = tryClearCodes();
    requireCleared(modules);
    return modules;
}

std::vector<ModuleTopic<RoutinesReport>> Car::routines()
{
    return m_core->call([](Session& session) { return readModules(session, readRoutines); });
}

ModuleTopic<Routine> Car::findRoutine(int id)
{
    return m_core->call([id](Session& session) {
        RoutineChoice const choice = velmora::findRoutine(session, id);
        return ModuleTopic<Routine>{choice.ecu->id(), readable(choice.ecu->name()), choice.routine};
    });
}

ModuleTopic<RoutineRun> Car::tryRoutine(int id)
{
    return m_core->call([id](Session& session) {
        RoutineChoice const choice = velmora::findRoutine(session, id);
        return ModuleTopic<RoutineRun>{choice.ecu->id(), readable(choice.ecu->name()),
                                       velmora::runRoutine(session, *choice.ecu, choice.routine)};
    });
}

ModuleTopic<RoutineRun> Car::runRoutine(int id)
{
    auto run = tryRoutine(id);
    requireAccepted(run.report);
    return run;
}

} // namespace velmora
