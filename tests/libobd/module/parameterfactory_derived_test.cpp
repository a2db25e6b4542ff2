#include "libobd/connection/velmorasettings.h"
#include "libobd/powertrain/boostpressure.h"
#include "libobd/powertrain/fuelconsumption.h"
#include "libobd/powertrain/torque.h"
#include "tests/libobd/powertrain/derivedrig.h"
#include "tests/support/memorysettings.h"

#include <obd/parameterfactory.h>
#include <obd/sensorvalue.h>

namespace {

using obd::ParameterIdentifier;

// A module that reports what the consumption by manifold pressure, the power and the torque are made of.
class DerivedMaker : public derived::Rig
{
protected:
    DerivedMaker()
    {
        support({0x0B, 0x0C, 0x0D, 0x0F});
        answer("01 0B", "41 0B 3C");    // 60 kPa
        answer("01 0C", "41 0C 25 80"); // 2400 rpm
        answer("01 0F", "41 0F 41");    // 25 degrees
    }

    std::shared_ptr<obd::PowertrainParameter> make(ParameterIdentifier::Id id)
    {
        return obd::ParameterFactory().createParameter(*ecu, settings, id);
    }

    // By two speeds, a second apart.
    double reading(ParameterIdentifier::Id id)
    {
        auto const parameter = make(id);
        parameter->clear();
        for (unsigned int const speed : {36U, 45U}) {
            drive(speed);
            clock.advance(1000);
            EXPECT_EQ(parameter->update(proxy), derived::Status::UpdateOk);
        }
        return parameter->values(*ecu, derived::UnitSystem::Metric).at(0)->number().value();
    }

    obd::VelmoraSettings settings{std::make_shared<support::MemorySettings>()};
};

TEST_F(DerivedMaker, TheConsumptionGoesWithDisplacementEfficiencyAndCorrection)
{
    settings.setVolumetricEfficiency(40);
    double const usual = reading(ParameterIdentifier::FuelConsumption);
    ASSERT_GT(usual, 0.0);
    settings.setEngineDisplacement(4.0F);
    EXPECT_NEAR(reading(ParameterIdentifier::FuelConsumption) / usual, 2.0, 0.01);
    settings.setVolumetricEfficiency(80);
    EXPECT_NEAR(reading(ParameterIdentifier::FuelConsumption) / usual, 4.0, 0.01);
    settings.setFuelCorrectionFactor(2.0F);
    EXPECT_NEAR(reading(ParameterIdentifier::FuelConsumption) / usual, 8.0, 0.01);
}

TEST_F(DerivedMaker, TheConsumptionIsThatOfTheIgnitionType)
{
    support({0x04, 0x0D, 0x10});
    auto const made = [this] { return make(ParameterIdentifier::FuelConsumption); };
    EXPECT_NE(std::dynamic_pointer_cast<obd::GasConsumption>(made()), nullptr);
    settings.setIgnitionType(obd::IgnitionType::Compression);
    EXPECT_NE(std::dynamic_pointer_cast<obd::GasConsumption>(made()), nullptr) << "the vehicle's counts";
    settings.setFuelTypeOverride(true);
    EXPECT_NE(std::dynamic_pointer_cast<obd::DieselConsumption>(made()), nullptr);
    support({0x04});
    EXPECT_EQ(made(), nullptr) << "no model suits";
}

TEST_F(DerivedMaker, PowerAndTorqueGoWithTheWeight)
{
    double const power = reading(ParameterIdentifier::EnginePower);
    double const torque = reading(ParameterIdentifier::Torque);
    settings.setVehicleWeight(3000);
    EXPECT_GT(reading(ParameterIdentifier::EnginePower), 1.8 * power);
    EXPECT_GT(reading(ParameterIdentifier::Torque), 1.8 * torque);
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(DerivedMaker, AllOthersAreMadeAsEver)
{
    EXPECT_NE(std::dynamic_pointer_cast<obd::BoostPressure>(make(ParameterIdentifier::BoostPressure)), nullptr);
    EXPECT_EQ(make(ParameterIdentifier::Id(0x0C))->pid(), 0x0C);
    EXPECT_EQ(make(ParameterIdentifier::Id(0x20)), nullptr);
}

} // namespace
