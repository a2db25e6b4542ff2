#pragma once

#include "libobd/powertrain/enginepower.h"

namespace obd {

// The torque by one module's engine speed.
class TorqueData
{
public:
    void addRpm(Sample const& sample) { m_rpm.add(sample); }
    // In kW. Works the torque out, if the engine speed at that time is known.
    void addPower(Sample const& sample);

    double torque() const { return m_torque; } // Nm

private:
    SamplePair m_rpm;
    double m_torque{0.0};
};

// The torque that the estimated power takes at the engine's speed.
class Torque : public DerivedParameter
{
public:
    // weight: of the vehicle, in kg.
    explicit Torque(unsigned int weight);

    // Fails unless both the engine speed and the power could be read.
    UpdateStatus update(std::shared_ptr<IObdProxy> const& proxy) override;
    // Of all objects of the class.
    void clear() override;
    bool keepsHistory() const override { return true; }

    double torque(IEcu const& ecu, UnitSystem system) const; // Nm in both unit systems

private:
    double value(IEcu const& ecu, UnitSystem system) const override { return torque(ecu, system); }
    bool updatePower(std::shared_ptr<IObdProxy> const& proxy);

    static EcuHistory<TorqueData> s_history;

    EnginePower m_power;
    EngineRpm m_rpm;
};

} // namespace obd
