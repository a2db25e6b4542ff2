#include <obd/sensorinfo.h>

namespace obd {

SensorInfo::SensorInfo(int uid, std::string const& description, bool numeric)
    : m_uid(uid), m_description(description), m_numeric(numeric)
{}

void SensorInfo::add(UnitSystem system, MeasurementUnit unit, double minimum, double maximum)
{
    m_units[system] = Record{unit, minimum, maximum};
}

MeasurementUnit SensorInfo::unit(UnitSystem system) const
{
    return record(system).unit;
}

double SensorInfo::minValue(UnitSystem system) const
{
    return record(system).minimum;
}

double SensorInfo::maxValue(UnitSystem system) const
{
    return record(system).maximum;
}

SensorInfo::Record SensorInfo::record(UnitSystem system) const
{
    auto const found = m_units.find(system);
    return found == m_units.end() ? Record{} : found->second;
}

} // namespace obd
