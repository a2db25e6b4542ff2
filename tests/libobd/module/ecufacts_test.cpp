#include "libobd/module/ecu.h"
#include "tests/libobd/module/ecufacts.h"

#include <algorithm>

namespace {

using obd::IgnitionType;
using obd::ObdMode;
using obd::OxygenSensorLocation;
using support::Bytes;
using support::hexBytes;

constexpr unsigned int canEngine = 0x7E8;
constexpr unsigned int legacyEngine = 0x10;

std::vector<Bytes> requests(std::initializer_list<char const*> texts)
{
    std::vector<Bytes> all;
    for (char const* text : texts) {
        all.push_back(hexBytes(text));
    }
    return all;
}

using EcuInit = support::EcuFacts;
using TesterConfiguration = support::EcuFacts;
using Ignition = support::EcuFacts;
using DerivedIds = support::EcuFacts;
using Standard = support::EcuFacts;
using EcuNaming = support::EcuFacts;

TEST_F(EcuInit, AsksACanModuleInThisOrder)
{
    supportPids({0x01, 0x04, 0x0B, 0x0C, 0x0D, 0x10, 0x13, 0x1C, 0x33, 0x44, 0x4F, 0x50});
    answer("01 01", "41 01 00 07 E5 00");
    answer("01 4F", "41 4F 04 00 00 00");
    answer("01 50", "41 50 10 00 00 00");
    answer("06 00", "46 00 C0 00 00 01");
    answer("06 20", "46 20 80 00 00 00");
    answer("08 00", "48 00 80 00 00 00");
    answer("09 00", "49 00 14 40 00 00");
    answer("01 1C", "41 1C 06");
    answer("01 13", "41 13 03");
    answer("09 0A", "49 0A 01 45 43 4D 00 2D 45 6E 67 69 6E 65 43 6F 6E 74 72 6F 6C 00 00");
    auto const ecu = connected();
    EXPECT_EQ(m_device->requests, requests({"01 00", // finds the modules
                                            "01 00", "01 20", "01 40", "01 4F", "01 50", "01 01", "06 00", "06 20",
                                            "08 00", "09 00", "01 1C", "01 13", "09 0A"}));
    EXPECT_EQ(m_log.lines(), std::vector<std::string>{});
    EXPECT_EQ(ecu->name(), "ECM");
    EXPECT_EQ(ecu->supportedIds(ObdMode::CurrentData, 0),
              (Bytes{0x00, 0x01, 0x04, 0x0B, 0x0C, 0x0D, 0x10, 0x13, 0x1C, 0x20,
                     0x33, 0x40, 0x44, 0x4F, 0x50, 0xF0, 0xF4, 0xF5, 0xF6, 0xF7}));
    EXPECT_EQ(ecu->oxygenSensorLocations(),
              (std::vector{OxygenSensorLocation::Bank1Sensor1, OxygenSensorLocation::Bank1Sensor2}));
    EXPECT_TRUE(ecu->supportedTids(OxygenSensorLocation::Bank1Sensor1).empty()) << "no service 05 on CAN";
}

TEST_F(EcuInit, AsksAnIso9141ModuleInThisOrder)
{
    useIso9141();
    supportPids({0x01, 0x04, 0x0C, 0x0D, 0x10, 0x13, 0x1C});
    answer("01 01", "41 01 00 07 E5 00");
    answer("06 00", "46 00 FF C0 00 00 00");
    answer("08 00 00 00 00 00 00", "48 00 00 80 00 00 00");
    answer("09 00", "49 00 01 14 40 00 00");
    answer("01 1C", "41 1C 02");
    answer("01 13", "41 13 11");
    answer("05 00 01", "45 00 01 C0 00 00 01");
    answer("05 20 01", "45 20 01 80 00 00 00");
    answer("05 00 10", "45 00 10 00 00 00 00");
    answer("09 0A", "49 0A 01 45 43 4D 31 49 0A 02 2D 45 6E 67 49 0A 03 69 6E 65 43 49 0A 04 6F 6E 74 72 "
                    "49 0A 05 6F 6C 00 00");
    auto const ecu = connected();
    EXPECT_EQ(m_device->requests,
              requests({"01 00", // finds the modules
                        "01 00", "01 01", "06 00", "08 00 00 00 00 00 00", "09 00", "01 1C", "01 13", "05 00 01",
                        "05 20 01", "05 00 10", "09 0A"}));
    EXPECT_EQ(m_log.lines(), std::vector<std::string>{"DEBUG No checksum in use"}) << "in the lines of the name";
    EXPECT_EQ(ecu->supportedTids(OxygenSensorLocation::Bank1Sensor1), (Bytes{0x01, 0x02, 0x20, 0x21}));
    EXPECT_EQ(ecu->supportedTids(OxygenSensorLocation::Bank2Sensor1), (Bytes{1, 2, 3, 4, 5, 6, 7, 8, 9, 10}));
    EXPECT_EQ(ecu->name(), "ECM1");
}

TEST_F(EcuInit, SilentModuleBehindItsFirstRangeKeepsAllDefaults)
{
    supportPids({0x01, 0x13, 0x1C, 0x4F, 0x50});
    auto const ecu = connected();
    EXPECT_EQ(ecu->equivalenceRatioMax(), 2U);
    EXPECT_EQ(ecu->airFlowRateMax(), 655.35);
    EXPECT_EQ(ecu->ignitionType(), IgnitionType::Spark);
    EXPECT_EQ(ecu->standard(), 0);
    EXPECT_EQ(ecu->standardDescription(), "");
    EXPECT_TRUE(ecu->oxygenSensorLocations().empty());
    EXPECT_EQ(ecu->name(), "ECU#1");
}

TEST_F(EcuInit, LinkLostAtAnyRequestEndsTheSequenceThere)
{
    useIso9141();
    supportPids({0x01, 0x13, 0x1C});
    answer("01 13", "41 13 01");
    answer("01 1C", "41 1C 02");
    connected();
    auto const ecu = std::dynamic_pointer_cast<obd::Ecu>(m_proxy->firstEcu());
    struct
    {
        char const* last;
        std::size_t requests;
    } const cases[] = {{"01 00", 1}, {"01 01", 2}, {"06 00", 3}, {"08 00 00 00 00 00 00", 4},
                       {"09 00", 5}, {"01 1C", 6}, {"01 13", 7}, {"05 00 01", 8}};
    for (auto const& each : cases) {
        m_device->requests.clear();
        m_device->enabled = true;
        m_device->onRequest = [&](Bytes const& request) {
            if (request == hexBytes(each.last)) {
                m_device->enabled = false;
            }
        };
        EXPECT_TRUE(ecu->init(0));
        EXPECT_EQ(m_device->requests.size(), each.requests) << each.last;
        EXPECT_EQ(m_device->requests.back(), hexBytes(each.last));
    }
}

TEST_F(TesterConfiguration, MaximaComeFromTheModule)
{
    supportPids({0x0C, 0x4F, 0x50});
    answer("01 4F", "41 4F 04 0C 40 20");
    answer("01 50", "41 50 50 00 00 00");
    auto const ecu = connected();
    EXPECT_EQ(ecu->equivalenceRatioMax(), 4U);
    EXPECT_EQ(ecu->oxygenSensorVoltageMax(), 12U);
    EXPECT_EQ(ecu->oxygenSensorCurrentMax(), 64U);
    EXPECT_EQ(ecu->intakeManifoldAbsolutePressureMax(), 320U);
    EXPECT_EQ(ecu->airFlowRateMax(), 800.0);
}

TEST_F(TesterConfiguration, NotReportedIsNotAskedFor)
{
    supportPids({0x0C, 0x44});
    connected();
    EXPECT_FALSE(asked("01 4F"));
    EXPECT_FALSE(asked("01 50"));
    EXPECT_FALSE(m_log.contains("ERROR Updating tester configuration 1 failed"));
}

TEST_F(TesterConfiguration, FailureIsLoggedAndTheOtherIsAskedAllTheSame)
{
    supportPids({0x0C, 0x4F, 0x50});
    answer("01 50", "41 50 50 00 00 00");
    auto const ecu = connected();
    EXPECT_TRUE(m_log.contains("ERROR Updating tester configuration 1 failed"));
    EXPECT_EQ(ecu->intakeManifoldAbsolutePressureMax(), 255U);
    EXPECT_EQ(ecu->airFlowRateMax(), 800.0);
    refuse("01 50");
    m_log.clear();
    EXPECT_EQ(connected()->airFlowRateMax(), 655.35);
    EXPECT_TRUE(m_log.contains("ERROR Updating tester configuration 2 failed"));
}

TEST_F(Ignition, ComesFromTheReadinessWord)
{
    supportPids({0x01});
    answer("01 01", "41 01 00 07 E5 00");
    EXPECT_EQ(connected()->ignitionType(), IgnitionType::Spark);
    answer("01 01", "41 01 00 0F E5 00");
    EXPECT_EQ(connected()->ignitionType(), IgnitionType::Compression);
}

TEST_F(Ignition, WithoutReadinessItIsSpark)
{
    supportPids({0x0D, 0x10});
    auto const ecu = connected();
    EXPECT_FALSE(asked("01 01"));
    EXPECT_EQ(ecu->ignitionType(), IgnitionType::Spark);
    EXPECT_TRUE(ecu->isSupported(ObdMode::CurrentData, 0xF0, 0));
}

TEST_F(Ignition, UnansweredReadinessLeavesNoFuelConsumption)
{
    supportPids({0x01, 0x0D, 0x10});
    auto const ecu = connected();
    EXPECT_FALSE(ecu->isSupported(ObdMode::CurrentData, 0xF0, 0));
    EXPECT_TRUE(ecu->isSupported(ObdMode::CurrentData, 0xF4, 0));
}

TEST_F(DerivedIds, CompressionIgnitionWithTheGasolineInputsOnlyGetsNoFuelConsumption)
{
    supportPids({0x01, 0x0D, 0x10});
    answer("01 01", "41 01 00 0F E5 00");
    EXPECT_FALSE(connected()->isSupported(ObdMode::CurrentData, 0xF0, 0));
    supportPids({0x01, 0x04, 0x0D, 0x10});
    EXPECT_TRUE(connected()->isSupported(ObdMode::CurrentData, 0xF0, 0));
}

TEST_F(DerivedIds, SparkIgnitionGetsFuelConsumptionByAirFlowOrPressure)
{
    supportPids({0x0B, 0x0C, 0x0D, 0x0F});
    EXPECT_TRUE(connected()->isSupported(ObdMode::CurrentData, 0xF0, 0));
    supportPids({0x0B, 0x0C, 0x0D});
    EXPECT_FALSE(connected()->isSupported(ObdMode::CurrentData, 0xF0, 0));
}

TEST_F(DerivedIds, VoltagePowerAndTorqueStandForEveryModuleBoostWithItsInput)
{
    supportPids({0x0C});
    EXPECT_EQ(connected()->supportedIds(ObdMode::CurrentData, 0), (Bytes{0x00, 0x0C, 0xF4, 0xF5, 0xF6}));
    supportPids({0x0B});
    EXPECT_EQ(connected()->supportedIds(ObdMode::CurrentData, 0), (Bytes{0x00, 0x0B, 0xF4, 0xF5, 0xF6, 0xF7}));
}

TEST_F(Standard, IsKeptAsCodeAndText)
{
    supportPids({0x1C});
    answer("01 1C", "41 1C 06");
    auto const ecu = connected();
    EXPECT_EQ(ecu->standard(), 6);
    EXPECT_EQ(ecu->standardDescription(), "EOBD");
}

TEST_F(Standard, NotReportedIsNotAskedFor)
{
    supportPids({0x0C});
    answer("01 1C", "41 1C 06");
    EXPECT_EQ(connected()->standard(), 0);
    EXPECT_FALSE(asked("01 1C"));
}

TEST_F(Standard, AnswerOfAnotherModuleAloneGivesNone)
{
    supportPids({0x1C});
    m_device->answer(hexBytes("01 00"), 0x7E9, hexBytes("41 00 80 00 00 00"));
    m_device->answer(hexBytes("01 1C"), 0x7E9, hexBytes("41 1C 06"));
    auto const ecu = connected();
    EXPECT_EQ(ecu->standard(), 0);
    EXPECT_EQ(ecu->standardDescription(), "");
}

TEST_F(EcuNaming, WithoutVehicleInformationItIsNumberedAndNamedByItsId)
{
    supportPids({0x0C});
    answer("09 0A", "49 0A 01 45 43 4D 00 2D 45 6E 67 69 6E 65 43 6F 6E 74 72 6F 6C 00 00");
    auto const ecu = connected();
    EXPECT_FALSE(asked("09 0A"));
    EXPECT_EQ(ecu->name(), "ECU#1");
    EXPECT_EQ(ecu->description(), "Control Module 0x7E8");
}

TEST_F(EcuNaming, NameThatIsNotAnsweredIsReplacedToo)
{
    supportPids({0x0C});
    answer("09 00", "49 00 00 40 00 00");
    auto const ecu = connected();
    EXPECT_TRUE(asked("09 0A"));
    EXPECT_EQ(ecu->name(), "ECU#1");
}

TEST_F(EcuNaming, AcronymIsSpelledOut)
{
    supportPids({0x0C});
    answer("09 00", "49 00 00 40 00 00");
    answer("09 0A", "49 0A 01 45 43 4D 31 2D 45 6E 67 69 6E 65 43 6F 6E 74 72 6F 6C 00 00");
    auto const ecu = connected();
    EXPECT_EQ(ecu->name(), "ECM1");
    EXPECT_EQ(ecu->description(), "Engine Control Module1");
}

TEST_F(EcuNaming, WithoutAnAcronymTheModulesOwnTextDescribesIt)
{
    supportPids({0x0C});
    answer("09 00", "49 00 00 40 00 00");
    answer("09 0A", "49 0A 01 00 00 00 00 2D 45 6E 67 69 6E 65 43 6F 6E 74 72 6F 6C 00 00");
    EXPECT_EQ(connected()->description(), "EngineControl");
}

} // namespace
