#pragma once

#include <obd/export.h>
#include <obd/parameteridentifier.h>
#include <obd/sensorinfo.h>
#include <obd/unitsystem.h>

#include <memory>
#include <string>
#include <vector>

namespace obd {

class IEcu;
class PowertrainParameter;

/// A sensor seen in one unit system. A cheap handle, made on demand; keeps the info alive.
class OBD_EXPORT SensorDescriptor
{
public:
    /// info must not be null.
    SensorDescriptor(std::shared_ptr<SensorInfo const> info, UnitSystem system);

    std::string description() const { return m_info->description(); } ///< the sensor's name
    bool isNumeric() const { return m_info->isNumeric(); }            ///< false if the readings are texts
    int uid() const { return m_info->uid(); }                         ///< as in SensorInfo
    MeasurementUnit unit() const { return m_info->unit(m_system); }   ///< in the unit system of the settings
    double minValue() const { return m_info->minValue(m_system); }    ///< of the range for display
    double maxValue() const { return m_info->maxValue(m_system); }    ///< of the range for display

private:
    std::shared_ptr<SensorInfo const> m_info;
    UnitSystem m_system;
};

/// A parameter as one control module offers it, in one unit system. A cheap handle, made on demand; keeps parameter and
/// control module alive. Looks at names, units and ranges only, never at readings.
class OBD_EXPORT ParameterDescriptor
{
public:
    /// Neither pointer may be null.
    ParameterDescriptor(std::shared_ptr<PowertrainParameter> parameter, std::shared_ptr<IEcu> ecu, UnitSystem system);

    ParameterIdentifier::Id pid() const; ///< what the parameter is known by
    std::string description() const;     ///< the parameter's name
    /// One for each sensor of the parameter, in its order.
    std::vector<std::shared_ptr<SensorDescriptor>> sensors() const;
    bool hasNumericSensors() const; ///< whether any sensor is numeric

private:
    std::shared_ptr<PowertrainParameter> m_parameter;
    std::shared_ptr<IEcu> m_ecu;
    UnitSystem m_system;
};

} // namespace obd
