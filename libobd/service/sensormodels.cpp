#include "libobd/service/sensormodels.h"

#include <obd/parameteridentifier.h>

#include <algorithm>
#include <cmath>
#include <iterator>
#include <limits>

namespace obd {
namespace {

int truncated(double value)
{
    constexpr double limit = std::numeric_limits<int>::max();
    return static_cast<int>(std::clamp(value, -limit, limit));
}

} // namespace

bool isSelectable(int uid)
{
    static constexpr int alwaysShown[] = {Pid2Uid(0x05), Pid2Uid(0x0C), Pid2Uid(0x0D), Pid2Uid(0x0F)};
    return std::find(std::begin(alwaysShown), std::end(alwaysShown), uid) == std::end(alwaysShown);
}

std::shared_ptr<SensorValueDataModel> makeValueModel(std::shared_ptr<SensorValue> const& value)
{
    if (value == nullptr) {
        return nullptr;
    }
    auto const model = std::make_shared<SensorValueDataModel>(value->uid(), value->textualValue());
    model->number = value->number();
    return model;
}

std::shared_ptr<SensorDataModel> makeSensorModel(SensorDescriptor const& sensor, std::string const& name,
                                                 std::shared_ptr<SensorValue> const& value)
{
    return std::make_shared<SensorDataModel>(isSelectable(sensor.uid()), sensor.uid(), name, sensor.unit(),
                                             makeValueModel(value), nullptr);
}

std::shared_ptr<SensorDataModel> makeLiveModel(SensorDescriptor const& sensor, std::string const& name,
                                               std::shared_ptr<SensorValueDataModel> const& value)
{
    std::shared_ptr<SensorDataModel::Numeric> range;
    if (sensor.isNumeric()) {
        range = std::make_shared<SensorDataModel::Numeric>(displayRange(sensor.minValue(), sensor.maxValue()));
    }
    return std::make_shared<SensorDataModel>(isSelectable(sensor.uid()), sensor.uid(), name, sensor.unit(), value,
                                             range);
}

SensorDataModel::Numeric displayRange(double minimum, double maximum)
{
    int const low = truncated(minimum - 0.99);
    int const high = truncated(maximum + 0.99);
    if (std::fabs(minimum + maximum) >= 1.0) {
        return {low, high};
    }
    if (std::fabs(minimum) < std::fabs(maximum)) {
        return {-high, high};
    }
    return {low, -low};
}

std::shared_ptr<SensorValue> findValue(std::vector<std::shared_ptr<SensorValue>> const& values, int uid)
{
    auto const found = std::find_if(values.begin(), values.end(),
                                    [uid](auto const& value) { return value != nullptr && value->uid() == uid; });
    return found != values.end() ? *found : nullptr;
}

} // namespace obd
