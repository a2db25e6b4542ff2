#pragma once

#include "tests/support/payload/payload.h"

#include <obd/sensorinfo.h>

#include <map>
#include <memory>
#include <string>

namespace support {

// What the values of a parameter have wrong against the sensors that it announces; empty if nothing.
inline std::string brokenValues(obd::PowertrainParameter& parameter, obd::IEcu const& ecu, obd::UnitSystem system)
{
    std::map<int, bool> numeric;
    for (auto const& info : parameter.sensorInfo(ecu)) {
        numeric[info->uid()] = info->isNumeric();
    }
    int last = -1;
    for (auto const& value : parameter.values(ecu, system)) {
        if (!numeric.contains(value->uid())) {
            return "a value of a sensor that was not announced";
        }
        if (value->uid() <= last) {
            return "values out of the order of their sensors";
        }
        last = value->uid();
        if ((std::dynamic_pointer_cast<obd::NumericSensorValue>(value) != nullptr) != numeric[value->uid()]) {
            return "a number where a text was announced, or the other way round";
        }
    }
    return {};
}

inline std::string brokenReading(obd::PowertrainParameter& parameter, obd::IEcu const& ecu)
{
    std::string const metric = brokenValues(parameter, ecu, obd::UnitSystem::Metric);
    return metric.empty() ? brokenValues(parameter, ecu, obd::UnitSystem::Imperial) : metric;
}

// Any payload is either refused, changing nothing, or read into values of the sensors that the parameter announces.
// Says what a parameter does wrong with this one; empty if nothing.
inline std::string brokenBy(obd::PowertrainParameter& parameter, std::shared_ptr<obd::IEcu> const& ecu,
                            Bytes const& payload)
{
    std::string const before = texts(parameter, *ecu, obd::UnitSystem::Imperial);
    bool const accepted = reply(parameter, ecu, payload);
    std::string const after = texts(parameter, *ecu, obd::UnitSystem::Imperial);
    if (!accepted && after != before) {
        return "a refused reply changed the reading";
    }
    if (accepted && payload.empty()) {
        return "an empty reply was accepted";
    }
    if (reply(parameter, ecu, payload) != accepted || texts(parameter, *ecu, obd::UnitSystem::Imperial) != after) {
        return "the same reply read differently the second time";
    }
    return brokenReading(parameter, *ecu);
}

} // namespace support
