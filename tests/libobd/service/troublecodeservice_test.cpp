#include "libobd/powertrain/fueltrim.h"
#include "tests/support/dtcrows.h"
#include "tests/support/logcapture.h"
#include "tests/support/servicerig.h"

#include <obd/itroublecodeservice.h>
#include <obd/ivelmorasettings.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using obd::ObdMode;
using obd::ParameterIdentifier;
using support::FakeEcu;
using support::FakeProxy;
using support::pid;
using testing::ElementsAre;
using testing::IsEmpty;
using Lines = std::vector<std::string>;
using MilStatus = obd::ITroubleCodeService::MilStatus;

class TroubleCodeService : public testing::Test
{
protected:
    TroubleCodeService()
    {
        m_rig.rig.proxy->setEcus({m_engine, m_gearbox});
        m_service = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    }

    // A service on a connection, whose log begins now.
    void open()
    {
        m_rig.open();
        m_log.clear();
    }

    FakeProxy& proxy() { return *m_rig.rig.proxy; }

    // Asks everything; each operation has to give nothing.
    void expectNothing()
    {
        EXPECT_THAT(m_service->fetchConfirmedCodes(), IsEmpty());
        EXPECT_THAT(m_service->fetchPendingCodes(), IsEmpty());
        EXPECT_THAT(m_service->fetchPermanentCodes(), IsEmpty());
        EXPECT_EQ(m_service->fetchMilStatus(), nullptr);
        EXPECT_EQ(m_service->fetchDistance(true), nullptr);
        EXPECT_EQ(m_service->fetchDistance(false), nullptr);
        EXPECT_EQ(m_service->fetchRuntime(true), nullptr);
        EXPECT_EQ(m_service->fetchRuntime(false), nullptr);
        EXPECT_EQ(m_service->fetchFreezeFrameTroubleCode(0), nullptr);
        EXPECT_THAT(m_service->fetchFreezeFramePids(0), IsEmpty());
        EXPECT_THAT(m_service->fetchFreezeFrameSensors(0, pid(0x0C)), IsEmpty());
        EXPECT_EQ(m_service->fetchFreezeFrameParameter(0, pid(0x0C)), nullptr);
        EXPECT_FALSE(m_service->resetCodes());
    }

    std::shared_ptr<FakeEcu> m_engine = std::make_shared<FakeEcu>(0x7E8U);
    std::shared_ptr<FakeEcu> m_gearbox = std::make_shared<FakeEcu>(0x7E9U);
    support::LogCapture m_log;
    support::ServiceRig m_rig;
    std::shared_ptr<obd::ITroubleCodeService> m_service;
};

std::vector<std::string> codesOf(std::vector<std::shared_ptr<obd::DtcDataModel>> const& models)
{
    std::vector<std::string> codes;
    for (auto const& model : models) {
        codes.push_back(model->code);
    }
    return codes;
}

// "name = value", or "name = -" without a reading.
std::vector<std::string> readings(std::vector<std::shared_ptr<obd::SensorDataModel>> const& models)
{
    std::vector<std::string> all;
    for (auto const& model : models) {
        all.push_back(model->name + " = " + (model->value != nullptr ? model->value->value : "-"));
    }
    return all;
}

TEST_F(TroubleCodeService, BeforeAConnectionThereIsNothingAndNothingIsLogged)
{
    expectNothing();
    EXPECT_THAT(m_log.lines(), IsEmpty());
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(TroubleCodeService, AfterAConnectionThereIsNothingAndNothingIsLogged)
{
    open();
    m_rig.close();
    m_log.clear();
    expectNothing();
    EXPECT_THAT(m_log.lines(), IsEmpty());
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(TroubleCodeService, FromTheClosingOnNothingIsAskedThoughThereStillIsAModule)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x21, 0x31, 0x4D, 0x4E});
    open();
    support::tellClosed(*m_service);
    expectNothing();
    EXPECT_THAT(m_log.lines(), IsEmpty());
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(TroubleCodeService, WithoutASelectedModuleThereIsNothingAndNothingIsLogged)
{
    open();
    m_rig.getEcuManager()->setCurrentEcu(0x123);
    expectNothing();
    EXPECT_THAT(m_log.lines(), IsEmpty());
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(TroubleCodeService, AServiceBuiltOnAConnectionWorksAtOnce)
{
    open();
    proxy().answer("03", "43 01 04 20");
    auto const late = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    EXPECT_NE(late, m_service);
    EXPECT_THAT(codesOf(late->fetchConfirmedCodes()), ElementsAre("P0420"));
}

TEST_F(TroubleCodeService, CodesOfTheThreeKindsComeWithTheirMeanings)
{
    support::LoadedCodes const catalogue{{0, "P0420", "Catalyst"}, {12, "P1000", "Ford's own"}};
    open();
    proxy().answer("03", "43 02 04 20 01 33");
    proxy().answer("07", "47 01 01 48");
    proxy().answer("0A", "4A 01 07 00");
    auto const confirmed = m_service->fetchConfirmedCodes();
    EXPECT_THAT(codesOf(confirmed), ElementsAre("P0420", "P0133"));
    EXPECT_EQ(confirmed[0]->description, "Catalyst");
    EXPECT_THAT(codesOf(m_service->fetchPendingCodes()), ElementsAre("P0148"));
    EXPECT_THAT(codesOf(m_service->fetchPermanentCodes()), ElementsAre("P0700"));
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(TroubleCodeService, OnlyTheCurrentModulesCodesAreGiven)
{
    open();
    proxy().answer("03", {{0x7E8, "43 01 04 20"}, {0x7E9, "43 01 07 00"}});
    EXPECT_THAT(codesOf(m_service->fetchConfirmedCodes()), ElementsAre("P0420"));
    m_rig.getEcuManager()->setCurrentEcu(0x7E9);
    EXPECT_THAT(codesOf(m_service->fetchConfirmedCodes()), ElementsAre("P0700"));
    EXPECT_EQ(proxy().count("03"), 2);
}

TEST_F(TroubleCodeService, AFailedFetchGivesNothingAndIsLogged)
{
    open();
    EXPECT_THAT(m_service->fetchConfirmedCodes(), IsEmpty());
    EXPECT_EQ(m_service->fetchMilStatus(), nullptr);
    EXPECT_EQ(m_service->fetchFreezeFrameTroubleCode(0), nullptr);
    EXPECT_FALSE(m_service->resetCodes());
    EXPECT_EQ(m_log.lines(), Lines(4, "ERROR Fetch done with failure"));
}

TEST_F(TroubleCodeService, AModuleMayAnswerTo03AndNotTo0A)
{
    open();
    proxy().answer("03", "43 01 04 20");
    proxy().answer("0A", "7F 0A 11");
    EXPECT_THAT(codesOf(m_service->fetchConfirmedCodes()), ElementsAre("P0420"));
    EXPECT_THAT(m_service->fetchPermanentCodes(), IsEmpty());
}

TEST_F(TroubleCodeService, AnIndicatorThatIsOffIsToldApartFromAMissingAnswer)
{
    open();
    EXPECT_EQ(m_service->fetchMilStatus(), nullptr);
    proxy().answer("01 01", "41 01 00 07 E5 00");
    ASSERT_NE(m_service->fetchMilStatus(), nullptr);
    EXPECT_EQ(*m_service->fetchMilStatus(), MilStatus::Off);
    EXPECT_EQ(static_cast<int>(MilStatus::Off), 0);
}

TEST_F(TroubleCodeService, AnIndicatorThatIsOnIs1)
{
    open();
    proxy().answer("01 01", "41 01 82 07 E5 00");
    ASSERT_NE(m_service->fetchMilStatus(), nullptr);
    EXPECT_EQ(static_cast<int>(*m_service->fetchMilStatus()), 1);
}

TEST_F(TroubleCodeService, ADistanceThatTheModuleDoesNotHaveIsNotAskedFor)
{
    open();
    m_engine->setSupported(ObdMode::CurrentData, {0x31});
    EXPECT_EQ(m_service->fetchDistance(true), nullptr);
    EXPECT_EQ(proxy().count(), 0);
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(TroubleCodeService, DistancesAndRunTimesAreThoseOfTheirPids)
{
    open();
    m_engine->setSupported(ObdMode::CurrentData, {0x21, 0x31, 0x4D, 0x4E});
    proxy().answer("01 21", "41 21 00 64");
    proxy().answer("01 31", "41 31 26 00");
    proxy().answer("01 4D", "41 4D 00 3C");
    proxy().answer("01 4E", "41 4E 01 00");
    auto const distance = m_service->fetchDistance(true);
    ASSERT_NE(distance, nullptr);
    EXPECT_TRUE(distance->selectable);
    EXPECT_EQ(distance->uid, 330);
    EXPECT_EQ(distance->unit, UnitKilometre);
    EXPECT_EQ(distance->numeric, nullptr);
    EXPECT_EQ(distance->value->uid, 330);
    EXPECT_EQ(distance->value->value, "100");
    EXPECT_EQ(m_service->fetchDistance(false)->value->value, "9728");
    EXPECT_EQ(m_service->fetchRuntime(true)->value->value, "60");
    EXPECT_EQ(m_service->fetchRuntime(false)->value->value, "256");
    EXPECT_EQ(m_service->fetchRuntime(false)->uid, 780);
}

TEST_F(TroubleCodeService, ADistanceIsInTheUnitsOfTheSettings)
{
    open();
    m_rig.getSettings()->setUnitSystem(obd::UnitSystem::Imperial);
    m_engine->setSupported(ObdMode::CurrentData, {0x21});
    proxy().answer("01 21", "41 21 00 64");
    EXPECT_EQ(m_service->fetchDistance(true)->unit, UnitMile);
    EXPECT_EQ(m_service->fetchDistance(true)->value->value, "62");
}

TEST_F(TroubleCodeService, ADistanceThatIsRefusedIsNull)
{
    open();
    m_engine->setSupported(ObdMode::CurrentData, {0x21});
    proxy().answer("01 21", "7F 01 12");
    EXPECT_EQ(m_service->fetchDistance(true), nullptr);
}

TEST_F(TroubleCodeService, TheCodeOfAFreezeFrameHasItsGenericMeaning)
{
    open();
    proxy().answer("02 02 01", "42 02 01 14 07");
    auto const code = m_service->fetchFreezeFrameTroubleCode(1);
    ASSERT_NE(code, nullptr);
    EXPECT_EQ(code->code, "P1407");
    EXPECT_EQ(code->manufacturer, "Generic");
}

TEST_F(TroubleCodeService, AFrameWithoutACodeHasNone)
{
    open();
    proxy().answer("02 02 00", "42 02 00 00 00");
    EXPECT_EQ(m_service->fetchFreezeFrameTroubleCode(0), nullptr);
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(TroubleCodeService, PidsOfAFrameAreItsSensorsInTheModulesOrder)
{
    open();
    m_engine->setFrame(0, {0x00, 0x02, 0x0D, 0x0C, 0x01, 0x20, 0x21, 0x40, 0x42, 0x60, 0x61, 0xE0, 0x04});
    EXPECT_THAT(m_service->fetchFreezeFramePids(0),
                ElementsAre(pid(0x0D), pid(0x0C), pid(0x21), pid(0x42), pid(0x61), pid(0x04)));
    m_service->fetchFreezeFramePids(0);
    EXPECT_EQ(m_engine->frameDetections(), 1);
}

TEST_F(TroubleCodeService, AFrameWithoutAStoredCodeHasNoPids)
{
    open();
    m_engine->setFrame(1, {0x00, 0x0C, 0x0D});
    EXPECT_THAT(m_service->fetchFreezeFramePids(1), IsEmpty());
}

TEST_F(TroubleCodeService, EachFrameStandsForItself)
{
    open();
    m_engine->setFrame(0, {0x00, 0x0C}).setFrame(2, {0x00, 0x02, 0x0D});
    EXPECT_THAT(m_service->fetchFreezeFramePids(0), IsEmpty());
    EXPECT_THAT(m_service->fetchFreezeFramePids(2), ElementsAre(pid(0x0D)));
}

TEST_F(TroubleCodeService, AFrameThatIsNotDetectedHasNoPids)
{
    open();
    EXPECT_THAT(m_service->fetchFreezeFramePids(3), IsEmpty());
    EXPECT_EQ(m_engine->frameDetections(), 1);
}

TEST_F(TroubleCodeService, FreezeFrameSensorsJoinTheNamesAndTheParameterDoesNot)
{
    obd::FuelTrim::setByteBInUse(true);
    open();
    proxy().answer("02 06 00", "42 06 00 8B 90");
    auto const sensors = m_service->fetchFreezeFrameSensors(0, pid(0x06));
    auto const parameter = m_service->fetchFreezeFrameParameter(0, pid(0x06));
    obd::FuelTrim::setByteBInUse(false);
    EXPECT_THAT(readings(sensors),
                ElementsAre("Short Term Fuel Trim: Bank 1 = 8.6", "Short Term Fuel Trim: Bank 3 = 12.5"));
    ASSERT_NE(parameter, nullptr);
    EXPECT_EQ(parameter->id, 0x06);
    EXPECT_EQ(parameter->name, "Short Term Fuel Trim");
    EXPECT_THAT(readings(parameter->sensors), ElementsAre("Bank 1 = 8.6", "Bank 3 = 12.5"));
    EXPECT_EQ(parameter->sensors[1]->uid, 61);
    EXPECT_TRUE(parameter->sensors[1]->selectable);
    EXPECT_EQ(parameter->sensors[1]->unit, UnitPercent);
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(TroubleCodeService, ASingleSensorBearsTheParametersName)
{
    open();
    proxy().answer("02 0C 02", "42 0C 02 1A F8");
    auto const sensors = m_service->fetchFreezeFrameSensors(2, pid(0x0C));
    auto const parameter = m_service->fetchFreezeFrameParameter(2, pid(0x0C));
    ASSERT_EQ(sensors.size(), 1U);
    EXPECT_EQ(sensors[0]->name, parameter->name);
    EXPECT_EQ(sensors[0]->value->value, "1726");
    EXPECT_FALSE(sensors[0]->selectable);
    EXPECT_FALSE(parameter->sensors[0]->selectable);
    EXPECT_EQ(sensors[0]->numeric, nullptr);
}

TEST_F(TroubleCodeService, ASensorWithoutAReadingStaysWithoutAValue)
{
    open();
    proxy().answer("02 06 00", "42 06 00 8B");
    EXPECT_THAT(
        readings(m_service->fetchFreezeFrameSensors(0, pid(0x06))),
        ElementsAre("Short Term Fuel Trim - Bank 1: Bank 1 = 8.6", "Short Term Fuel Trim - Bank 1: Bank 3 = -"));
    EXPECT_THAT(m_log.lines(), IsEmpty());
    auto const parameter = m_service->fetchFreezeFrameParameter(0, pid(0x06));
    ASSERT_NE(parameter, nullptr);
    EXPECT_THAT(readings(parameter->sensors), ElementsAre("Bank 1 = 8.6", "Bank 3 = -"));
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR No value for 1 (Short Term Fuel Trim - Bank 1)"));
}

TEST_F(TroubleCodeService, AnIdWithoutAParameterIsToldByTheParameterOnly)
{
    open();
    EXPECT_THAT(m_service->fetchFreezeFrameSensors(0, pid(0x20)), IsEmpty());
    EXPECT_THAT(m_log.lines(), IsEmpty());
    EXPECT_EQ(m_service->fetchFreezeFrameParameter(0, pid(0x20)), nullptr);
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR No such parameter (32)"));
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(TroubleCodeService, AFrameThatDoesNotAnswerGivesNoSensors)
{
    open();
    EXPECT_THAT(m_service->fetchFreezeFrameSensors(0, pid(0x0C)), IsEmpty());
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Fetch done with failure"));
    m_log.clear();
    EXPECT_EQ(m_service->fetchFreezeFrameParameter(0, pid(0x0C)), nullptr);
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Fetch done with failure", "ERROR Failed to update parameter (12)"));
}

TEST_F(TroubleCodeService, ClearingForgetsTheFramesOfTheCurrentModule)
{
    open();
    m_engine->setFrame(0, {0x00, 0x02, 0x0C});
    m_service->fetchFreezeFramePids(0);
    proxy().answer("04", {{0x7E8, "44"}, {0x7E9, "44"}});
    EXPECT_TRUE(m_service->resetCodes());
    m_service->fetchFreezeFramePids(0);
    EXPECT_EQ(m_engine->frameDetections(), 2);
}

TEST_F(TroubleCodeService, ClearingThatOneModuleRefusesIsFalseThoughTheFetchSucceeded)
{
    open();
    m_engine->setFrame(0, {0x00, 0x02, 0x0C});
    m_service->fetchFreezeFramePids(0);
    proxy().answer("04", {{0x7E8, "7F 04 22"}, {0x7E9, "44"}});
    EXPECT_FALSE(m_service->resetCodes());
    EXPECT_TRUE(m_log.contains("ERROR invalid ECU id 2024"));
    EXPECT_FALSE(m_log.contains("ERROR Fetch done with failure"));
    m_service->fetchFreezeFramePids(0);
    EXPECT_EQ(m_engine->frameDetections(), 2);
}

TEST_F(TroubleCodeService, ClearingThatAllRefuseKeepsTheFrames)
{
    open();
    m_engine->setFrame(0, {0x00, 0x02, 0x0C});
    m_service->fetchFreezeFramePids(0);
    proxy().answer("04", "7F 04 22");
    EXPECT_FALSE(m_service->resetCodes());
    EXPECT_TRUE(m_log.contains("ERROR Fetch done with failure"));
    m_service->fetchFreezeFramePids(0);
    EXPECT_EQ(m_engine->frameDetections(), 1);
}

} // namespace
