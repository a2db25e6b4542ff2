#include "libobd/powertrain/oxygensensors.h"
#include "tests/support/fakeecu.h"
#include "tests/support/hexbytes.h"
#include "tests/support/parameterclasses.h"
#include "tests/support/payload/payload.h"

#include <gtest/gtest.h>

namespace {

using obd::ObdMode;
using obd::OxygenSensorBank;
using obd::UnitSystem;
using support::hexBytes;
using support::reply;
using support::texts;

class OxygenSensors : public ::testing::Test
{
protected:
    std::shared_ptr<support::FakeEcu> m_ecu = std::make_shared<support::FakeEcu>();
};

struct Place
{
    char const* narrow;
    char const* voltage;
    char const* current;
    char const* ofTwoBanks;
    char const* ofFourBanks;
};

constexpr Place places[] = {
    {"OxygenSensor1Bank1", "OxygenSensorErvSensor1", "OxygenSensor1Erc", "Bank 1 - Sensor 1", "Bank 1 - Sensor 1"},
    {"OxygenSensor2Bank1", "OxygenSensorErvSensor2", "OxygenSensor2Erc", "Bank 1 - Sensor 2", "Bank 1 - Sensor 2"},
    {"OxygenSensor3Bank1", "OxygenSensorErvSensor3", "OxygenSensor3Erc", "Bank 1 - Sensor 3", "Bank 2 - Sensor 1"},
    {"OxygenSensor4Bank1", "OxygenSensorErvSensor4", "OxygenSensor4Erc", "Bank 1 - Sensor 4", "Bank 2 - Sensor 2"},
    {"OxygenSensor1Bank2", "OxygenSensorErvSensor5", "OxygenSensor5Erc", "Bank 2 - Sensor 1", "Bank 3 - Sensor 1"},
    {"OxygenSensor2Bank2", "OxygenSensorErvSensor6", "OxygenSensor6Erc", "Bank 2 - Sensor 2", "Bank 3 - Sensor 2"},
    {"OxygenSensor3Bank2", "OxygenSensorErvSensor7", "OxygenSensor7Erc", "Bank 2 - Sensor 3", "Bank 4 - Sensor 1"},
    {"OxygenSensor4Bank2", "OxygenSensorErvSensor8", "OxygenSensor8Erc", "Bank 2 - Sensor 4", "Bank 4 - Sensor 2"},
};

TEST_F(OxygenSensors, AreCalledByTheirPlaceInTheArrangement)
{
    for (Place const& place : places) {
        for (auto const banks : {OxygenSensorBank::None, OxygenSensorBank::Pid13, OxygenSensorBank::Pid1D}) {
            m_ecu->setOxygenSensorBanks(banks);
            std::string const text = banks == OxygenSensorBank::Pid1D ? place.ofFourBanks : place.ofTwoBanks;
            auto const title = [this](char const* name) { return support::liveParameter(name)->description(*m_ecu); };
            EXPECT_EQ(title(place.narrow), text + " (O2S)");
            EXPECT_EQ(title(place.voltage), text + " (wide range O2S)");
            EXPECT_EQ(title(place.current), text + " (wide range O2S)");
        }
    }
}

TEST_F(OxygenSensors, Pid1AReadsBank4Sensor1OnAVehicleWithThePid1DLayout)
{
    m_ecu->setOxygenSensorBanks(OxygenSensorBank::Pid1D);
    EXPECT_EQ(obd::OxygenSensor3Bank2(ObdMode::CurrentData, 0).description(*m_ecu), "Bank 4 - Sensor 1 (O2S)");
}

TEST_F(OxygenSensors, NarrowSensorWithBFFPublishesOnlyTheVoltage)
{
    obd::OxygenSensor1Bank1 sensor(ObdMode::CurrentData, 0);
    EXPECT_TRUE(reply(sensor, m_ecu, hexBytes("5A 90")));
    EXPECT_EQ(texts(sensor, *m_ecu, UnitSystem::Metric), "0.450 | 12.5");
    EXPECT_TRUE(reply(sensor, m_ecu, hexBytes("5A FF")));
    EXPECT_EQ(texts(sensor, *m_ecu, UnitSystem::Metric), "0.450");
    EXPECT_FALSE(sensor.stored(*m_ecu, 1)) << "the trim of the reply before";
    EXPECT_EQ(sensor.sensorInfo(*m_ecu).size(), 2u);
}

TEST_F(OxygenSensors, WideSensorWithTheDefaultsHasLambda1InTheMiddleAndCurrentWithoutOffset)
{
    obd::OxygenSensor1Erc sensor(ObdMode::CurrentData, 0);
    EXPECT_TRUE(reply(sensor, m_ecu, hexBytes("80 00 80 00")));
    EXPECT_NEAR(sensor.value(*m_ecu, UnitSystem::Metric, 0), 1.0, 0.0001);
    EXPECT_EQ(sensor.value(*m_ecu, UnitSystem::Metric, 1), 128.0);
}

TEST_F(OxygenSensors, WideSensorsScaleByTheMaximaOfTheModule)
{
    m_ecu->setEquivalenceRatioMax(4).setOxygenSensorVoltageMax(16).setOxygenSensorCurrentMax(255);
    obd::OxygenSensorErvSensor1 voltage(ObdMode::CurrentData, 0);
    obd::OxygenSensor1Erc current(ObdMode::CurrentData, 0);
    EXPECT_TRUE(reply(voltage, m_ecu, hexBytes("FF FF FF FF")));
    EXPECT_TRUE(reply(current, m_ecu, hexBytes("FF FF FF FF")));
    EXPECT_EQ(texts(voltage, *m_ecu, UnitSystem::Metric), "4.000 | 16.000");
    EXPECT_EQ(texts(current, *m_ecu, UnitSystem::Imperial), "4.000 | 509.99");
    EXPECT_EQ(voltage.sensorInfo(*m_ecu)[0]->maxValue(UnitSystem::Metric), 4.0);
    EXPECT_EQ(voltage.sensorInfo(*m_ecu)[1]->maxValue(UnitSystem::Imperial), 16.0);
    EXPECT_EQ(current.sensorInfo(*m_ecu)[1]->maxValue(UnitSystem::Metric), 510.0);
}

TEST_F(OxygenSensors, AReplyDecodedBeforeTheMaximaWereKnownKeepsTheDefaults)
{
    obd::OxygenSensorErvSensor1 sensor(ObdMode::CurrentData, 0);
    EXPECT_TRUE(reply(sensor, m_ecu, hexBytes("FF FF FF FF")));
    m_ecu->setEquivalenceRatioMax(4).setOxygenSensorVoltageMax(16);
    EXPECT_EQ(texts(sensor, *m_ecu, UnitSystem::Metric), "2.000 | 8.000");
}

TEST_F(OxygenSensors, AModuleThatHasNotAnsweredReads0ExceptForTheTrim)
{
    obd::OxygenSensor1Bank1 narrow(ObdMode::CurrentData, 0);
    obd::OxygenSensorErvSensor1 voltage(ObdMode::CurrentData, 0);
    obd::OxygenSensor1Erc current(ObdMode::CurrentData, 0);
    EXPECT_EQ(texts(narrow, *m_ecu, UnitSystem::Metric), "0.000");
    EXPECT_EQ(texts(voltage, *m_ecu, UnitSystem::Metric), "0.000 | 0.000");
    EXPECT_EQ(texts(current, *m_ecu, UnitSystem::Metric), "0.000 | 0.00");
}

TEST_F(OxygenSensors, HaveTheClassOfTheirKind)
{
    for (Place const& place : places) {
        auto const isA = [](char const* name, auto* kind) {
            return dynamic_cast<decltype(kind)>(support::liveParameter(name).get()) != nullptr;
        };
        EXPECT_TRUE(isA(place.narrow, static_cast<obd::OxygenSensor*>(nullptr)));
        EXPECT_TRUE(isA(place.voltage, static_cast<obd::OxygenSensorErv*>(nullptr)));
        EXPECT_TRUE(isA(place.current, static_cast<obd::OxygenSensorErc*>(nullptr)));
    }
}

} // namespace
