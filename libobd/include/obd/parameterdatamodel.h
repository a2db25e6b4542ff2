#pragma once

#include <obd/parameteridentifier.h>
#include <obd/sensordatamodel.h>

#include <memory>
#include <string>
#include <vector>

namespace obd {

/// A parameter with its sensors for the application; a copy that keeps nothing of the library alive.
struct ParameterDataModel
{
    ParameterDataModel(ParameterIdentifier::Id parameterId, std::string const& parameterName,
                       std::vector<std::shared_ptr<SensorDataModel>> const& parameterSensors)
        : id(parameterId), name(parameterName), sensors(parameterSensors)
    {}

    ParameterIdentifier::Id id;
    std::string name;
    std::vector<std::shared_ptr<SensorDataModel>> sensors;
};

} // namespace obd
