#pragma once

#include "libobd/powertrain/derivedparameter.h"
#include "libobd/powertrain/ecustore.h"
#include "libobd/powertrain/numericparameters.h"
#include "libobd/powertrain/samplelist.h"

#include <cstdint>
#include <optional>

namespace obd {

// The boost of one module, smoothed over 750 ms.
class BoostPressureData
{
public:
    void setBarometricPressure(double kilopascal) { m_barometricPressure = kilopascal; }
    void addManifoldPressure(Sample const& sample);

    double mean() const { return m_samples.mean(); } // kPa

private:
    double m_barometricPressure{101.325}; // the standard atmosphere, until the module tells better
    SampleList m_samples;
};

// The intake manifold's pressure above that of the air outside.
class BoostPressure : public DerivedParameter
{
public:
    BoostPressure();

    // Whether the module reports what is needed.
    static bool isValid(IEcu const& ecu);

    // Reads the manifold pressure each time, and every 5 seconds the barometric one where a module has it. Fails if the
    // manifold pressure can't be read.
    UpdateStatus update(std::shared_ptr<IObdProxy> const& proxy) override;
    // Of all objects of the class.
    void clear() override;
    bool keepsHistory() const override { return true; }

    // kPa or psi; below 0 with a vacuum in the manifold.
    double pressure(IEcu const& ecu, UnitSystem system) const;

private:
    double value(IEcu const& ecu, UnitSystem system) const override { return pressure(ecu, system); }
    double convert(double kilopascal, UnitSystem system) const;
    bool isBarometricPressureDue(Ecus const& ecus) const;

    static EcuHistory<BoostPressureData> s_history;

    ManifoldPressure m_manifoldPressure;
    BarometricPressure m_barometricPressure;
    std::optional<std::uint32_t> m_barometricPressureTime; // of the last reading
};

} // namespace obd
