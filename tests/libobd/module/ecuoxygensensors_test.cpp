#include "tests/libobd/module/ecufacts.h"

#include <algorithm>

namespace {

using obd::OxygenSensorLocation;
using support::Bytes;
using support::hexBytes;

using OxygenSensors = support::EcuFacts;
using FuelTrimByte = support::EcuFacts;
using OxygenSensorTests = support::EcuFacts;

TEST_F(OxygenSensors, TwoBanksOfFourComeFromPid13)
{
    supportPids({0x13, 0x1D});
    answer("01 13", "41 13 33");
    EXPECT_EQ(connected()->oxygenSensorLocations(),
              (std::vector{OxygenSensorLocation::Bank1Sensor1, OxygenSensorLocation::Bank1Sensor2,
                           OxygenSensorLocation::Bank2Sensor1, OxygenSensorLocation::Bank2Sensor2}));
    EXPECT_FALSE(asked("01 1D"));
}

TEST_F(OxygenSensors, FourBanksOfTwoComeFromPid1D)
{
    supportPids({0x1D});
    answer("01 1D", "41 1D 15");
    EXPECT_EQ(connected()->oxygenSensorLocations(),
              (std::vector{OxygenSensorLocation::Bank1Sensor1, OxygenSensorLocation::Bank2Sensor1,
                           OxygenSensorLocation::Bank3Sensor1}));
}

TEST_F(OxygenSensors, NoAnswerIsFatalInTheLogAlone)
{
    supportPids({0x13});
    auto const ecu = connected();
    EXPECT_TRUE(m_log.contains("FATAL Failed to get supported O2 sensors"));
    EXPECT_TRUE(ecu->oxygenSensorLocations().empty());
}

TEST_F(OxygenSensors, AnswerOfAnotherModuleAloneLeavesNone)
{
    supportPids({0x13});
    m_device->answer(hexBytes("01 00"), 0x7E9, hexBytes("41 00 80 00 00 00"));
    m_device->answer(hexBytes("01 13"), 0x7E9, hexBytes("41 13 03"));
    EXPECT_TRUE(connected()->oxygenSensorLocations().empty());
    EXPECT_FALSE(m_log.contains("FATAL Failed to get supported O2 sensors"));
}

TEST_F(FuelTrimByte, IsInUseWithAllSensorsOfFourBanks)
{
    supportPids({0x1D});
    answer("01 1D", "41 1D FF");
    connected();
    EXPECT_TRUE(obd::FuelTrim::byteBInUse());
    EXPECT_TRUE(m_log.contains("INFO FuelTrim: byte B in use"));
    supportPids({0x0C});
    connected();
    EXPECT_TRUE(obd::FuelTrim::byteBInUse()) << "a later connection does not take it back";
}

TEST_F(FuelTrimByte, IsNotInUseWithOneSensorLessOrTwoBanksOfFour)
{
    for (unsigned int missing = 0; missing < 8; ++missing) {
        supportPids({0x1D});
        m_device->answer({0x01, 0x1D}, m_module, {0x41, 0x1D, static_cast<unsigned char>(0xFFU & ~(1U << missing))});
        connected();
        EXPECT_FALSE(obd::FuelTrim::byteBInUse()) << missing;
    }
    supportPids({0x13});
    answer("01 13", "41 13 FF");
    connected();
    EXPECT_FALSE(obd::FuelTrim::byteBInUse());
}

TEST_F(OxygenSensorTests, AreNotAskedForOnCan)
{
    supportPids({0x13});
    answer("01 13", "41 13 FF");
    answer("05 00 01", "45 00 01 FF 00 00 00");
    auto const ecu = connected();
    EXPECT_FALSE(asked("05 00 01"));
    for (OxygenSensorLocation const location : ecu->oxygenSensorLocations()) {
        EXPECT_TRUE(ecu->supportedTids(location).empty());
    }
}

TEST_F(OxygenSensorTests, AnEmptyMaskStandsForTheTenOfTheStandard)
{
    useIso9141();
    supportPids({0x13});
    answer("01 13", "41 13 01");
    answer("05 00 01", "45 00 01 00 00 00 00");
    auto const ecu = connected();
    EXPECT_EQ(ecu->supportedTids(OxygenSensorLocation::Bank1Sensor1), (Bytes{1, 2, 3, 4, 5, 6, 7, 8, 9, 10}));
    EXPECT_TRUE(ecu->isSupported(OxygenSensorLocation::Bank1Sensor1, 10));
    EXPECT_FALSE(asked("05 20 01"));
}

TEST_F(OxygenSensorTests, ASensorThatDoesNotAnswerHasNoneAndTheNextIsAsked)
{
    useIso9141();
    supportPids({0x13});
    answer("01 13", "41 13 03");
    answer("05 00 02", "45 00 02 40 00 00 00");
    auto const ecu = connected();
    EXPECT_TRUE(m_log.contains("FATAL Failed to get supported 05 TIDs 0x01 - 0x20"));
    EXPECT_TRUE(ecu->supportedTids(OxygenSensorLocation::Bank1Sensor1).empty());
    EXPECT_EQ(ecu->supportedTids(OxygenSensorLocation::Bank1Sensor2), Bytes{0x02});
}

TEST_F(OxygenSensorTests, AFailingLaterRangeKeepsTheEarlierOnes)
{
    useIso9141();
    supportPids({0x13});
    answer("01 13", "41 13 01");
    answer("05 00 01", "45 00 01 80 00 00 01");
    answer("05 20 01", "45 20 01 80 00 00 01");
    auto const ecu = connected();
    EXPECT_EQ(ecu->supportedTids(OxygenSensorLocation::Bank1Sensor1), (Bytes{0x01, 0x20, 0x21, 0x40}));
    EXPECT_TRUE(m_log.contains("FATAL Failed to get supported 05 TIDs 0x41 - 0x60"));
}

TEST_F(OxygenSensorTests, TheChainStopsAtE0WhateverIsReported)
{
    useIso9141();
    supportPids({0x13});
    answer("01 13", "41 13 01");
    for (unsigned int base = 0; base <= 0xE0; base += 0x20) {
        auto const first = static_cast<unsigned char>(base);
        m_device->answer({0x05, first, 0x01}, m_module, {0x45, first, 0x01, 0x00, 0x00, 0x00, 0x01});
    }
    auto const ecu = connected();
    EXPECT_EQ(ecu->supportedTids(OxygenSensorLocation::Bank1Sensor1),
              (Bytes{0x20, 0x40, 0x60, 0x80, 0xA0, 0xC0, 0xE0, 0x00}));
    EXPECT_EQ(std::count(m_device->requests.begin(), m_device->requests.end(), hexBytes("05 00 01")), 1);
}

} // namespace
