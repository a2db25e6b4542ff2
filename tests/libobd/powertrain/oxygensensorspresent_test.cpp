#include "libobd/powertrain/oxygensensorspresent.h"
#include "tests/support/fakeecu.h"
#include "tests/support/hexbytes.h"
#include "tests/support/payload/payload.h"

#include <gtest/gtest.h>

namespace {

using obd::ObdMode;
using obd::UnitSystem;
using Location = obd::OxygenSensorLocation;
using Locations = std::vector<Location>;
using support::hexBytes;
using support::reply;

template <typename Parameter>
class PresentFixture : public ::testing::Test
{
protected:
    std::shared_ptr<support::FakeEcu> m_ecu = std::make_shared<support::FakeEcu>();
    Parameter m_present{ObdMode::CurrentData, 0};
};

using OxygenSensorsPresent13 = PresentFixture<obd::OxygenSensorsPresent13>;
using OxygenSensorsPresent1d = PresentFixture<obd::OxygenSensorsPresent1d>;

TEST_F(OxygenSensorsPresent13, TellsTheLocationsOfTwoBanksBitZeroFirst)
{
    EXPECT_TRUE(reply(m_present, m_ecu, hexBytes("FF")));
    EXPECT_EQ(
        m_present.locations(*m_ecu),
        (Locations{Location::Bank1Sensor1, Location::Bank1Sensor2, Location::Bank1Sensor3, Location::Bank1Sensor4,
                   Location::Bank2Sensor1, Location::Bank2Sensor2, Location::Bank2Sensor3, Location::Bank2Sensor4}));
    EXPECT_TRUE(reply(m_present, m_ecu, hexBytes("33")));
    EXPECT_EQ(m_present.locations(*m_ecu), (Locations{Location::Bank1Sensor1, Location::Bank1Sensor2,
                                                      Location::Bank2Sensor1, Location::Bank2Sensor2}));
}

TEST_F(OxygenSensorsPresent1d, TellsTheLocationsOfFourBanksBitZeroFirst)
{
    EXPECT_TRUE(reply(m_present, m_ecu, hexBytes("FF")));
    EXPECT_EQ(
        m_present.locations(*m_ecu),
        (Locations{Location::Bank1Sensor1, Location::Bank1Sensor2, Location::Bank2Sensor1, Location::Bank2Sensor2,
                   Location::Bank3Sensor1, Location::Bank3Sensor2, Location::Bank4Sensor1, Location::Bank4Sensor2}));
    EXPECT_TRUE(reply(m_present, m_ecu, hexBytes("81")));
    EXPECT_EQ(m_present.locations(*m_ecu), (Locations{Location::Bank1Sensor1, Location::Bank4Sensor2}));
}

TEST_F(OxygenSensorsPresent13, APresentByteOf00GivesAnEmptyText)
{
    EXPECT_TRUE(reply(m_present, m_ecu, hexBytes("00")));
    auto const values = m_present.values(*m_ecu, UnitSystem::Metric);
    ASSERT_EQ(values.size(), 1u);
    EXPECT_EQ(values[0]->textualValue(), "");
    EXPECT_EQ(m_present.locations(*m_ecu), Locations());
}

TEST_F(OxygenSensorsPresent13, KnowsNoLocationsOfAModuleThatHasNotAnswered)
{
    EXPECT_FALSE(reply(m_present, m_ecu, {}));
    EXPECT_EQ(m_present.locations(*m_ecu), std::nullopt);
    EXPECT_TRUE(m_present.values(*m_ecu, UnitSystem::Metric).empty());
}

} // namespace
