#include "tests/support/servicetest.h"

#include <obd/iroutineservice.h>

#include <gmock/gmock.h>

namespace {

using obd::ObdMode;
using testing::ElementsAre;
using testing::IsEmpty;
using Lines = std::vector<std::string>;

class RoutineService : public support::ServiceTest
{
protected:
    std::shared_ptr<obd::IRoutineService> m_service = obd::RoutineServiceBuilder::createRoutineService();
};

void expectModel(std::shared_ptr<obd::TestRoutineDataModel> const& model, int id, int status,
                 std::string const& message, std::string const& name)
{
    ASSERT_NE(model, nullptr);
    EXPECT_EQ(model->id, id);
    EXPECT_EQ(model->status, status);
    EXPECT_EQ(model->message, message);
    EXPECT_EQ(model->name, name);
}

TEST_F(RoutineService, WithoutAConnectionThereIsNothingAndNoRequest)
{
    m_engine->setSupported(ObdMode::SystemControl, {0x01});
    EXPECT_THAT(m_service->getRoutines(), IsEmpty());
    EXPECT_EQ(m_service->runRoutine(1), nullptr);
    open();
    m_rig.close();
    m_log.clear();
    EXPECT_THAT(m_service->getRoutines(), IsEmpty());
    EXPECT_EQ(m_service->runRoutine(1), nullptr);
    EXPECT_EQ(proxy().count(), 0);
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(RoutineService, FromTheClosingOnNothingIsAskedThoughThereStillIsAModule)
{
    m_engine->setSupported(ObdMode::SystemControl, {0x01});
    open();
    support::tellClosed(*m_service);
    EXPECT_THAT(m_service->getRoutines(), IsEmpty());
    EXPECT_EQ(m_service->runRoutine(1), nullptr);
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(RoutineService, WithoutASelectedModuleThereIsNothing)
{
    m_engine->setSupported(ObdMode::SystemControl, {0x01});
    open();
    m_rig.getEcuManager()->setCurrentEcu(0x123);
    EXPECT_THAT(m_service->getRoutines(), IsEmpty());
    EXPECT_EQ(m_service->runRoutine(1), nullptr);
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(RoutineService, EachCallOfTheBuilderGivesANewService)
{
    EXPECT_NE(obd::RoutineServiceBuilder::createRoutineService(), m_service);
}

TEST_F(RoutineService, AnEcuThatReportsIds01And09ListsOnlyRoutine1)
{
    m_engine->setSupported(ObdMode::SystemControl, {0x01, 0x09});
    open();
    auto const routines = m_service->getRoutines();
    ASSERT_EQ(routines.size(), 1U);
    expectModel(routines[0], 1, 2, "", "Evaporative system leak test");
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(RoutineService, Id00IsNeverInTheList)
{
    m_engine->setSupported(ObdMode::SystemControl, {0x00, 0x20});
    open();
    EXPECT_THAT(m_service->getRoutines(), IsEmpty());
}

TEST_F(RoutineService, RoutinesComeInTheEcusOrderWithTheirTexts)
{
    m_engine->setSupported(ObdMode::SystemControl, {0x03, 0x00, 0x01, 0x02, 0x04});
    open();
    auto const routines = m_service->getRoutines();
    ASSERT_EQ(routines.size(), 3U);
    expectModel(routines[0], 3, 2, "", "Inducement System Reinitialization");
    EXPECT_EQ(routines[0]->description,
              "This service requests the vehicle to initiate a reinitialize the inducement system. The vehicle "
              "manufacturer is responsible to determine the criteria to enable, start and stop the test.");
    expectModel(routines[1], 1, 2, "", "Evaporative system leak test");
    EXPECT_EQ(routines[1]->description,
              "This service enables the conditions required to conduct an evaporative system leak test, but does not "
              "actually run the test. The vehicle manufacturer is responsible to determine the criteria to "
              "automatically stop the test.");
    expectModel(routines[2], 2, 2, "", "Particulate Filter Regeneration");
    EXPECT_EQ(routines[2]->description,
              "This service requests the vehicle to initiate a PF regeneration. The vehicle manufacturer is "
              "responsible to determine the criteria to enable, start and stop the test.");
}

TEST_F(RoutineService, AnAcceptedRoutineKeepsNameAndDescription)
{
    open();
    proxy().answer("08 01", "48 01");
    auto const model = m_service->runRoutine(1);
    expectModel(model, 1, 0, "", "Evaporative system leak test");
    EXPECT_THAT(model->description, testing::StartsWith("This service enables"));
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(RoutineService, RunRoutine7GoesToTheVehicleAllTheSameAndTheModelCarriesTheNameNA)
{
    open();
    proxy().answer("08 07", "48 07");
    auto const model = m_service->runRoutine(7);
    expectModel(model, 7, 0, "", "NA");
    EXPECT_EQ(model->description, "");
    EXPECT_EQ(proxy().count("08 07"), 1);
}

TEST_F(RoutineService, IdsAreBytes)
{
    open();
    expectModel(m_service->runRoutine(0xFF), 255, 2, "", "NA");
    EXPECT_EQ(proxy().count("08 FF"), 1);
}

TEST_F(RoutineService, ANegativeResponseOfCode21GivesStatus1WithTheMessageBusy)
{
    open();
    proxy().answer("08 02", "7F 08 21");
    expectModel(m_service->runRoutine(2), 2, 1, "Busy", "Particulate Filter Regeneration");
}

TEST_F(RoutineService, EveryOtherResponseCodeIsARefusalWithItsTextToo)
{
    open();
    proxy().answer("08 02", "7F 08 22");
    expectModel(m_service->runRoutine(2), 2, 1, "Conditions not correct", "Particulate Filter Regeneration");
    proxy().answer("08 02", "7F 08 31");
    expectModel(m_service->runRoutine(2), 2, 1, "Unknown", "Particulate Filter Regeneration");
    proxy().answer("08 02", "7F 08"); // without its code
    expectModel(m_service->runRoutine(2), 2, 1, "Unknown", "Particulate Filter Regeneration");
}

TEST_F(RoutineService, ASilentVehicleGivesStatus2)
{
    open();
    expectModel(m_service->runRoutine(3), 3, 2, "", "Inducement System Reinitialization");
    EXPECT_EQ(m_log.lines(), Lines{"ERROR Fetch done with failure"});
}

TEST_F(RoutineService, OnTheOlderBusesTheRequestIsFilledUpAndTheReplyTellsAcceptance)
{
    m_engine->setProtocol(obd::ObdProtocolIso9141);
    open();
    proxy().answer("08 01 00 00 00 00 00", "48 01 00 00 00 00 00");
    expectModel(m_service->runRoutine(1), 1, 0, "", "Evaporative system leak test");
}

TEST_F(RoutineService, ARefusalInAPositiveReplyHasTheTextOfCode0)
{
    m_engine->setProtocol(obd::ObdProtocolIso9141);
    open();
    proxy().answer("08 01 00 00 00 00 00", "48 01 01 00 00 00 00");
    expectModel(m_service->runRoutine(1), 1, 1, "Acknowledged", "Evaporative system leak test");
}

TEST_F(RoutineService, AnAcceptanceOfAnotherModuleIsNoAnswer)
{
    proxy().addEcu(std::make_shared<support::FakeEcu>(0x7E9U));
    open();
    proxy().answer("08 01", {{0x7E9, "48 01"}});
    expectModel(m_service->runRoutine(1), 1, 2, "", "Evaporative system leak test");
}

} // namespace
