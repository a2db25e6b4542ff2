#include "libobd/powertrain/testequipmentconfiguration.h"

namespace obd {
namespace {

constexpr std::size_t payloadLength = 4;
constexpr double defaultAirFlowRate = 655.35;

// A byte of zero tells nothing: the default stands.
template <typename T>
void take(unsigned char byte, unsigned int scale, T& maximum)
{
    if (byte != 0) {
        maximum = byte * scale;
    }
}

} // namespace

std::vector<std::shared_ptr<SensorInfo const>> TestEquipmentConfiguration::sensorInfo(IEcu const& /*ecu*/)
{
    return {};
}

std::vector<std::shared_ptr<SensorValue>> TestEquipmentConfiguration::values(IEcu const& /*ecu*/, UnitSystem /*system*/)
{
    return {};
}

ParameterIdentifier::Id TestEquipmentConfiguration1::pid() const
{
    return ParameterIdentifier::Id(0x4F);
}

std::string TestEquipmentConfiguration1::description(IEcu const& /*ecu*/)
{
    return "External Test Equipment Configuration Information #1";
}

void TestEquipmentConfiguration1::clear()
{
    m_maxima.clear();
}

TestEquipmentConfiguration1::Maxima TestEquipmentConfiguration1::maxima(IEcu const& ecu) const
{
    return m_maxima.get(ecu).value_or(Maxima{});
}

unsigned int TestEquipmentConfiguration1::equivalenceRatioMax(IEcu const& ecu) const
{
    return maxima(ecu).equivalenceRatio;
}

unsigned int TestEquipmentConfiguration1::oxygenSensorVoltageMax(IEcu const& ecu) const
{
    return maxima(ecu).oxygenSensorVoltage;
}

unsigned int TestEquipmentConfiguration1::oxygenSensorCurrentMax(IEcu const& ecu) const
{
    return maxima(ecu).oxygenSensorCurrent;
}

unsigned int TestEquipmentConfiguration1::intakeManifoldAbsolutePressureMax(IEcu const& ecu) const
{
    return maxima(ecu).intakeManifoldAbsolutePressure;
}

bool TestEquipmentConfiguration1::fromPayload(std::shared_ptr<IEcu> const& ecu,
                                              std::vector<unsigned char> const& payload)
{
    if (payload.size() < payloadLength) {
        return false;
    }
    Maxima maxima;
    take(payload[0], 1, maxima.equivalenceRatio);
    take(payload[1], 1, maxima.oxygenSensorVoltage);
    take(payload[2], 1, maxima.oxygenSensorCurrent);
    take(payload[3], 10, maxima.intakeManifoldAbsolutePressure);
    m_maxima.put(*ecu, maxima);
    return true;
}

ParameterIdentifier::Id TestEquipmentConfiguration2::pid() const
{
    return ParameterIdentifier::Id(0x50);
}

std::string TestEquipmentConfiguration2::description(IEcu const& /*ecu*/)
{
    return "External Test Equipment Configuration Information #2";
}

void TestEquipmentConfiguration2::clear()
{
    m_airFlowRate.clear();
}

double TestEquipmentConfiguration2::airFlowRateMax(IEcu const& ecu) const
{
    return m_airFlowRate.get(ecu).value_or(defaultAirFlowRate);
}

bool TestEquipmentConfiguration2::fromPayload(std::shared_ptr<IEcu> const& ecu,
                                              std::vector<unsigned char> const& payload)
{
    if (payload.size() < payloadLength) {
        return false;
    }
    double maximum = defaultAirFlowRate;
    take(payload[0], 10, maximum);
    m_airFlowRate.put(*ecu, maximum);
    return true;
}

} // namespace obd
