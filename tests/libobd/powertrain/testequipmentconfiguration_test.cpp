#include "libobd/powertrain/testequipmentconfiguration.h"
#include "tests/support/fakeecu.h"
#include "tests/support/hexbytes.h"
#include "tests/support/payload/payload.h"

#include <gtest/gtest.h>

namespace {

using obd::ObdMode;
using obd::UnitSystem;
using support::hexBytes;
using support::reply;

class TestEquipmentConfigurationTest : public ::testing::Test
{
protected:
    void expectMaxima(unsigned int ratio, unsigned int voltage, unsigned int current, unsigned int pressure) const
    {
        EXPECT_EQ(m_first.equivalenceRatioMax(*m_ecu), ratio);
        EXPECT_EQ(m_first.oxygenSensorVoltageMax(*m_ecu), voltage);
        EXPECT_EQ(m_first.oxygenSensorCurrentMax(*m_ecu), current);
        EXPECT_EQ(m_first.intakeManifoldAbsolutePressureMax(*m_ecu), pressure);
    }

    std::shared_ptr<support::FakeEcu> m_ecu = std::make_shared<support::FakeEcu>();
    obd::TestEquipmentConfiguration1 m_first{ObdMode::CurrentData, 0};
    obd::TestEquipmentConfiguration2 m_second{ObdMode::CurrentData, 0};
};

TEST_F(TestEquipmentConfigurationTest, DefaultsStandBeforeTheModuleAnswers)
{
    expectMaxima(2, 8, 128, 255);
    EXPECT_EQ(m_second.airFlowRateMax(*m_ecu), 655.35);
}

TEST_F(TestEquipmentConfigurationTest, ZeroBytesLeaveTheDefaults)
{
    EXPECT_TRUE(reply(m_first, m_ecu, hexBytes("00 00 00 00")));
    expectMaxima(2, 8, 128, 255);
    EXPECT_TRUE(reply(m_second, m_ecu, hexBytes("00 FF FF FF")));
    EXPECT_EQ(m_second.airFlowRateMax(*m_ecu), 655.35);
}

TEST_F(TestEquipmentConfigurationTest, TakesEachByteThatIsNotZero)
{
    EXPECT_TRUE(reply(m_first, m_ecu, hexBytes("00 00 00 01")));
    expectMaxima(2, 8, 128, 10);
    EXPECT_TRUE(reply(m_first, m_ecu, hexBytes("04 05 FF 33")));
    expectMaxima(4, 5, 255, 510);
    EXPECT_TRUE(reply(m_second, m_ecu, hexBytes("FF 00 00 00")));
    EXPECT_EQ(m_second.airFlowRateMax(*m_ecu), 2550.0);
}

TEST_F(TestEquipmentConfigurationTest, ALaterZeroByteGivesTheDefaultBack)
{
    EXPECT_TRUE(reply(m_first, m_ecu, hexBytes("04 05 FF 33")));
    EXPECT_TRUE(reply(m_first, m_ecu, hexBytes("00 05 00 33")));
    expectMaxima(2, 5, 128, 510);
}

TEST_F(TestEquipmentConfigurationTest, AShortReplyIsRefusedAndChangesNothing)
{
    EXPECT_TRUE(reply(m_first, m_ecu, hexBytes("04 05 06 07 08")));
    EXPECT_FALSE(reply(m_first, m_ecu, hexBytes("01 01 01")));
    expectMaxima(4, 5, 6, 70);
    EXPECT_TRUE(reply(m_second, m_ecu, hexBytes("02 00 00 00")));
    EXPECT_FALSE(reply(m_second, m_ecu, hexBytes("01 01 01")));
    EXPECT_EQ(m_second.airFlowRateMax(*m_ecu), 20.0);
}

TEST_F(TestEquipmentConfigurationTest, ModulesAreKeptApartAndCleared)
{
    support::FakeEcu const other(0x7E9);
    EXPECT_TRUE(reply(m_first, m_ecu, hexBytes("04 05 06 07")));
    EXPECT_TRUE(reply(m_second, m_ecu, hexBytes("02 00 00 00")));
    EXPECT_EQ(m_first.equivalenceRatioMax(other), 2u);
    EXPECT_EQ(m_second.airFlowRateMax(other), 655.35);
    m_first.clear();
    m_second.clear();
    expectMaxima(2, 8, 128, 255);
    EXPECT_EQ(m_second.airFlowRateMax(*m_ecu), 655.35);
}

TEST_F(TestEquipmentConfigurationTest, PublishesNoSensors)
{
    EXPECT_TRUE(reply(m_first, m_ecu, hexBytes("04 05 06 07")));
    EXPECT_TRUE(m_first.sensorInfo(*m_ecu).empty());
    EXPECT_TRUE(m_first.values(*m_ecu, UnitSystem::Metric).empty());
    EXPECT_EQ(m_first.pid(), 0x4F);
    EXPECT_EQ(m_first.description(*m_ecu), "External Test Equipment Configuration Information #1");
    EXPECT_TRUE(m_second.sensorInfo(*m_ecu).empty());
    EXPECT_TRUE(m_second.values(*m_ecu, UnitSystem::Imperial).empty());
    EXPECT_EQ(m_second.pid(), 0x50);
    EXPECT_EQ(m_second.description(*m_ecu), "External Test Equipment Configuration Information #2");
}

} // namespace
