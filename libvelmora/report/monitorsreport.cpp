#include "libvelmora/report/monitorsreport.h"

#include <algorithm>

namespace velmora {

namespace {

using Verdict = LimitTest::Verdict;

bool hasFailed(OnBoardMonitor const& monitor)
{
    return std::any_of(monitor.tests.begin(), monitor.tests.end(),
                       [](LimitTest const& test) { return test.verdict == Verdict::Failed; });
}

std::vector<OnBoardMonitor> ranked(std::vector<OnBoardMonitor> monitors)
{
    for (OnBoardMonitor& monitor : monitors) {
        monitor.tests = failedFirst(std::move(monitor.tests));
    }
    std::stable_partition(monitors.begin(), monitors.end(), hasFailed);
    return monitors;
}

std::size_t count(MonitorsReport const& report, Verdict verdict)
{
    std::size_t sum = 0;
    for (OnBoardMonitor const& monitor : report.monitors) {
        sum += static_cast<std::size_t>(
            std::count_if(monitor.tests.begin(), monitor.tests.end(),
                          [verdict](LimitTest const& test) { return test.verdict == verdict; }));
    }
    return sum;
}

std::string summary(MonitorsReport const& report, Style const& style)
{
    if (report.answer != TopicAnswer::Read) {
        return style.paint(Mark::Faint, answerWord(report.answer));
    }
    std::size_t const failed = count(report, Verdict::Failed);
    std::size_t const without = count(report, Verdict::NoResult);
    std::string text = failed > 0 ? style.paint(Mark::Bad, fmt::format("{} failed", failed)) + ", " : "";
    text += fmt::format("{} passed", count(report, Verdict::Passed));
    return text + (without > 0 ? fmt::format(", {} without result", without) : "");
}

} // namespace

std::string toText(MonitorsReport const& report, Style const& style)
{
    std::string text = labelledLine("Monitor tests", summary(report, style));
    if (report.monitors.empty()) {
        return text;
    }
    std::vector<std::vector<Cell>> rows = {limitTestHeads()};
    for (OnBoardMonitor const& monitor : ranked(report.monitors)) {
        rows.push_back({{fmt::format("{:02X} {}", monitor.id, monitor.description)}});
        for (LimitTest const& test : monitor.tests) {
            rows.push_back(limitTestRow(test));
        }
    }
    return text + drawColumns(rows, "    ", style);
}

Json toJsonValue(MonitorsReport const& report)
{
    Json monitors = Json::array();
    for (OnBoardMonitor const& monitor : ranked(report.monitors)) {
        monitors.push_back({{"id", fmt::format("{:02X}", monitor.id)},
                            {"description", textOrNull(monitor.description)},
                            {"tests", toJsonValue(monitor.tests)}});
    }
    return {{"answer", answerWord(report.answer)}, {"monitors", monitors}};
}

} // namespace velmora
