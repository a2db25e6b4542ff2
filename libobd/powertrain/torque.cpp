#include "libobd/powertrain/torque.h"

#include <common/clock.h>
#include <obd/iobdproxy.h>

namespace obd {
namespace {

constexpr DerivedRow torqueRow{
    ParameterIdentifier::Torque, "Engine torque", 0, {UnitNewtonMetre, 0.0, 2000.0}, {UnitNewtonMetre, 0.0, 2000.0}};

constexpr double fullCircle = 6.283185307179586; // 2 pi

} // namespace

EcuHistory<TorqueData> Torque::s_history;

void TorqueData::addPower(Sample const& sample)
{
    if (std::optional<double> const rpm = m_rpm.at(sample.time)) {
        m_torque = *rpm > 0.0 ? sample.value * 1000.0 / (*rpm / 60.0 * fullCircle) : 0.0;
    }
}

Torque::Torque(unsigned int weight) : DerivedParameter(torqueRow), m_power(weight), m_rpm(ObdMode::CurrentData, 0) {}

IQuery::UpdateStatus Torque::update(std::shared_ptr<IObdProxy> const& proxy)
{
    bool const rpm = poll(m_rpm, proxy, proxy->ecus(), [](IEcu const& ecu, Sample const& sample) {
        s_history.change(ecu, [&sample](TorqueData& data) { data.addRpm(sample); });
    });
    bool const power = updatePower(proxy);
    judge(proxy->ecus(), {&m_rpm, &m_power});
    return status(rpm && power);
}

bool Torque::updatePower(std::shared_ptr<IObdProxy> const& proxy)
{
    if (m_power.update(proxy) != UpdateStatus::UpdateOk) {
        return false;
    }
    std::uint32_t const time = tervex::currentMillis();
    for (std::shared_ptr<IEcu> const& ecu : proxy->ecus()) {
        Sample const sample{time, m_power.power(*ecu, UnitSystem::Metric)};
        s_history.change(*ecu, [&sample](TorqueData& data) { data.addPower(sample); });
    }
    return true;
}

void Torque::clear()
{
    s_history.clear();
}

double Torque::torque(IEcu const& ecu, UnitSystem /*system*/) const
{
    return s_history.read(ecu, [](TorqueData const& data) { return data.torque(); });
}

} // namespace obd
