#include "libvelmora/report/countersreport.h"

#include "program/view/layout.h"

namespace velmora {

std::string toText(CountersReport const& report, Style const& style)
{
    if (report.answer != TopicAnswer::Read) {
        return labelledLine("Counters", style.paint(Mark::Faint, answerWord(report.answer)));
    }
    if (report.counters.empty()) {
        return labelledLine("Counters", "all are 0");
    }
    std::vector<std::vector<Cell>> rows;
    for (CountersReport::Counter const& counter : report.counters) {
        rows.push_back({{counter.name}, {std::to_string(counter.value), Mark::None, true}});
    }
    return labelledLine("Counters", counted(rows.size(), "counter") + " above 0") + drawColumns(rows, "    ", style);
}

Json toJsonValue(CountersReport const& report)
{
    Json counters = Json::array();
    for (CountersReport::Counter const& counter : report.counters) {
        counters.push_back({{"name", counter.name}, {"value", counter.value}});
    }
    return {{"answer", answerWord(report.answer)}, {"counters", counters}};
}

} // namespace velmora
