#include "libvelmora/report/routinesreport.h"

namespace velmora {

namespace {

Json routineJson(Routine const& routine)
{
    return {{"id", routineId(routine.id)},
            {"name", textOrNull(routine.name)},
            {"description", textOrNull(routine.description)}};
}

} // namespace

std::string routineId(int id)
{
    return fmt::format("{:02X}", id);
}

char const* resultWord(RoutineRun::Result result)
{
    static constexpr char const* words[] = {"accepted", "refused", "no answer", "unreadable"};
    return words[static_cast<int>(result)];
}

Json toJsonValue(RoutinesReport const& report)
{
    Json routines = Json::array();
    for (Routine const& routine : report.routines) {
        routines.push_back(routineJson(routine));
    }
    return {{"answer", answerWord(report.answer)}, {"routines", routines}};
}

Json toJsonValue(RoutineRun const& run)
{
    return {
        {"routine", routineJson(run.routine)}, {"result", resultWord(run.result)}, {"reason", textOrNull(run.reason)}};
}

} // namespace velmora
