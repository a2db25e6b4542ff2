#include "libobd/value/linearscaling.h"

#include <cstdint>

namespace obd {

LinearScaling::LinearScaling(signed char id, double factor, int decimals, MeasurementUnit unit, Conversion conversion)
    : m_id(id), m_factor(factor), m_formater(decimals), m_unit(unit), m_conversion(conversion)
{}

double LinearScaling::value(unsigned int raw) const
{
    return m_id < 0 ? static_cast<std::int16_t>(raw) * m_factor : raw * m_factor;
}

std::string LinearScaling::toString(double value) const
{
    return m_formater.toString(m_conversion != nullptr ? m_conversion(value) : value);
}

LinearOffsetScaling::LinearOffsetScaling(signed char id, double factor, float offset, int decimals,
                                         MeasurementUnit unit, Conversion conversion)
    : LinearScaling(id, factor, decimals, unit, conversion), m_offset(offset)
{}

double LinearOffsetScaling::value(unsigned int raw) const
{
    return LinearScaling::value(raw) + static_cast<double>(m_offset);
}

} // namespace obd
