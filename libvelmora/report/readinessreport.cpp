#include "libvelmora/report/readinessreport.h"

#include "libvelmora/report/codereport.h"
#include "program/view/layout.h"

#include <algorithm>

namespace velmora {

namespace {

struct StatusWord
{
    char const* text;
    Mark mark;
};

StatusWord const& word(ReadinessStatus status)
{
    static constexpr StatusWord words[] = {{"complete", Mark::Good},
                                           {"not complete", Mark::Warning},
                                           {"disabled this cycle", Mark::None},
                                           {"not available", Mark::Faint}};
    return words[status];
}

int rank(ReadinessMonitor const& monitor)
{
    if (monitor.sinceCleared == ReadinessStatus::NotComplete) {
        return 0;
    }
    return monitor.sinceCleared == ReadinessStatus::NotAvailable ? 2 : 1;
}

std::vector<ReadinessMonitor> ranked(std::vector<ReadinessMonitor> monitors)
{
    std::stable_sort(monitors.begin(), monitors.end(), [](ReadinessMonitor const& left, ReadinessMonitor const& right) {
        return rank(left) < rank(right);
    });
    return monitors;
}

std::string verdict(ReadinessReport const& report, Style const& style)
{
    if (report.answer != TopicAnswer::Read) {
        return style.paint(Mark::Faint, answerWord(report.answer));
    }
    std::optional<bool> const ready = isReady(report);
    if (!ready) {
        return "no monitors in this module";
    }
    return *ready ? style.paint(Mark::Good, "ready")
                  : style.paint(Mark::Warning, counted(countNotComplete(report), "monitor") + " not complete");
}

Cell cell(std::optional<ReadinessStatus> const& status)
{
    return status ? Cell{word(*status).text, word(*status).mark} : Cell{"-"};
}

std::string drawMonitors(std::vector<ReadinessMonitor> const& monitors, Style const& style)
{
    std::vector<std::vector<Cell>> rows = {{{"Monitor"}, {"Since cleared"}, {"This driving cycle"}}};
    std::string missing;
    for (ReadinessMonitor const& monitor : monitors) {
        if (monitor.sinceCleared == ReadinessStatus::NotAvailable) {
            missing += (missing.empty() ? "Not available: " : ", ") + monitor.name;
        } else {
            rows.push_back({{monitor.name}, cell(monitor.sinceCleared), cell(monitor.thisCycle)});
        }
    }
    return drawColumns(rows, "    ", style) + wrapped(missing, 76, "    ");
}

} // namespace

std::size_t countNotComplete(ReadinessReport const& report)
{
    return static_cast<std::size_t>(
        std::count_if(report.monitors.begin(), report.monitors.end(), [](ReadinessMonitor const& monitor) {
            return monitor.sinceCleared == ReadinessStatus::NotComplete;
        }));
}

std::optional<bool> isReady(ReadinessReport const& report)
{
    bool const any = std::any_of(report.monitors.begin(), report.monitors.end(), [](ReadinessMonitor const& monitor) {
        return monitor.sinceCleared != ReadinessStatus::NotAvailable;
    });
    return any ? std::optional(countNotComplete(report) == 0) : std::nullopt;
}

std::string toText(ReadinessReport const& report, Style const& style)
{
    std::string text = report.lamp ? labelledLine("Lamp", lampText(report.lamp, style)) : std::string();
    text += labelledLine("Readiness", verdict(report, style));
    if (!isReady(report)) {
        return text;
    }
    return text + drawMonitors(ranked(report.monitors), style);
}

Json toJsonValue(ReadinessReport const& report)
{
    Json monitors = Json::array();
    for (ReadinessMonitor const& monitor : ranked(report.monitors)) {
        monitors.push_back({{"name", monitor.name},
                            {"sinceCleared", word(monitor.sinceCleared).text},
                            {"thisCycle", monitor.thisCycle ? Json(word(*monitor.thisCycle).text) : Json(nullptr)}});
    }
    return {{"answer", answerWord(report.answer)},
            {"lamp", valueOrNull(report.lamp)},
            {"ready", valueOrNull(isReady(report))},
            {"notComplete", isReady(report) ? Json(countNotComplete(report)) : Json(nullptr)},
            {"monitors", monitors}};
}

} // namespace velmora
