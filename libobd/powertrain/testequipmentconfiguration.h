#pragma once

#include "libobd/powertrain/ecustore.h"

#include <obd/powertrainparameter.h>

namespace obd {

// The upper ends of ranges that a module may set for other PIDs. Publishes no sensors.
class TestEquipmentConfiguration : public PowertrainParameter
{
public:
    using PowertrainParameter::PowertrainParameter;

    std::vector<std::shared_ptr<SensorInfo const>> sensorInfo(IEcu const& ecu) override;
    std::vector<std::shared_ptr<SensorValue>> values(IEcu const& ecu, UnitSystem system) override;
};

// PID 0x4F. Every maximum is the standard's default until the module tells another.
class TestEquipmentConfiguration1 : public TestEquipmentConfiguration
{
public:
    using TestEquipmentConfiguration::TestEquipmentConfiguration;

    ParameterIdentifier::Id pid() const override;
    std::string description(IEcu const& ecu) override;
    void clear() override;

    unsigned int equivalenceRatioMax(IEcu const& ecu) const;
    unsigned int oxygenSensorVoltageMax(IEcu const& ecu) const;            // V
    unsigned int oxygenSensorCurrentMax(IEcu const& ecu) const;            // mA
    unsigned int intakeManifoldAbsolutePressureMax(IEcu const& ecu) const; // kPa

protected:
    bool fromPayload(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& payload) override;

private:
    struct Maxima
    {
        unsigned int equivalenceRatio{2};
        unsigned int oxygenSensorVoltage{8};
        unsigned int oxygenSensorCurrent{128};
        unsigned int intakeManifoldAbsolutePressure{255};
    };

    Maxima maxima(IEcu const& ecu) const;

    EcuStore<Maxima> m_maxima;
};

// PID 0x50.
class TestEquipmentConfiguration2 : public TestEquipmentConfiguration
{
public:
    using TestEquipmentConfiguration::TestEquipmentConfiguration;

    ParameterIdentifier::Id pid() const override;
    std::string description(IEcu const& ecu) override;
    void clear() override;

    double airFlowRateMax(IEcu const& ecu) const; // g/s

protected:
    bool fromPayload(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& payload) override;

private:
    EcuStore<double> m_airFlowRate;
};

} // namespace obd
