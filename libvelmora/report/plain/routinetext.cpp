#include "common/text/layout.h"
#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/texts/labels.h"
#include "libvelmora/report/texts/plaintexts.h"

#include <fmt/format.h>

namespace velmora {

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
        return labelledLine(texts::plain::routines, style.paint(Mark::Faint, answerWord(report.answer)));
    }
    std::string text;
    for (Routine const& routine : report.routines) {
        text += labelledLine(fmt::format(texts::plain::routine, routineId(routine.id)), routine.name);
        text += wrapped(routine.description, 72, "    ", style);
    }
    return text;
}

std::string toText(RoutineRun const& run, Style const& style)
{
    std::string const result = style.paint(mark(run.result), resultWord(run.result));
    return labelledLine(fmt::format(texts::plain::routine, routineId(run.routine.id)), run.routine.name) +
           labelledLine(texts::result, result + (run.reason.empty() ? "" : ": " + run.reason));
}

} // namespace velmora
