#pragma once

#include "libobd/powertrain/derivedparameter.h"
#include "libobd/powertrain/ecustore.h"
#include "libobd/powertrain/numericparameters.h"
#include "libobd/powertrain/samplelist.h"

namespace obd {

// The power by one module's speed, smoothed over a second.
class EnginePowerData
{
public:
    // The speed in km/h, the vehicle's weight in kg.
    void addSpeed(Sample const& sample, double weight);

    double mean() const { return m_powers.mean(); } // kW

private:
    SamplePair m_speed; // in m/s
    SampleList m_powers;
};

// The power that moves the vehicle, estimated from its speed alone: what accelerates it, and the drag of the air. It
// reads 0 while the vehicle doesn't accelerate.
class EnginePower : public DerivedParameter
{
public:
    // weight: of the vehicle, in kg.
    explicit EnginePower(unsigned int weight);

    // Fails if the speed can't be read.
    UpdateStatus update(std::shared_ptr<IObdProxy> const& proxy) override;
    // Of all objects of the class, those inside a Torque among them.
    void clear() override;
    bool keepsHistory() const override { return true; }

    double power(IEcu const& ecu, UnitSystem system) const; // kW or hp

private:
    double value(IEcu const& ecu, UnitSystem system) const override { return power(ecu, system); }
    double convert(double kilowatt, UnitSystem system) const;

    static EcuHistory<EnginePowerData> s_history;

    VehicleSpeed m_speed;
    unsigned int m_weight;
};

} // namespace obd
