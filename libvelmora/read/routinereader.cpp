#include "libvelmora/read/routinereader.h"

#include "libvelmora/read/topicanswer.h"

#include <obd/iroutineservice.h>
#include <velmora/error.h>

#include <fmt/format.h>

namespace velmora {

namespace {

RoutineRun::Result toResult(obd::Verdict const& verdict)
{
    switch (verdict.kind) {
    case obd::OutcomeKind::Answered:
        return RoutineRun::Result::Accepted;
    case obd::OutcomeKind::Refused:
    case obd::OutcomeKind::NotOffered: // it refused what it said it has
        return RoutineRun::Result::Refused;
    case obd::OutcomeKind::Unreadable:
        return RoutineRun::Result::Unreadable;
    default:
        return RoutineRun::Result::NoAnswer;
    }
}

} // namespace

RoutinesReport readRoutines(Session& session, obd::IEcu const& ecu)
{
    session.select(ecu);
    auto const outcome = obd::RoutineServiceBuilder::createRoutineService()->askRoutines();
    RoutinesReport report;
    // A module whose routines are all unknown offers none that can be run.
    report.answer = outcome.kind == obd::OutcomeKind::NothingStored ? TopicAnswer::NotOffered : toAnswer(outcome);
    for (auto const& routine : outcome.value) {
        report.routines.push_back({routine->id, routine->name, routine->description});
    }
    return report;
}

RoutineChoice findRoutine(Session& session, int id)
{
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        for (Routine const& routine : readRoutines(session, *ecu).routines) {
            if (routine.id == id) {
                return {ecu, routine};
            }
        }
    }
    throw Error(ErrorKind::NotSupported, fmt::format("No control module offers a known routine {}", routineId(id)),
                {"`velmora routines` lists those that can be run"});
}

RoutineRun runRoutine(Session& session, obd::IEcu const& ecu, Routine const& routine)
{
    session.select(ecu);
    auto const outcome =
        obd::RoutineServiceBuilder::createRoutineService()->askRoutine(static_cast<unsigned char>(routine.id));
    session.checkAdapter();
    return {routine, toResult(outcome), refusalText(outcome.code)};
}

void requireAccepted(RoutineRun const& run)
{
    std::string const id = routineId(run.routine.id);
    switch (run.result) {
    case RoutineRun::Result::Accepted:
        return;
    case RoutineRun::Result::Refused:
        throw Error(
            ErrorKind::Refused,
            fmt::format("The vehicle refused to run routine {}{}{}", id, run.reason.empty() ? "" : ": ", run.reason),
            {"the vehicle decides when a routine may run; its maker's documents state the conditions"});
    case RoutineRun::Result::Unreadable:
        throw Error(ErrorKind::VehicleSilent, fmt::format("What the vehicle said to routine {} can't be read", id),
                    {"it may run all the same"});
    case RoutineRun::Result::NoAnswer:
        break;
    }
    throw Error(ErrorKind::VehicleSilent, fmt::format("The vehicle did not say whether it runs routine {}", id),
                {"is the ignition still on?", "it may run all the same"});
}

} // namespace velmora
