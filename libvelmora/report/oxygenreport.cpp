#include "libvelmora/report/oxygenreport.h"

#include "libvelmora/report/texts/labels.h"

#include <fmt/format.h>

namespace velmora {

std::pair<int, int> placeOf(obd::OxygenSensorLocation location)
{
    static constexpr std::pair<int, int> places[] = {{1, 1}, {1, 2}, {1, 3}, {1, 4}, {2, 1}, {2, 2},
                                                     {2, 3}, {2, 4}, {3, 1}, {3, 2}, {4, 1}, {4, 2}};
    return places[static_cast<int>(location)];
}

std::string locationName(obd::OxygenSensorLocation location)
{
    return fmt::format(texts::bankSensor, placeOf(location).first, placeOf(location).second);
}

Json toJsonValue(OxygenReport const& report)
{
    Json sensors = Json::array();
    for (OxygenSensor const& sensor : report.sensors) {
        sensors.push_back({{"bank", placeOf(sensor.location).first},
                           {"sensor", placeOf(sensor.location).second},
                           {"tests", report.onCan ? Json(nullptr) : toJsonValue(failedFirst(sensor.tests))}});
    }
    return {{"answer", answerWord(report.answer)}, {"complete", valueOrNull(report.complete)}, {"sensors", sensors}};
}

} // namespace velmora
