#include "tests/support/servicetest.h"

#include <obd/idiagnosticsservice.h>
#include <obd/ivelmorasettings.h>

#include <gmock/gmock.h>

namespace {

using obd::ObdMode;
using obd::OxygenSensorLocation;
using testing::ElementsAre;
using testing::IsEmpty;
using Lines = std::vector<std::string>;

constexpr OxygenSensorLocation front = OxygenSensorLocation::Bank1Sensor1;

class DiagnosticsService : public support::ServiceTest
{
protected:
    // Asks everything; each operation has to give nothing, without a word and without a request.
    void expectNothing()
    {
        m_log.clear();
        EXPECT_THAT(m_service->fetchReadinessMonitors(), IsEmpty());
        EXPECT_THAT(m_service->fetchReadinessMonitorsThisCycle(), IsEmpty());
        EXPECT_THAT(m_service->fetchMonitorTests(), IsEmpty());
        EXPECT_THAT(m_service->fetchPerformanceCounters(), IsEmpty());
        EXPECT_THAT(m_service->oxygenSensorLocations(), IsEmpty());
        EXPECT_THAT(m_service->fetchOxygenSensorTests(front), IsEmpty());
        EXPECT_FALSE(m_service->isOxygenSensorTestComplete());
        EXPECT_THAT(m_log.lines(), IsEmpty());
        EXPECT_EQ(proxy().count(), 0);
    }

    void supportEverything()
    {
        m_engine->setSupported(ObdMode::CurrentData, {0x01, 0x41})
            .setSupported(ObdMode::MonitorTests, {0x01})
            .setSupported(ObdMode::VehicleInformation, {0x08, 0x0B})
            .setOxygenSensorLocations({front})
            .setTests(front, {0x01});
    }

    std::shared_ptr<obd::IDiagnosticsService> m_service = obd::DiagnosticsServiceBuilder::create();
};

// "Misfire 0", name and status.
Lines states(std::vector<std::shared_ptr<obd::ReadinessMonitorDataModel>> const& monitors)
{
    Lines lines;
    for (auto const& monitor : monitors) {
        lines.push_back(monitor->description + " " + std::to_string(static_cast<int>(monitor->status)));
    }
    return lines;
}

// "129: 80.0 (-40.0 to 360.0) 11 status 2", a line for each test.
Lines results(obd::DiagnosticMonitorDataModel const& monitor)
{
    Lines lines;
    for (auto const& test : monitor.tests) {
        lines.push_back(std::to_string(test->testId) + ": " + test->value + " (" + test->minimum + " to " +
                        test->maximum + ") " + std::to_string(test->unit) + " status " +
                        std::to_string(static_cast<int>(test->status)));
    }
    return lines;
}

Lines counters(std::vector<std::shared_ptr<obd::PerformanceCounterDataModel>> const& models)
{
    Lines lines;
    for (auto const& model : models) {
        lines.push_back(model->description + " = " + model->value);
    }
    return lines;
}

TEST_F(DiagnosticsService, WithNoConnectionEveryOperationReturnsAtOnce)
{
    supportEverything();
    expectNothing();
    open();
    m_rig.close();
    expectNothing();
}

TEST_F(DiagnosticsService, FromTheClosingOnNothingIsAskedThoughThereStillIsAModule)
{
    supportEverything();
    open();
    support::tellClosed(*m_service);
    expectNothing();
}

TEST_F(DiagnosticsService, WithoutASelectedModuleThereIsNothing)
{
    supportEverything();
    open();
    m_rig.getEcuManager()->setCurrentEcu(0x123);
    expectNothing();
}

TEST_F(DiagnosticsService, EachCallOfTheBuilderGivesANewService)
{
    EXPECT_NE(obd::DiagnosticsServiceBuilder::create(), m_service);
}

TEST_F(DiagnosticsService, OnASparkIgnitionVehicleFetchReadinessMonitorsGives11Records)
{
    open();
    proxy().answer("01 01", "41 01 81 07 65 04");
    EXPECT_THAT(states(m_service->fetchReadinessMonitors()),
                ElementsAre("Misfire 0", "Fuel System 0", "Comprehensive Component 0", "Catalyst 0",
                            "Heated Catalyst 3", "Evaporative System 1", "Secondary Air System 3",
                            "Gasoline Particulate Filter 3", "Oxygen Sensor 0", "Oxygen Sensor Heater 0",
                            "EGR and/or VVT System 3"));
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(DiagnosticsService, OnACompressionVehicleFetchReadinessMonitorsGives9Records)
{
    open();
    proxy().answer("01 01", "41 01 00 2F 83 81");
    EXPECT_THAT(states(m_service->fetchReadinessMonitors()),
                ElementsAre("Misfire 0", "Fuel System 1", "Comprehensive Component 0", "NMHC Catalyst 1",
                            "NOx Aftertreatment 0", "Boost Pressure 3", "Exhaust Gas Sensor 3", "PM filter 3",
                            "EGR and/or VVT System 1"));
}

TEST_F(DiagnosticsService, ThisCycleTakesAvailabilityFromTheStatusSinceCleared)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x01, 0x41});
    open();
    proxy().answer("01 01", "41 01 00 07 65 00");
    proxy().answer("01 41", "41 41 00 25 61 60"); // fuel system off for this cycle; heated catalyst claimed as well
    EXPECT_THAT(states(m_service->fetchReadinessMonitorsThisCycle()),
                ElementsAre("Misfire 0", "Fuel System 2", "Comprehensive Component 0", "Catalyst 0",
                            "Heated Catalyst 3", "Evaporative System 2", "Secondary Air System 3",
                            "Gasoline Particulate Filter 3", "Oxygen Sensor 1", "Oxygen Sensor Heater 1",
                            "EGR and/or VVT System 3"));
    EXPECT_EQ(proxy().requests(), (std::vector<support::FakeProxy::Bytes>{{0x01, 0x01}, {0x01, 0x41}}));
}

TEST_F(DiagnosticsService, ThisCycleWithoutPid41GivesAnEmptyListAndNoRequest)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x01});
    open();
    EXPECT_THAT(m_service->fetchReadinessMonitorsThisCycle(), IsEmpty());
    EXPECT_EQ(proxy().count(), 0);
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(DiagnosticsService, ThisCycleIsEmptyIfEitherAnswerIsMissing)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x01, 0x41});
    open();
    EXPECT_THAT(m_service->fetchReadinessMonitorsThisCycle(), IsEmpty());
    EXPECT_EQ(proxy().count("01 41"), 0);
    proxy().answer("01 01", "41 01 00 07 65 00");
    EXPECT_THAT(m_service->fetchReadinessMonitorsThisCycle(), IsEmpty());
    EXPECT_EQ(proxy().count("01 41"), 1);
    EXPECT_EQ(m_log.lines(), Lines(2, "ERROR Fetch done with failure"));
}

TEST_F(DiagnosticsService, AFailedReadinessFetchGivesNothing)
{
    open();
    EXPECT_THAT(m_service->fetchReadinessMonitors(), IsEmpty());
    EXPECT_EQ(m_log.lines(), Lines{"ERROR Fetch done with failure"});
}

TEST_F(DiagnosticsService, FetchMonitorTestsNeverRequestsId00Or20)
{
    m_engine->setSupported(ObdMode::MonitorTests, {0x00, 0x01, 0x20, 0x21, 0x40, 0x60, 0x80, 0xA0, 0xE0});
    open();
    EXPECT_THAT(m_service->fetchMonitorTests(), IsEmpty());
    EXPECT_EQ(proxy().requests(), (std::vector<support::FakeProxy::Bytes>{{0x06, 0x01}, {0x06, 0x21}}));
}

TEST_F(DiagnosticsService, MonitorTestsCarryValueLimitsAndVerdict)
{
    m_engine->setSupported(ObdMode::MonitorTests, {0x00, 0x21, 0xA2});
    open();
    // Temperature, 0.1 degrees a bit from -40; counts, 1 a bit.
    proxy().answer("06 21", "46 21 81 16 04 B0 00 00 0F A0 21 82 16 0F A1 00 00 0F A0");
    proxy().answer("06 A2", "46 A2 0C 24 00 00 00 00 00 00");
    auto const monitors = m_service->fetchMonitorTests();
    ASSERT_EQ(monitors.size(), 2U);
    EXPECT_EQ(monitors[0]->id, 0x21);
    EXPECT_EQ(monitors[0]->description, "Catalyst Monitor Bank 1");
    EXPECT_THAT(results(*monitors[0]),
                ElementsAre("129: 80.0 (-40.0 to 360.0) 11 status 2", "130: 360.1 (-40.0 to 360.0) 11 status 1"));
    EXPECT_EQ(monitors[1]->id, 0xA2);
    EXPECT_EQ(monitors[1]->description, "Misfire Cylinder 1 Data");
    EXPECT_THAT(results(*monitors[1]), ElementsAre("12: 0 (0 to 0) 20 status 0"));
    EXPECT_EQ(monitors[1]->tests[0]->description, "Misfire counts for last/current driving cycles (calculated)");
}

TEST_F(DiagnosticsService, MonitorTestsComeInTheUnitSystemOfTheSettings)
{
    m_engine->setSupported(ObdMode::MonitorTests, {0x21});
    open();
    proxy().answer("06 21", "46 21 81 16 04 B0 00 00 0F A0");
    m_rig.getSettings()->setUnitSystem(obd::UnitSystem::Imperial);
    auto const monitors = m_service->fetchMonitorTests();
    ASSERT_EQ(monitors.size(), 1U);
    EXPECT_THAT(results(*monitors[0]), ElementsAre("129: 176.0 (-40.0 to 680.0) 12 status 2"));
}

TEST_F(DiagnosticsService, AMonitorThatDoesNotAnswerIsLeftOut)
{
    m_engine->setSupported(ObdMode::MonitorTests, {0x01, 0x02, 0x21});
    open();
    proxy().answer("06 01", "7F 06 12");
    proxy().answer("06 21", "46 21 81 16 04 B0 00 00 0F A0");
    auto const monitors = m_service->fetchMonitorTests();
    ASSERT_EQ(monitors.size(), 1U);
    EXPECT_EQ(monitors[0]->id, 0x21);
    EXPECT_EQ(proxy().count(), 3);
}

TEST_F(DiagnosticsService, AnEcuWithNoInfoTypes08And0BGivesAnEmptyListOfCountersAndSendsNoRequest)
{
    m_engine->setSupported(ObdMode::VehicleInformation, {0x00, 0x02, 0x04});
    open();
    EXPECT_THAT(m_service->fetchPerformanceCounters(), IsEmpty());
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(DiagnosticsService, CountersOfBothKindsStandBehindEachOther)
{
    m_engine->setSupported(ObdMode::VehicleInformation, {0x08, 0x0B});
    open();
    std::string const noMore = " 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00";
    proxy().answer("09 08", {{0x7E8, "49 08 10 03 3F 0C A1" + noMore}});
    proxy().answer("09 0B", {{0x7E8, "49 0B 10 00 05 00 07" + noMore}});
    EXPECT_THAT(counters(m_service->fetchPerformanceCounters()),
                ElementsAre("OBD Monitoring Conditions Encountered Counts = 831", "Ignition Cycle Counter = 3233",
                            "OBD Monitoring Conditions Encountered Counts = 5", "Ignition Cycle Counter = 7"));
}

TEST_F(DiagnosticsService, CountersOfOneKindDoNotWaitForThoseOfTheOther)
{
    m_engine->setSupported(ObdMode::VehicleInformation, {0x08, 0x0B}).setProtocol(obd::ObdProtocolIso9141);
    open();
    proxy().answer("09 0B", "49 0B 01 00 05 00 07");
    EXPECT_THAT(counters(m_service->fetchPerformanceCounters()),
                ElementsAre("OBD Monitoring Conditions Encountered Counts = 5", "Ignition Cycle Counter = 7"));
    EXPECT_EQ(m_log.lines(), Lines{"ERROR Fetch done with failure"});
}

TEST_F(DiagnosticsService, OxygenSensorLocationsAreThoseOfTheModule)
{
    m_engine->setOxygenSensorLocations({front, OxygenSensorLocation::Bank2Sensor1});
    open();
    EXPECT_THAT(m_service->oxygenSensorLocations(), ElementsAre(front, OxygenSensorLocation::Bank2Sensor1));
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(DiagnosticsService, AnEcuOnCanHasNoTidsAndFetchOxygenSensorTestsGivesAnEmptyList)
{
    m_engine->setOxygenSensorLocations({front});
    open();
    EXPECT_THAT(m_service->fetchOxygenSensorTests(front), IsEmpty());
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(DiagnosticsService, OxygenSensorTestsComeInTheOrderOfTheirTids)
{
    m_engine->setTests(front, {0x05, 0x01, 0x06}).setProtocol(obd::ObdProtocolIso9141);
    open();
    proxy().answer("05 01 01", "45 01 01 64");
    proxy().answer("05 05 01", "45 05 01 14 00 20");
    auto const tests = m_service->fetchOxygenSensorTests(front); // 06 is silent
    ASSERT_EQ(tests.size(), 2U);
    EXPECT_EQ(tests[0]->tid, 5);
    EXPECT_EQ(tests[1]->tid, 1);
    EXPECT_EQ(tests[1]->value, "0.500");
    EXPECT_EQ(m_log.lines(), Lines{"ERROR Fetch done with failure"});
}

TEST_F(DiagnosticsService, AnOxygenSensorTestThatOnlyAnotherModuleAnsweredIsSkipped)
{
    m_engine->setTests(front, {0x01}).setProtocol(obd::ObdProtocolIso9141);
    proxy().addEcu(std::make_shared<support::FakeEcu>(0x7E9U, obd::ObdProtocolIso9141));
    open();
    proxy().answer("05 01 01", {{0x7E9, "45 01 01 64"}});
    EXPECT_THAT(m_service->fetchOxygenSensorTests(front), IsEmpty());
}

TEST_F(DiagnosticsService, TheOxygenSensorTestIsCompleteAsTheReadinessMonitorSays)
{
    open();
    EXPECT_FALSE(m_service->isOxygenSensorTestComplete());
    EXPECT_EQ(m_log.lines(), Lines{"ERROR Fetch done with failure"});
    proxy().answer("01 01", "41 01 00 07 65 04");
    EXPECT_TRUE(m_service->isOxygenSensorTestComplete());
    proxy().answer("01 01", "41 01 00 07 65 20");
    EXPECT_FALSE(m_service->isOxygenSensorTestComplete()) << "not complete";
    proxy().answer("01 01", "41 01 00 07 45 00");
    EXPECT_FALSE(m_service->isOxygenSensorTestComplete()) << "no such monitor";
}

TEST_F(DiagnosticsService, StatusNumbersStandFirm)
{
    using Status = obd::DiagnosticTestDataModel::Status;
    EXPECT_EQ(static_cast<int>(Status::NoResult), 0);
    EXPECT_EQ(static_cast<int>(Status::Failed), 1);
    EXPECT_EQ(static_cast<int>(Status::Passed), 2);
}

} // namespace
