#pragma once

#include <obd/sensordatamodels.h>
#include <obd/sensorvalue.h>

namespace velmora {

// The running record of one sensor: last value, minimum, mean and maximum, as the library's sensor service keeps them.
class SensorStatistics
{
public:
    void add(double number);

    // As texts, with the decimals of that value. Only after add.
    obd::SensorValueDataModel model(obd::NumericSensorValue const& value) const;

private:
    double m_current = 0.0;
    double m_minimum = 0.0;
    double m_maximum = 0.0;
    double m_mean = 0.0;
    unsigned int m_count = 0;
};

} // namespace velmora
