#include "libobd/powertrain/quantity.h"

#include <cmath>

namespace obd {
namespace {

double inUnitOf(Quantity const& quantity, double metric, UnitSystem system)
{
    return system == UnitSystem::Imperial && quantity.toImperial != nullptr ? quantity.toImperial(metric) : metric;
}

} // namespace

double convert(Quantity const& quantity, double metric, UnitSystem system)
{
    double const value = inUnitOf(quantity, metric, system);
    return quantity.scale(system).form == NumberForm::Double ? value : std::trunc(value);
}

std::shared_ptr<SensorValue> makeValue(int uid, Quantity const& quantity, double converted, UnitSystem system)
{
    if (quantity.stateText != nullptr) {
        return std::make_shared<TextualSensorValue>(uid, quantity.stateText(static_cast<unsigned int>(converted)));
    }
    Scale const& scale = quantity.scale(system);
    switch (scale.form) {
    case NumberForm::Int:
        return ConcreateNumericSensorValue<int>::buildObject(uid, static_cast<int>(converted), scale.decimals);
    case NumberForm::Unsigned:
        return ConcreateNumericSensorValue<unsigned int>::buildObject(uid, static_cast<unsigned int>(converted),
                                                                      scale.decimals);
    case NumberForm::Digits:
        return std::make_shared<TextualSensorValue>(uid, std::to_string(static_cast<unsigned int>(converted)),
                                                    converted);
    case NumberForm::Double:
        break;
    }
    return ConcreateNumericSensorValue<double>::buildObject(uid, converted, scale.decimals);
}

std::shared_ptr<SensorInfo const> makeInfo(int uid, std::string const& name, Quantity const& quantity, double maximum)
{
    auto info = std::make_shared<SensorInfo>(uid, name, quantity.isNumeric());
    for (UnitSystem const system : {UnitSystem::Metric, UnitSystem::Imperial}) {
        info->add(system, quantity.scale(system).unit, inUnitOf(quantity, quantity.minimum, system),
                  inUnitOf(quantity, maximum, system));
    }
    return info;
}

} // namespace obd
