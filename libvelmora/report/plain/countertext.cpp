#include "common/text/layout.h"
#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/texts/plaintexts.h"

#include <fmt/format.h>

namespace velmora {

std::string toText(CountersReport const& report, Style const& style)
{
    if (report.answer != TopicAnswer::Read) {
        return labelledLine(texts::plain::counters, style.paint(Mark::Faint, answerWord(report.answer)));
    }
    if (report.counters.empty()) {
        return labelledLine(texts::plain::counters, texts::plain::allZero);
    }
    std::vector<std::vector<Cell>> rows;
    for (CountersReport::Counter const& counter : report.counters) {
        rows.push_back({{counter.name}, {std::to_string(counter.value), Mark::None, true}});
    }
    return labelledLine(texts::plain::counters,
                        fmt::format(texts::plain::aboveZero, counted(rows.size(), texts::plain::counterNoun))) +
           drawColumns(rows, "    ", style);
}

} // namespace velmora
