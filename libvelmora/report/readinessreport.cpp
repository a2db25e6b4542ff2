#include "libvelmora/report/readinessreport.h"

#include <algorithm>

namespace velmora {

namespace {

int rank(ReadinessMonitor const& monitor)
{
    if (monitor.sinceCleared == ReadinessStatus::NotComplete) {
        return 0;
    }
    return monitor.sinceCleared == ReadinessStatus::NotAvailable ? 2 : 1;
}

} // namespace

char const* statusWord(ReadinessStatus status)
{
    static constexpr char const* words[] = {"complete", "not complete", "disabled this cycle", "not available"};
    return words[status];
}

std::vector<ReadinessMonitor> notCompleteFirst(std::vector<ReadinessMonitor> monitors)
{
    std::stable_sort(monitors.begin(), monitors.end(), [](ReadinessMonitor const& left, ReadinessMonitor const& right) {
        return rank(left) < rank(right);
    });
    return monitors;
}

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

Json toJsonValue(ReadinessReport const& report)
{
    Json monitors = Json::array();
    for (ReadinessMonitor const& monitor : notCompleteFirst(report.monitors)) {
        monitors.push_back({{"name", monitor.name},
                            {"sinceCleared", statusWord(monitor.sinceCleared)},
                            {"thisCycle", monitor.thisCycle ? Json(statusWord(*monitor.thisCycle)) : Json(nullptr)}});
    }
    return {{"answer", answerWord(report.answer)},
            {"lamp", valueOrNull(report.lamp)},
            {"ready", valueOrNull(isReady(report))},
            {"notComplete", isReady(report) ? Json(countNotComplete(report)) : Json(nullptr)},
            {"monitors", monitors}};
}

} // namespace velmora
