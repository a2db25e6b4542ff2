#include "libobd/powertrain/multisensorparameters.h"
#include "tests/support/fakeecu.h"
#include "tests/support/hexbytes.h"
#include "tests/support/payload/payload.h"

#include <gtest/gtest.h>

namespace {

using obd::ObdMode;
using obd::UnitSystem;
using support::hexBytes;
using support::reply;
using support::texts;

class MultiSensorParameters : public ::testing::Test
{
protected:
    std::string read(obd::PowertrainParameter& parameter, std::string const& payload) const
    {
        EXPECT_TRUE(reply(parameter, m_ecu, hexBytes(payload)));
        return texts(parameter, *m_ecu, UnitSystem::Metric);
    }

    std::shared_ptr<support::FakeEcu> m_ecu = std::make_shared<support::FakeEcu>();
};

TEST_F(MultiSensorParameters, TurbochargerTemperatureWithW0GivesMinus40AndW405Gives0)
{
    obd::TurbochargerATemperature parameter(ObdMode::CurrentData, 0);
    EXPECT_EQ(read(parameter, "0C 00 00 00 00 01 95"), "2: -40 | 0");
    EXPECT_EQ(parameter.stored(*m_ecu, 2), -40.0);
    EXPECT_EQ(parameter.stored(*m_ecu, 3), 0.0);
}

// The offset is taken from the whole degrees, not the whole degrees from the difference, as catalysts do: below 0 °C
// the two differ.
TEST_F(MultiSensorParameters, TurbochargerTemperatureCutsTheTenthsBeforeTheOffset)
{
    obd::TurbochargerBTemperature parameter(ObdMode::CurrentData, 0);
    EXPECT_EQ(read(parameter, "0C 00 00 01 8F 00 05"), "2: -1 | -40");
}

TEST_F(MultiSensorParameters, ExhaustGasTemperatureKeepsItsTenthsInBothUnitSystems)
{
    obd::ExhaustGasTemperatureBank1 parameter(ObdMode::CurrentData, 0);
    EXPECT_EQ(read(parameter, "01 01 91 00 00 00 00 00 00"), "0.1");
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Imperial), "32.2");
}

TEST_F(MultiSensorParameters, TheWideBitAloneMakesASensorAvailable)
{
    obd::ExhaustGasRecirculationTemperature temperature(ObdMode::CurrentData, 0);
    EXPECT_EQ(read(temperature, "80 00 00 00 FF"), "3: 980");
    EXPECT_EQ(read(temperature, "08 00 00 00 FF"), "3: 215");
    EXPECT_EQ(read(temperature, "88 00 00 00 FF"), "3: 980");
    obd::TurbochargerCompressorInletPressure pressure(ObdMode::CurrentData, 0);
    EXPECT_EQ(read(pressure, "06 10 20"), "128 | 32");
}

TEST_F(MultiSensorParameters, ASensorThatIsNoLongerAvailableHasNoValue)
{
    obd::MassAirFlow parameter(ObdMode::CurrentData, 0);
    EXPECT_EQ(read(parameter, "03 00 20 00 40"), "1.0 | 2.0");
    EXPECT_EQ(read(parameter, "02 00 20 00 40"), "1: 2.0");
    EXPECT_FALSE(parameter.stored(*m_ecu, 0));
}

TEST_F(MultiSensorParameters, AFilterPressureHasNoSign)
{
    obd::DieselParticulateFilterBank1 parameter(ObdMode::CurrentData, 0);
    EXPECT_EQ(read(parameter, "01 FF FF 00 00 00 00"), "655.35");
}

TEST_F(MultiSensorParameters, AModuleThatHasNotAnsweredHasNoValues)
{
    obd::EngineTorqueData torque(ObdMode::CurrentData, 0);
    obd::EngineRuntime2 runtime(ObdMode::CurrentData, 0);
    EXPECT_TRUE(torque.values(*m_ecu, UnitSystem::Metric).empty());
    EXPECT_TRUE(runtime.values(*m_ecu, UnitSystem::Imperial).empty());
}

} // namespace
