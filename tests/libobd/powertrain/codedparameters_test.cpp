#include "libobd/powertrain/codedparameters.h"
#include "tests/support/fakeecu.h"
#include "tests/support/hexbytes.h"
#include "tests/support/logcapture.h"
#include "tests/support/payload/payload.h"

#include <gtest/gtest.h>

namespace {

using obd::ObdMode;
using obd::UnitSystem;
using support::hexBytes;
using support::reply;

using Lines = std::vector<std::string>;

class CodedParameters : public ::testing::Test
{
protected:
    std::string metric(obd::PowertrainParameter& parameter) const
    {
        return support::texts(parameter, *m_ecu, UnitSystem::Metric);
    }

    std::shared_ptr<support::FakeEcu> m_ecu = std::make_shared<support::FakeEcu>();
};

TEST_F(CodedParameters, AuxiliaryIoWithByte0Of0HasNoValuesAtAll)
{
    obd::AuxiliaryIo parameter(ObdMode::CurrentData, 0);
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("00 FF")));
    EXPECT_TRUE(parameter.values(*m_ecu, UnitSystem::Metric).empty());
}

TEST_F(CodedParameters, FuelTypeValue14ReadsBiFuelPropage)
{
    obd::FuelTypeParameter parameter(ObdMode::CurrentData, 0);
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("0E")));
    EXPECT_EQ(metric(parameter), "Bi-fuel; Propage");
}

TEST_F(CodedParameters, FuelSystemLogsEachByteWithoutExactlyOneBit)
{
    obd::FuelSystem parameter(ObdMode::CurrentData, 0);
    support::LogCapture log;
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("02 01")));
    EXPECT_TRUE(log.lines().empty());
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("02 00")));
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("06 FF")));
    EXPECT_EQ(log.lines(), (Lines{"ERROR Invalid bit set: int value 0", "ERROR Invalid bit set: int value 6",
                                  "ERROR Invalid bit set: int value 255"}));
}

TEST_F(CodedParameters, FuelSystemForgetsAStateThatIsNoLongerTold)
{
    obd::FuelSystem parameter(ObdMode::CurrentData, 0);
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("02 01")));
    EXPECT_EQ(metric(parameter), "Closed loop (1) | Open loop (0)");
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("00 01")));
    EXPECT_EQ(metric(parameter), "1: Open loop (0)");
}

TEST_F(CodedParameters, AControlAreaStatusWithoutAStateLeavesTheLastOne)
{
    obd::NOxControlAreaStatus parameter(ObdMode::CurrentData, 0);
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("02")));
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("F0")));
    EXPECT_EQ(metric(parameter), "Outside control area");
    EXPECT_FALSE(reply(parameter, m_ecu, {}));
    EXPECT_EQ(metric(parameter), "Outside control area");
}

TEST_F(CodedParameters, AControlAreaStatusWithoutAStateIsNoReading)
{
    obd::PmControlAreaStatus parameter(ObdMode::CurrentData, 0);
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("00")));
    EXPECT_TRUE(parameter.values(*m_ecu, UnitSystem::Metric).empty());
}

TEST_F(CodedParameters, TheStandardIsToldByItsCode)
{
    obd::SaeStandard parameter(ObdMode::CurrentData, 0);
    EXPECT_EQ(parameter.standard(*m_ecu), 0);
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("34")));
    EXPECT_EQ(parameter.standard(*m_ecu), 52);
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("35")));
    EXPECT_EQ(parameter.standard(*m_ecu), 0);
}

TEST_F(CodedParameters, ReservedEmissionStandardsAreKeptAs0)
{
    obd::EmissionStandard parameter(ObdMode::CurrentData, 0);
    for (auto const& [payload, code] : {std::pair("0D", 0.0), {"0E", 14.0}, {"11", 17.0}, {"12", 0.0}}) {
        EXPECT_TRUE(reply(parameter, m_ecu, hexBytes(payload)));
        EXPECT_EQ(parameter.stored(*m_ecu), code);
    }
}

TEST_F(CodedParameters, AModuleThatHasNotAnsweredHasNoStates)
{
    obd::SaeStandard standard(ObdMode::CurrentData, 0);
    obd::FuelSystem fuelSystem(ObdMode::CurrentData, 0);
    EXPECT_TRUE(standard.values(*m_ecu, UnitSystem::Metric).empty());
    EXPECT_TRUE(fuelSystem.values(*m_ecu, UnitSystem::Imperial).empty());
}

// What no reply can lead to.
TEST_F(CodedParameters, StatesOutsideTheirTableHaveNoText)
{
    EXPECT_EQ(obd::states::powerTakeOff.stateText(0), "Not supported");
    EXPECT_EQ(obd::states::powerTakeOff.stateText(3), "");
    EXPECT_EQ(obd::states::saeStandard.stateText(53), "");
    EXPECT_EQ(obd::states::emissionStandard.stateText(18), "");
}

} // namespace
