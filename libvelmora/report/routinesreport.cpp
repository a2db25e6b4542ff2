#include "libvelmora/report/routinesreport.h"

#include "program/view/layout.h"

namespace velmora {

namespace {

struct ResultWord
{
    char const* text;
    Mark mark;
};

ResultWord const& word(RoutineRun::Result result)
{
    static constexpr ResultWord words[] = {
        {"accepted", Mark::Good}, {"refused", Mark::Bad}, {"no answer", Mark::Warning}};
    return words[static_cast<int>(result)];
}

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

std::string toText(RoutinesReport const& report, Style const& style)
{
    if (report.answer != TopicAnswer::Read) {
        return labelledLine("Routines", style.paint(Mark::Faint, answerWord(report.answer)));
    }
    std::string text;
    for (Routine const& routine : report.routines) {
        text += labelledLine("Routine " + routineId(routine.id), routine.name);
        text += wrapped(routine.description, 72, "    ");
    }
    return text;
}

Json toJsonValue(RoutinesReport const& report)
{
    Json routines = Json::array();
    for (Routine const& routine : report.routines) {
        routines.push_back(routineJson(routine));
    }
    return {{"answer", answerWord(report.answer)}, {"routines", routines}};
}

std::string toText(RoutineRun const& run, Style const& style)
{
    std::string const result = style.paint(word(run.result).mark, word(run.result).text);
    return labelledLine("Routine " + routineId(run.routine.id), run.routine.name) +
           labelledLine("Result", result + (run.reason.empty() ? "" : ": " + run.reason));
}

Json toJsonValue(RoutineRun const& run)
{
    return {
        {"routine", routineJson(run.routine)}, {"result", word(run.result).text}, {"reason", textOrNull(run.reason)}};
}

} // namespace velmora
