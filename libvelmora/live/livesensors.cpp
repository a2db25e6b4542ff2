#include "libvelmora/live/livesensors.h"

#include "libvelmora/read/sensornames.h"
#include "libvelmora/report/unitlabel.h"

#include <obd/parameteridentifier.h>

#include <fmt/format.h>

namespace velmora {

namespace {

std::string metricLabel(obd::ParameterDescriptor const& metric, int uid, std::string const& otherwise)
{
    for (auto const& sensor : metric.sensors()) {
        if (sensor->uid() == uid) {
            return unitLabel(uid, sensor->unit());
        }
    }
    return otherwise;
}

} // namespace

LiveParameter liveSensors(obd::ParameterDescriptor const& descriptor, obd::ParameterDescriptor const& metric,
                          unsigned int module, std::optional<double> hertz, Units units)
{
    LiveParameter result;
    auto const sensors = descriptor.sensors();
    bool const alone = sensors.size() == 1;
    for (auto const& each : sensors) {
        LiveSensor sensor;
        sensor.module = module;
        sensor.id = descriptor.pid();
        sensor.uid = each->uid();
        std::string const key = sensorKey(obd::Uid2Pid(sensor.uid));
        sensor.key = alone ? key : fmt::format("{}_{}", key, sensor.uid % 10 + 1);
        sensor.name = alone ? descriptor.description() : descriptor.description() + ": " + each->description();
        sensor.unit = labelInUnits(unitLabel(sensor.uid, each->unit()), each->unit(), units);
        sensor.metricUnit = metricLabel(metric, sensor.uid, sensor.unit);
        // What has a unit is a number, though the library gives some, such as distances, as plain digits.
        sensor.numeric = each->isNumeric() || !sensor.unit.empty();
        sensor.hertz = hertz;
        result.push_back(std::move(sensor));
    }
    return result;
}

LiveParameter liveSensors(SignalRow const& signal)
{
    LiveSensor sensor;
    sensor.module = signal.module;
    sensor.id = signal.id;
    sensor.uid = obd::Pid2Uid(signal.id);
    sensor.isSignal = true;
    sensor.key = signal.sensor;
    sensor.request = signal.request;
    sensor.name = signal.name;
    sensor.unit = sensor.metricUnit = signal.unit;
    sensor.numeric = signal.numeric;
    sensor.hertz = signal.hertz;
    return {sensor};
}

} // namespace velmora
