#include "libvelmora/read/routinereader.h"

#include <obd/iroutineservice.h>
#include <obd/nack.h>

#include <cctype>

namespace velmora {

namespace {

// The legacy buses refuse without a code; the library then gives the text of code 0, which is no reason.
std::string reason(std::string text)
{
    if (text.empty() || text == obd::NackToString(obd::NackAcknowledged)) {
        return {};
    }
    text.front() = static_cast<char>(std::tolower(static_cast<unsigned char>(text.front())));
    return text;
}

RoutineRun::Result toResult(int status)
{
    switch (status) {
    case obd::TestRoutineDataModel::Accepted:
        return RoutineRun::Result::Accepted;
    case obd::TestRoutineDataModel::Refused:
        return RoutineRun::Result::Refused;
    default:
        return RoutineRun::Result::NoAnswer;
    }
}

} // namespace

RoutinesReport readRoutines(Session& session, obd::IEcu const& ecu)
{
    session.select(ecu);
    RoutinesReport report;
    for (auto const& routine : obd::RoutineServiceBuilder::createRoutineService()->getRoutines()) {
        report.answer = TopicAnswer::Read;
        report.routines.push_back({routine->id, routine->name, routine->description});
    }
    return report;
}

RoutineRun runRoutine(Session& session, obd::IEcu const& ecu, Routine const& routine)
{
    session.select(ecu);
    auto const outcome =
        obd::RoutineServiceBuilder::createRoutineService()->runRoutine(static_cast<unsigned char>(routine.id));
    session.check();
    if (outcome == nullptr) {
        return {routine, RoutineRun::Result::NoAnswer, {}};
    }
    return {routine, toResult(outcome->status), reason(outcome->message)};
}

} // namespace velmora
