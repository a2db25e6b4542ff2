#include "program/view/layout.h"
#include "program/view/reporttext.h"

namespace velmora::cli {

namespace {

Mark mark(RoutineRun::Result result)
{
    static constexpr Mark marks[] = {Mark::Good, Mark::Bad, Mark::Warning, Mark::Warning};
    return marks[static_cast<int>(result)];
}

} // namespace

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

std::string toText(RoutineRun const& run, Style const& style)
{
    std::string const result = style.paint(mark(run.result), resultWord(run.result));
    return labelledLine("Routine " + routineId(run.routine.id), run.routine.name) +
           labelledLine("Result", result + (run.reason.empty() ? "" : ": " + run.reason));
}

} // namespace velmora::cli
