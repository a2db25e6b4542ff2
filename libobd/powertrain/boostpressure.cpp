#include "libobd/powertrain/boostpressure.h"

#include "libobd/value/unitconversion.h"

#include <common/clock.h>
#include <obd/iobdproxy.h>

#include <algorithm>

namespace obd {
namespace {

constexpr DerivedRow boostPressureRow{ParameterIdentifier::BoostPressure,
                                      "Boost pressure",
                                      1,
                                      {UnitKilopascal, 0.0, 255.0},
                                      {UnitPsi, 0.0, unitconversion::kilopascalToPsi(255.0)}};

constexpr unsigned char neededPids[] = {0x0B};
constexpr unsigned char barometricPressurePid = 0x33;
constexpr std::int32_t boostWindowMillis = 750;
constexpr unsigned int barometricPressureMillis = 5000; // the weather changes slowly

} // namespace

EcuHistory<BoostPressureData> BoostPressure::s_history;

void BoostPressureData::addManifoldPressure(Sample const& sample)
{
    m_samples.add({sample.time, sample.value - m_barometricPressure});
    m_samples.dropOlderThan(boostWindowMillis, sample.time);
}

BoostPressure::BoostPressure()
    : DerivedParameter(boostPressureRow), m_manifoldPressure(ObdMode::CurrentData, 0),
      m_barometricPressure(ObdMode::CurrentData, 0)
{}

bool BoostPressure::isValid(IEcu const& ecu)
{
    return supportsAll(ecu, neededPids);
}

IQuery::UpdateStatus BoostPressure::update(std::shared_ptr<IObdProxy> const& proxy)
{
    Ecus const ecus = choose(proxy->ecus(), isValid);
    bool const success = poll(m_manifoldPressure, proxy, ecus, [](IEcu const& ecu, Sample const& sample) {
        s_history.change(ecu, [&sample](BoostPressureData& data) { data.addManifoldPressure(sample); });
    });
    if (isBarometricPressureDue(ecus) && poll(m_barometricPressure, proxy, ecus, [](IEcu const& ecu, Sample const& s) {
            s_history.change(ecu, [&s](BoostPressureData& data) { data.setBarometricPressure(s.value); });
        })) {
        m_barometricPressureTime = tervex::currentMillis();
    }
    judge(ecus, {&m_manifoldPressure}); // the other is not read each time, and has a default
    return status(success);
}

bool BoostPressure::isBarometricPressureDue(Ecus const& ecus) const
{
    bool const supported = std::any_of(ecus.begin(), ecus.end(), [](std::shared_ptr<IEcu> const& ecu) {
        return ecu->isSupported(ObdMode::CurrentData, barometricPressurePid, 0);
    });
    return supported && (!m_barometricPressureTime ||
                         tervex::currentMillis() - *m_barometricPressureTime > barometricPressureMillis);
}

void BoostPressure::clear()
{
    s_history.clear();
    m_barometricPressureTime.reset(); // what was read is gone, so that it is due again
}

double BoostPressure::pressure(IEcu const& ecu, UnitSystem system) const
{
    return convert(s_history.read(ecu, [](BoostPressureData const& data) { return data.mean(); }), system);
}

double BoostPressure::convert(double kilopascal, UnitSystem system) const
{
    return system == UnitSystem::Imperial ? unitconversion::kilopascalToPsi(kilopascal) : kilopascal;
}

} // namespace obd
