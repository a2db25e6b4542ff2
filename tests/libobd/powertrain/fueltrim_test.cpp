#include "libobd/powertrain/fueltrim.h"
#include "tests/support/fakeecu.h"
#include "tests/support/hexbytes.h"
#include "tests/support/logcapture.h"
#include "tests/support/payload/payload.h"

#include <obd/sensorinfo.h>

#include <gtest/gtest.h>

namespace {

using obd::FuelTrim;
using obd::ObdMode;
using obd::UnitSystem;
using support::hexBytes;
using support::reply;
using support::texts;

class FuelTrimTest : public ::testing::Test
{
protected:
    void SetUp() override { FuelTrim::setByteBInUse(false); }
    void TearDown() override { FuelTrim::setByteBInUse(false); }

    std::string metric() { return texts(m_trim, *m_ecu, UnitSystem::Metric); }

    std::shared_ptr<support::FakeEcu> m_ecu = std::make_shared<support::FakeEcu>();
    obd::LongTermFuelTrimBank1 m_trim{ObdMode::CurrentData, 0};
};

TEST_F(FuelTrimTest, ByteBIsNotReadUnlessItIsInUse)
{
    EXPECT_TRUE(reply(m_trim, m_ecu, hexBytes("90 A0")));
    EXPECT_EQ(metric(), "12.5");
    EXPECT_TRUE(reply(m_trim, m_ecu, hexBytes("FF")));
    EXPECT_EQ(metric(), "99.2");
}

TEST_F(FuelTrimTest, ByteBIsNeededOnceItIsInUse)
{
    FuelTrim::setByteBInUse(true);
    EXPECT_FALSE(reply(m_trim, m_ecu, hexBytes("90")));
    EXPECT_TRUE(reply(m_trim, m_ecu, hexBytes("90 A0")));
    EXPECT_EQ(metric(), "12.5 | 25.0");
    EXPECT_EQ(texts(m_trim, *m_ecu, UnitSystem::Imperial), "12.5 | 25.0");
}

TEST_F(FuelTrimTest, ANegativeSecondTrimIsNotShown)
{
    FuelTrim::setByteBInUse(true);
    EXPECT_TRUE(reply(m_trim, m_ecu, hexBytes("80 00")));
    EXPECT_EQ(metric(), "0.0");
    EXPECT_TRUE(reply(m_trim, m_ecu, hexBytes("80 7F")));
    EXPECT_EQ(metric(), "0.0");
    EXPECT_TRUE(reply(m_trim, m_ecu, hexBytes("80 80")));
    EXPECT_EQ(metric(), "0.0 | 0.0");
}

TEST_F(FuelTrimTest, AReadingFromBeforeByteBCameIntoUseHasNoSecondTrim)
{
    EXPECT_TRUE(reply(m_trim, m_ecu, hexBytes("90 A0")));
    FuelTrim::setByteBInUse(true);
    EXPECT_EQ(metric(), "12.5");
}

TEST_F(FuelTrimTest, AModuleThatHasNotAnsweredHasTheFirstTrimOnly)
{
    EXPECT_EQ(metric(), "0.0");
    FuelTrim::setByteBInUse(true);
    EXPECT_EQ(metric(), "0.0");
}

TEST_F(FuelTrimTest, TheTitleTellsTheBankWhereThereIsOneOnly)
{
    EXPECT_EQ(m_trim.description(*m_ecu), "Long Term Fuel Trim - Bank 1");
    obd::ShortTermSecondaryFuelTrimBank2 secondary(ObdMode::CurrentData, 0);
    EXPECT_EQ(secondary.description(*m_ecu), "Short Term Secondary O2 Sensor Fuel Trim - Bank 2");
    FuelTrim::setByteBInUse(true);
    EXPECT_EQ(m_trim.description(*m_ecu), "Long Term Fuel Trim");
    EXPECT_EQ(secondary.description(*m_ecu), "Short Term Secondary O2 Sensor Fuel Trim");
}

TEST_F(FuelTrimTest, BothSensorsAreAnnouncedWhateverIsInUse)
{
    for (bool const inUse : {false, true}) {
        FuelTrim::setByteBInUse(inUse);
        auto const infos = m_trim.sensorInfo(*m_ecu);
        ASSERT_EQ(infos.size(), 2u);
        EXPECT_EQ(infos[0]->description(), "Bank 1");
        EXPECT_EQ(infos[1]->description(), "Bank 3");
    }
}

TEST_F(FuelTrimTest, OnlyTakingByteBIntoUseIsLogged)
{
    support::LogCapture log;
    FuelTrim::setByteBInUse(false);
    EXPECT_TRUE(log.lines().empty());
    FuelTrim::setByteBInUse(true);
    EXPECT_EQ(log.lines(), std::vector<std::string>{"INFO FuelTrim: byte B in use"});
    EXPECT_TRUE(FuelTrim::byteBInUse());
}

} // namespace
