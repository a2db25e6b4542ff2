#include "libvelmora/poll/sensorstatistics.h"

#include <algorithm>

namespace velmora {

void SensorStatistics::add(double number)
{
    ++m_count;
    m_current = number;
    m_minimum = m_count == 1 ? number : std::min(m_minimum, number);
    m_maximum = m_count == 1 ? number : std::max(m_maximum, number);
    m_mean += (number - m_mean) / m_count;
}

obd::SensorValueDataModel SensorStatistics::model(obd::NumericSensorValue const& value) const
{
    obd::SensorValueDataModel model(value.uid(), value.toString(m_current), value.toString(m_minimum),
                                    value.toString(m_maximum), value.toString(m_mean));
    model.number = m_current;
    model.statistics = obd::SensorValueDataModel::Statistics{m_minimum, m_maximum, m_mean, m_count};
    return model;
}

} // namespace velmora
