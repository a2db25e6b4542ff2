#include "libobd/powertrain/freezeframetroublecode.h"
#include "tests/support/dtcrows.h"
#include "tests/support/fakeecu.h"
#include "tests/support/hexbytes.h"
#include "tests/support/logcapture.h"

#include <obd/sensorvalue.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using obd::UnitSystem;
using support::FakeEcu;
using support::hexBytes;
using testing::IsEmpty;

class FreezeFrameTroubleCode : public testing::Test
{
protected:
    bool offer(std::string const& reply) { return m_code.setResponseData(m_ecu, hexBytes(reply)); }

    std::shared_ptr<obd::IEcu> m_ecu = std::make_shared<FakeEcu>(0x7E8U);
    obd::FreezeFrameTroubleCode m_code{0};
};

TEST_F(FreezeFrameTroubleCode, RequestHoldsServicePidAndFrame)
{
    std::vector<unsigned char> data;
    obd::FreezeFrameTroubleCode(3).requestData(data);
    EXPECT_EQ(data, hexBytes("02 02 03"));
    EXPECT_EQ(m_code.pid(), 2);
}

TEST_F(FreezeFrameTroubleCode, HasOneTextualSensorWithoutUnits)
{
    auto const infos = m_code.sensorInfo(*m_ecu);
    ASSERT_EQ(infos.size(), 1U);
    EXPECT_EQ(infos[0]->uid(), 20);
    EXPECT_EQ(infos[0]->description(), "Freeze Frame Trouble Code");
    EXPECT_FALSE(infos[0]->isNumeric());
    EXPECT_EQ(infos[0]->unit(UnitSystem::Metric), UnitNone);
    EXPECT_EQ(infos[0]->unit(UnitSystem::Imperial), UnitNone);
    EXPECT_EQ(m_code.description(*m_ecu), "Freeze Frame Trouble Code");
}

TEST_F(FreezeFrameTroubleCode, GivesTheGenericMeaningAndTheCodeAsValue)
{
    support::LoadedCodes const catalogue{{0, "P0420", "Catalyst"}, {3, "P0420", "Catalyst of Audi"}};
    EXPECT_TRUE(offer("42 02 00 04 20"));
    auto const code = m_code.getTroubleCode(*m_ecu);
    ASSERT_NE(code, nullptr);
    EXPECT_EQ(code->code, "P0420");
    EXPECT_EQ(code->description, "Catalyst");
    EXPECT_EQ(code->manufacturer, "Generic");
    auto const values = m_code.values(*m_ecu, UnitSystem::Metric);
    ASSERT_EQ(values.size(), 1U);
    EXPECT_EQ(values[0]->uid(), 20);
    EXPECT_EQ(values[0]->textualValue(), "P0420");
}

TEST_F(FreezeFrameTroubleCode, AMakersCodeIsReserved)
{
    EXPECT_TRUE(offer("42 02 00 14 07"));
    EXPECT_EQ(m_code.getTroubleCode(*m_ecu)->code, "P1407");
    EXPECT_EQ(m_code.getTroubleCode(*m_ecu)->description, "ISO/SAE Reserved");
}

TEST_F(FreezeFrameTroubleCode, Payload0000GivesNoSensorValueAndATrueResult)
{
    offer("42 02 00 04 20");
    EXPECT_TRUE(offer("42 02 00 00 00"));
    EXPECT_EQ(m_code.getTroubleCode(*m_ecu), nullptr);
    EXPECT_THAT(m_code.values(*m_ecu, UnitSystem::Metric), IsEmpty());
}

TEST_F(FreezeFrameTroubleCode, OneByteIsRefusedAndTheOldCodeIsGone)
{
    offer("42 02 00 04 20");
    EXPECT_FALSE(offer("42 02 00 04"));
    EXPECT_EQ(m_code.getTroubleCode(*m_ecu), nullptr);
}

TEST_F(FreezeFrameTroubleCode, AReplyWithoutPayloadKeepsTheOldCode)
{
    offer("42 02 00 04 20");
    EXPECT_FALSE(offer("42 02 00"));
    EXPECT_EQ(m_code.getTroubleCode(*m_ecu)->code, "P0420");
}

TEST_F(FreezeFrameTroubleCode, AReplyForAnotherFrameIsNotTaken)
{
    support::LogCapture const log;
    EXPECT_FALSE(offer("42 02 01 04 20"));
    EXPECT_TRUE(log.contains("ERROR Signature mismatch"));
    EXPECT_EQ(m_code.getTroubleCode(*m_ecu), nullptr);
}

TEST_F(FreezeFrameTroubleCode, AChecksumBehindTheCodeIsNotRead)
{
    EXPECT_TRUE(offer("42 02 00 04 20 5C"));
    EXPECT_EQ(m_code.getTroubleCode(*m_ecu)->code, "P0420");
}

TEST_F(FreezeFrameTroubleCode, ClearForgetsTheCodesOfAllModules)
{
    offer("42 02 00 04 20");
    m_code.clear();
    EXPECT_EQ(m_code.getTroubleCode(*m_ecu), nullptr);
    EXPECT_THAT(m_code.values(*m_ecu, UnitSystem::Metric), IsEmpty());
}

} // namespace
