#include "common/text/layout.h"
#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/texts/labels.h"

namespace velmora {

namespace {

std::string frameText(FreezeFrame const& frame, Style const& style)
{
    std::vector<std::vector<Cell>> rows;
    for (FreezeFrame::Reading const& reading : frame.readings) {
        std::string const unit = reading.value && !reading.unit.empty() ? " " + reading.unit : "";
        rows.push_back({{reading.name}, {reading.value.value_or("-") + unit}});
    }
    return toText(frame.code, "    ", style.isDetailed()) + drawColumns(rows, "    ", style);
}

} // namespace

std::string toText(FreezeReport const& report, Style const& style)
{
    std::string const number = std::to_string(report.number);
    if (report.frame) {
        return labelledLine(texts::freezeFrame, number) + frameText(*report.frame, style);
    }
    return labelledLine(texts::freezeFrame,
                        number + ": " + (hasAnswer(report) ? texts::noneStored : answerWord(report.answer)));
}

} // namespace velmora
