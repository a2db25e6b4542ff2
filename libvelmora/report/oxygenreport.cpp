#include "libvelmora/report/oxygenreport.h"

#include <fmt/format.h>

namespace velmora {

namespace {

struct Place
{
    int bank;
    int sensor;
};

Place const& place(obd::OxygenSensorLocation location)
{
    static constexpr Place places[] = {{1, 1}, {1, 2}, {1, 3}, {1, 4}, {2, 1}, {2, 2},
                                       {2, 3}, {2, 4}, {3, 1}, {3, 2}, {4, 1}, {4, 2}};
    return places[static_cast<int>(location)];
}

} // namespace

std::string locationName(obd::OxygenSensorLocation location)
{
    return fmt::format("Bank {} sensor {}", place(location).bank, place(location).sensor);
}

Json toJsonValue(OxygenReport const& report)
{
    Json sensors = Json::array();
    for (OxygenSensor const& sensor : report.sensors) {
        sensors.push_back({{"bank", place(sensor.location).bank},
                           {"sensor", place(sensor.location).sensor},
                           {"tests", report.onCan ? Json(nullptr) : toJsonValue(failedFirst(sensor.tests))}});
    }
    return {{"answer", answerWord(report.answer)}, {"complete", valueOrNull(report.complete)}, {"sensors", sensors}};
}

} // namespace velmora
