#include "libobd/powertrain/enginepower.h"

#include "libobd/value/unitconversion.h"

#include <obd/iobdproxy.h>

namespace obd {
namespace {

constexpr DerivedRow enginePowerRow{
    ParameterIdentifier::EnginePower, "Engine power", 0, {UnitKilowatt, 0.0, 1000.0}, {UnitHorsepower, 0.0, 1300.0}};

constexpr double metrePerSecond = 0.2777777777777778; // in a km/h
constexpr std::int32_t powerWindowMillis = 1000;

// From the speed before to the speed now, in m/s, within dt seconds; in kW. The force that accelerates is taken twice,
// as the gain of kinetic energy and by Newton's law, and halved. The drag is half the air's density of 1.2242 kg/m3
// times a usual car's drag coefficient and area.
double roadLoad(double before, double now, double dt, double weight)
{
    double const acceleration = (now - before) / dt;
    double const kinetic = weight * 0.5 * (now * now - before * before) / dt;
    double const drag = now * now * now * 0.6121 * 0.3 * 0.79;
    return ((kinetic + now * weight * acceleration) * 0.5 + drag) * 0.001;
}

} // namespace

EcuHistory<EnginePowerData> EnginePower::s_history;

void EnginePowerData::addSpeed(Sample const& sample, double weight)
{
    m_speed.add({sample.time, sample.value * metrePerSecond});
    Sample const& before = m_speed.previous();
    Sample const& now = m_speed.newest();
    double const dt = elapsed(before.time, now.time) / 1000.0;
    if (before.time != 0 && now.value - before.value > 0.0 && dt > 0.0) {
        m_powers.add({now.time, roadLoad(before.value, now.value, dt, weight)});
    }
    m_powers.dropOlderThan(powerWindowMillis, now.time);
}

EnginePower::EnginePower(unsigned int weight)
    : DerivedParameter(enginePowerRow), m_speed(ObdMode::CurrentData, 0), m_weight(weight)
{}

IQuery::UpdateStatus EnginePower::update(std::shared_ptr<IObdProxy> const& proxy)
{
    Ecus const ecus = proxy->ecus();
    bool const success = poll(m_speed, proxy, ecus, [this](IEcu const& ecu, Sample const& sample) {
        s_history.change(ecu, [this, &sample](EnginePowerData& data) { data.addSpeed(sample, m_weight); });
    });
    judge(ecus, {&m_speed});
    return status(success);
}

void EnginePower::clear()
{
    s_history.clear();
}

double EnginePower::power(IEcu const& ecu, UnitSystem system) const
{
    return convert(s_history.read(ecu, [](EnginePowerData const& data) { return data.mean(); }), system);
}

double EnginePower::convert(double kilowatt, UnitSystem system) const
{
    return system == UnitSystem::Imperial ? unitconversion::kilowattToHorsepower(kilowatt) : kilowatt;
}

} // namespace obd
