#pragma once

#include <obd/export.h>
#include <obd/typedvalueformater.h>

#include <memory>
#include <optional>
#include <string>
#include <utility>

namespace obd {

/// One reading of one sensor. Immutable, so any thread may read it.
class OBD_EXPORT SensorValue
{
public:
    explicit SensorValue(int uid) : m_uid(uid) {} ///< of the sensor
    virtual ~SensorValue() = default;

    /// The uid of the sensor, as in its SensorInfo.
    int uid() const { return m_uid; }
    /// The reading as a user sees it, without its unit.
    virtual std::string textualValue() = 0;
    /// The reading as a number, not rounded. Nothing for a state in words.
    virtual std::optional<double> number() const { return std::nullopt; }

private:
    int m_uid;
};

/// A reading that is a number, in the unit system in which it was asked for.
class OBD_EXPORT NumericSensorValue : public SensorValue
{
public:
    /// From the uid of the sensor.
    using SensorValue::SensorValue;

    /// The number as stored, not rounded.
    virtual double numericValue() const = 0;
    std::optional<double> number() const override { return numericValue(); }
    /// Any other number of the same sensor, such as a mean, with the decimals of this one.
    virtual std::string toString(double value) const = 0;
};

/// T is int, unsigned int or double. Whole numbers are shown by their digits alone; the decimals then serve toString()
/// only.
template <typename T>
class ConcreateNumericSensorValue : public NumericSensorValue
{
public:
    /// decimals: 0 to 9.
    ConcreateNumericSensorValue(int uid, T value, int decimals);

    /// The same as a shared object.
    static std::shared_ptr<ConcreateNumericSensorValue<T>> buildObject(int uid, T value, int decimals);

    std::string textualValue() override;
    double numericValue() const override;
    std::string toString(double value) const override;

private:
    T m_value;
    TypedValueFormater m_formater;
};

extern template class OBD_EXPORT ConcreateNumericSensorValue<int>;
extern template class OBD_EXPORT ConcreateNumericSensorValue<unsigned int>;
extern template class OBD_EXPORT ConcreateNumericSensorValue<double>;

/// A reading that is a text: a state in words, or a number that is shown as its digits and has no statistics.
class OBD_EXPORT TextualSensorValue : public SensorValue
{
public:
    TextualSensorValue(int uid, std::string text) : SensorValue(uid), m_text(std::move(text)) {} ///< a state in words
    /// A number that is shown as its digits.
    TextualSensorValue(int uid, std::string digits, double number)
        : SensorValue(uid), m_text(std::move(digits)), m_number(number)
    {}

    std::string textualValue() override { return m_text; }
    std::optional<double> number() const override { return m_number; }

private:
    std::string m_text;
    std::optional<double> m_number;
};

} // namespace obd
