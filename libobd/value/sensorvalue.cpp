#include <obd/sensorvalue.h>

#include <type_traits>

namespace obd {

template <typename T>
ConcreateNumericSensorValue<T>::ConcreateNumericSensorValue(int uid, T value, int decimals)
    : NumericSensorValue(uid), m_value(value), m_formater(decimals)
{}

template <typename T>
std::shared_ptr<ConcreateNumericSensorValue<T>> ConcreateNumericSensorValue<T>::buildObject(int uid, T value,
                                                                                            int decimals)
{
    return std::make_shared<ConcreateNumericSensorValue<T>>(uid, value, decimals);
}

template <typename T>
std::string ConcreateNumericSensorValue<T>::textualValue()
{
    if constexpr (std::is_integral_v<T>) {
        return std::to_string(m_value);
    } else {
        return m_formater.toString(m_value);
    }
}

template <typename T>
double ConcreateNumericSensorValue<T>::numericValue() const
{
    return m_value;
}

template <typename T>
std::string ConcreateNumericSensorValue<T>::toString(double value) const
{
    return m_formater.toString(value);
}

template class ConcreateNumericSensorValue<int>;
template class ConcreateNumericSensorValue<unsigned int>;
template class ConcreateNumericSensorValue<double>;

} // namespace obd
