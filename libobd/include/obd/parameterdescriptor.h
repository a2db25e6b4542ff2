#pragma once

#include <obd/export.h>
#include <obd/parameteridentifier.h>
#include <obd/sensordescriptor.h>
#include <obd/unitsystem.h>

#include <memory>
#include <string>
#include <vector>

namespace obd {

class IEcu;
class PowertrainParameter;

/// A parameter as one control module offers it, in one unit system. A cheap handle, made on demand; keeps parameter and
/// control module alive. Looks at names, units and ranges only, never at readings.
class OBD_EXPORT ParameterDescriptor
{
public:
    /// Neither pointer may be null.
    ParameterDescriptor(std::shared_ptr<PowertrainParameter> parameter, std::shared_ptr<IEcu> ecu, UnitSystem system);

    ParameterIdentifier::Id pid() const;
    std::string description() const;
    /// One for each sensor of the parameter, in its order.
    std::vector<std::shared_ptr<SensorDescriptor>> sensors() const;
    bool hasNumericSensors() const;

private:
    std::shared_ptr<PowertrainParameter> m_parameter;
    std::shared_ptr<IEcu> m_ecu;
    UnitSystem m_system;
};

} // namespace obd
