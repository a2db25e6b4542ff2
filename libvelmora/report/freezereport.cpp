#include "libvelmora/report/freezereport.h"

#include "program/view/layout.h"

namespace velmora {

namespace {

std::string toText(FreezeFrame const& frame, Style const& style)
{
    std::vector<std::vector<Cell>> rows;
    for (FreezeFrame::Reading const& reading : frame.readings) {
        std::string const unit = reading.value && !reading.unit.empty() ? " " + reading.unit : "";
        rows.push_back({{reading.name}, {reading.value.value_or("-") + unit}});
    }
    return toText(frame.code, "    ") + drawColumns(rows, "    ", style);
}

Json toJsonValue(FreezeFrame const& frame)
{
    Json readings = Json::array();
    for (FreezeFrame::Reading const& reading : frame.readings) {
        readings.push_back(
            {{"name", reading.name}, {"value", valueOrNull(reading.value)}, {"unit", textOrNull(reading.unit)}});
    }
    return {{"code", velmora::toJsonValue(frame.code)}, {"readings", readings}};
}

} // namespace

std::string toText(FreezeReport const& report, Style const& style)
{
    std::string const number = std::to_string(report.number);
    if (report.frame) {
        return labelledLine("Freeze frame", number) + toText(*report.frame, style);
    }
    return labelledLine("Freeze frame", number + (report.answered ? ": none stored" : ": no answer"));
}

Json toJsonValue(FreezeReport const& report)
{
    return {{"frame", report.number},
            {"answered", report.answered},
            {"freeze", report.frame ? toJsonValue(*report.frame) : Json(nullptr)}};
}

} // namespace velmora
