#include "common/text/layout.h"
#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/texts/labels.h"
#include "libvelmora/report/texts/plaintexts.h"

#include <fmt/format.h>

namespace velmora {

namespace {

Mark mark(ReadinessStatus status)
{
    static constexpr Mark marks[] = {Mark::Good, Mark::Warning, Mark::None, Mark::Faint};
    return marks[status];
}

std::string verdict(ReadinessReport const& report, Style const& style)
{
    if (report.answer != TopicAnswer::Read) {
        return style.paint(Mark::Faint, answerWord(report.answer));
    }
    std::optional<bool> const ready = isReady(report);
    if (!ready) {
        return texts::plain::noMonitors;
    }
    return *ready
               ? style.paint(Mark::Good, texts::plain::ready)
               : style.paint(Mark::Warning, fmt::format(texts::plain::notComplete,
                                                        counted(countNotComplete(report), texts::plain::monitorNoun)));
}

Cell cell(std::optional<ReadinessStatus> const& status)
{
    return status ? Cell{statusWord(*status), mark(*status)} : Cell{"-"};
}

std::string drawMonitors(std::vector<ReadinessMonitor> const& monitors, Style const& style)
{
    std::vector<std::vector<Cell>> rows = {{{texts::monitor}, {texts::plain::sinceCleared}, {texts::thisCycle}}};
    std::string missing;
    for (ReadinessMonitor const& monitor : monitors) {
        if (monitor.sinceCleared == ReadinessStatus::NotAvailable) {
            missing += (missing.empty() ? texts::plain::notAvailable : ", ") + monitor.name;
        } else {
            rows.push_back({{monitor.name}, cell(monitor.sinceCleared), cell(monitor.thisCycle)});
        }
    }
    return drawColumns(rows, "    ", style) + wrapped(missing, 76, "    ", style);
}

} // namespace

std::string toText(ReadinessReport const& report, Style const& style)
{
    std::string text = report.lamp ? labelledLine(texts::lampShort, lampText(report.lamp, style)) : std::string();
    text += labelledLine(texts::readiness, verdict(report, style));
    if (!isReady(report)) {
        return text;
    }
    return text + drawMonitors(notCompleteFirst(report.monitors), style);
}

} // namespace velmora
