#include "libvelmora/report/freezereport.h"

namespace velmora {

namespace {

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

void applyMaker(FreezeReport& report, MakerChoice const& maker)
{
    if (report.frame) {
        report.frame->code.maker = maker.holding();
    }
}

Json toJsonValue(FreezeReport const& report)
{
    return {{"frame", report.number},
            {"answered", hasAnswer(report)},
            {"answer", answerWord(report.answer)},
            {"freeze", report.frame ? toJsonValue(*report.frame) : Json(nullptr)}};
}

} // namespace velmora
