#pragma once

#include <obd/export.h>
#include <obd/sensorinfo.h>

#include <memory>
#include <string>

namespace obd {

/// A sensor seen in one unit system. A cheap handle, made on demand; keeps the info alive.
class OBD_EXPORT SensorDescriptor
{
public:
    /// info must not be null.
    SensorDescriptor(std::shared_ptr<SensorInfo const> info, UnitSystem system);

    std::string description() const { return m_info->description(); }
    bool isNumeric() const { return m_info->isNumeric(); }
    int uid() const { return m_info->uid(); }
    MeasurementUnit unit() const { return m_info->unit(m_system); }
    double minValue() const { return m_info->minValue(m_system); }
    double maxValue() const { return m_info->maxValue(m_system); }

private:
    std::shared_ptr<SensorInfo const> m_info;
    UnitSystem m_system;
};

} // namespace obd
