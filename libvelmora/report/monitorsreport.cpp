#include "libvelmora/report/monitorsreport.h"

#include <algorithm>

namespace velmora {

namespace {

bool hasFailed(OnBoardMonitor const& monitor)
{
    return std::any_of(monitor.tests.begin(), monitor.tests.end(),
                       [](LimitTest const& test) { return test.verdict == LimitTest::Verdict::Failed; });
}

} // namespace

std::vector<OnBoardMonitor> failedFirst(std::vector<OnBoardMonitor> monitors)
{
    for (OnBoardMonitor& monitor : monitors) {
        monitor.tests = failedFirst(std::move(monitor.tests));
    }
    std::stable_partition(monitors.begin(), monitors.end(), hasFailed);
    return monitors;
}

Json toJsonValue(MonitorsReport const& report)
{
    Json monitors = Json::array();
    for (OnBoardMonitor const& monitor : failedFirst(report.monitors)) {
        monitors.push_back({{"id", fmt::format("{:02X}", monitor.id)},
                            {"description", textOrNull(monitor.description)},
                            {"tests", toJsonValue(monitor.tests)}});
    }
    return {{"answer", answerWord(report.answer)}, {"monitors", monitors}};
}

} // namespace velmora
