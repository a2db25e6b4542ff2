#pragma once

#include <memory>
#include <string>

namespace obd {

class NumericSensorValue;
class SensorValue;
struct SensorValueDataModel;

// The running record of one sensor: its last value, and the statistics of all of them. Not guarded.
class SensorData
{
public:
    explicit SensorData(int uid) : m_uid(uid) {}

    // Takes a reading; value must not be null.
    void update(std::shared_ptr<SensorValue> const& value);

    int uid() const { return m_uid; }
    unsigned int count() const { return m_count; }

    // As texts with the decimals of the sensor. A textual sensor has a current text only. Empty before the first
    // reading.
    std::string current() const { return numeric() != nullptr ? text(m_current) : m_text; }
    std::string minimum() const { return text(m_minimum); }
    std::string maximum() const { return text(m_maximum); }
    std::string mean() const { return text(m_mean); }

    std::shared_ptr<SensorValueDataModel> model() const;

private:
    void addSample(double number);
    std::shared_ptr<NumericSensorValue> numeric() const;
    std::string text(double number) const;

    int m_uid;
    std::string m_text;
    double m_current{0.0};
    double m_maximum{0.0};
    double m_minimum{0.0};
    double m_mean{0.0};
    unsigned int m_count{0};
    std::shared_ptr<SensorValue> m_value;
};

} // namespace obd
