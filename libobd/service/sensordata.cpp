#include "libobd/service/sensordata.h"

#include <obd/sensordatamodels.h>
#include <obd/sensorvalue.h>

#include <algorithm>

namespace obd {

void SensorData::update(std::shared_ptr<SensorValue> const& value)
{
    m_value = value;
    if (std::shared_ptr<NumericSensorValue> const number = numeric()) {
        addSample(number->numericValue());
    } else {
        m_text = value->textualValue();
    }
}

void SensorData::addSample(double number)
{
    ++m_count;
    m_current = number;
    m_minimum = m_count == 1 ? number : std::min(m_minimum, number);
    m_maximum = m_count == 1 ? number : std::max(m_maximum, number);
    m_mean += (number - m_mean) / m_count;
}

std::shared_ptr<NumericSensorValue> SensorData::numeric() const
{
    return std::dynamic_pointer_cast<NumericSensorValue>(m_value);
}

std::string SensorData::text(double number) const
{
    std::shared_ptr<NumericSensorValue> const value = numeric();
    return value != nullptr ? value->toString(number) : std::string();
}

std::shared_ptr<SensorValueDataModel> SensorData::model() const
{
    if (numeric() == nullptr) {
        auto const text = std::make_shared<SensorValueDataModel>(m_uid, m_text);
        text->number = m_value != nullptr ? m_value->number() : std::nullopt;
        return text;
    }
    auto const reading = std::make_shared<SensorValueDataModel>(m_uid, current(), minimum(), maximum(), mean());
    reading->number = m_current;
    reading->statistics = {m_minimum, m_maximum, m_mean, m_count};
    return reading;
}

} // namespace obd
