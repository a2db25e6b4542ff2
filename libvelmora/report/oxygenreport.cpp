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

std::string monitorText(OxygenReport const& report, Style const& style)
{
    if (report.answer != TopicAnswer::Read) {
        return style.paint(Mark::Faint, answerWord(report.answer));
    }
    if (!report.complete) {
        return {};
    }
    return *report.complete ? style.paint(Mark::Good, "complete")
                            : style.paint(Mark::Warning, "not complete, so results don't count yet");
}

std::string sensorList(OxygenReport const& report)
{
    std::string list;
    for (OxygenSensor const& sensor : report.sensors) {
        list += (list.empty() ? "" : ", ") + locationName(sensor.location);
    }
    return list;
}

std::string drawTests(std::vector<OxygenSensor> const& sensors, Style const& style)
{
    std::vector<std::vector<Cell>> rows = {limitTestHeads()};
    for (OxygenSensor const& sensor : sensors) {
        rows.push_back({{locationName(sensor.location) + (sensor.tests.empty() ? ": no tests" : "")}});
        for (LimitTest const& test : failedFirst(sensor.tests)) {
            rows.push_back(limitTestRow(test));
        }
    }
    return drawColumns(rows, "    ", style);
}

} // namespace

std::string locationName(obd::OxygenSensorLocation location)
{
    return fmt::format("Bank {} sensor {}", place(location).bank, place(location).sensor);
}

std::string toText(OxygenReport const& report, Style const& style)
{
    std::string text = labelledLine("Oxygen monitor", monitorText(report, style));
    if (report.answer != TopicAnswer::Read) {
        return text;
    }
    text += labelledLine("O2 sensors", sensorList(report));
    return text + (report.onCan ? labelledLine("O2 tests", "among those of the monitors (velmora monitors)")
                                : drawTests(report.sensors, style));
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
