#include "libobd/powertrain/batteryvoltage.h"

#include <obd/iobdproxy.h>

namespace obd {
namespace {

constexpr DerivedRow batteryVoltageRow{
    ParameterIdentifier::BatteryVoltage, "Battery voltage", 1, {UnitVolt, 0.0, 24.0}, {UnitVolt, 0.0, 24.0}};

} // namespace

BatteryVoltage::BatteryVoltage() : DerivedParameter(batteryVoltageRow) {}

IQuery::UpdateStatus BatteryVoltage::update(std::shared_ptr<IObdProxy> const& proxy)
{
    float const volts = proxy->batteryVoltage();
    m_outcome = OutcomeKind::Answered;
    if (volts > 0.0F) {
        m_voltage = static_cast<double>(volts);
        return UpdateStatus::UpdateOk;
    }
    m_outcome = proxy->isConnected() ? OutcomeKind::ModuleSilent : OutcomeKind::NotConnected;
    return UpdateStatus::UpdateFailed;
}

void BatteryVoltage::clear()
{
    m_voltage = 0.0;
}

Verdict BatteryVoltage::verdict(IEcu const& /*ecu*/) const
{
    return {m_outcome};
}

double BatteryVoltage::voltage() const
{
    return m_voltage;
}

double BatteryVoltage::value(IEcu const& /*ecu*/, UnitSystem /*system*/) const
{
    return voltage();
}

} // namespace obd
