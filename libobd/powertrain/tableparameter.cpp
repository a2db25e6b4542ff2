#include "libobd/powertrain/tableparameter.h"

#include "libobd/powertrain/parameterrow.h"

namespace obd {

std::optional<std::uint32_t> readField(std::vector<unsigned char> const& payload, Field field)
{
    if (payload.size() < field.end()) {
        return std::nullopt;
    }
    std::uint32_t raw = 0;
    for (std::size_t i = field.offset; i < field.end(); ++i) {
        raw = raw << 8U | payload[i];
    }
    return raw;
}

namespace {

std::optional<double> decode(SensorRow const& sensor, std::vector<unsigned char> const& payload, IEcu const& ecu)
{
    bool const wide = (payload[0] & sensor.wide) != 0;
    if (!wide && sensor.available != always && (payload[0] & sensor.available) == 0) {
        return std::nullopt;
    }
    std::optional<std::uint32_t> const raw = readField(payload, sensor.field);
    if (!raw) {
        return std::nullopt;
    }
    return wide ? sensor.wideFormula(*raw, ecu) : sensor.formula(*raw, ecu);
}

} // namespace

TableParameter::TableParameter(ParameterRow const& row, ObdMode mode, unsigned char frame)
    : PowertrainParameter(mode, frame), m_row(row), m_count(row.sensorCount())
{
    m_infos.reserve(m_count);
    for (std::size_t i = 0; i < m_count; ++i) {
        Quantity const& quantity = *m_row.sensors[i].quantity;
        m_infos.push_back(quantity.maximumOf != nullptr ? nullptr : info(i, quantity.maximum));
    }
}

ParameterIdentifier::Id TableParameter::pid() const
{
    return static_cast<ParameterIdentifier::Id>(m_row.pid);
}

int TableParameter::uid(std::size_t index) const
{
    return Pid2Uid(static_cast<ParameterIdentifier::Id>(m_row.pid), static_cast<int>(index));
}

std::string TableParameter::description(IEcu const& /*ecu*/)
{
    return m_row.title;
}

std::shared_ptr<SensorInfo const> TableParameter::info(std::size_t index, double maximum) const
{
    SensorRow const& sensor = m_row.sensors[index];
    return makeInfo(uid(index), sensor.name != nullptr ? sensor.name : m_row.title, *sensor.quantity, maximum);
}

std::vector<std::shared_ptr<SensorInfo const>> TableParameter::sensorInfo(IEcu const& ecu)
{
    std::vector<std::shared_ptr<SensorInfo const>> infos = m_infos;
    for (std::size_t i = 0; i < m_count; ++i) {
        if (infos[i] == nullptr) {
            infos[i] = info(i, m_row.sensors[i].quantity->maximumOf(ecu));
        }
    }
    return infos;
}

std::vector<std::shared_ptr<SensorValue>> TableParameter::values(IEcu const& ecu, UnitSystem system)
{
    std::optional<Reading> const reading = m_readings.get(ecu);
    std::vector<std::shared_ptr<SensorValue>> values;
    for (std::size_t i = 0; i < m_count; ++i) {
        SensorRow const& sensor = m_row.sensors[i];
        if (reading && (*reading)[i]) {
            double const converted = convert(*sensor.quantity, *(*reading)[i], system);
            values.push_back(makeValue(uid(i), *sensor.quantity, converted, system));
        } else if (!reading && i < m_row.zeros) {
            values.push_back(makeValue(uid(i), *sensor.quantity, 0.0, system));
        }
    }
    return values;
}

void TableParameter::clear()
{
    m_readings.clear();
}

double TableParameter::value(IEcu const& ecu, UnitSystem system, std::size_t index) const
{
    std::optional<double> const metric = stored(ecu, index);
    return metric ? convert(*m_row.sensors[index].quantity, *metric, system) : 0.0;
}

std::optional<double> TableParameter::stored(IEcu const& ecu, std::size_t index) const
{
    std::optional<Reading> const reading = m_readings.get(ecu);
    return reading ? reading->at(index) : std::nullopt;
}

bool TableParameter::fromPayload(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& payload)
{
    if (payload.size() < m_row.bytes) {
        return false;
    }
    Reading reading;
    for (std::size_t i = 0; i < m_count; ++i) {
        reading[i] = decode(m_row.sensors[i], payload, *ecu);
    }
    m_readings.put(*ecu, reading);
    return true;
}

} // namespace obd
