#include "program/view/layout.h"
#include "program/view/reporttext.h"

namespace velmora::cli {

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

} // namespace velmora::cli
