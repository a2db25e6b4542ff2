#include "tests/support/servicetest.h"

#include <obd/iecuservice.h>
#include <obd/ivelmorasettings.h>

#include <gmock/gmock.h>

#include <algorithm>

namespace {

using obd::ObdMode;
using testing::ElementsAre;
using testing::IsEmpty;
using Lines = std::vector<std::string>;
using ParameterModels = std::vector<std::shared_ptr<obd::ParameterDataModel>>;

class EcuService : public support::ServiceTest
{
protected:
    EcuService() { m_engine->setStandardDescription("EOBD"); }

    void supportEverything()
    {
        m_engine->setSupported(ObdMode::VehicleInformation, {0x02, 0x04, 0x06, 0x0D, 0x0F})
            .setSupported(ObdMode::CurrentData, {0x0C});
    }

    // Asks everything; each operation has to give nothing, without a word and without a request.
    void expectNothing()
    {
        m_log.clear();
        EXPECT_THAT(m_service->supportedParameters(), IsEmpty());
        EXPECT_FALSE(m_service->isParameterSupported(model(0x0C)));
        EXPECT_EQ(m_service->standardDescription(), "");
        EXPECT_EQ(m_service->protocolDescription(), "");
        EXPECT_EQ(m_service->ecuName(), "");
        EXPECT_EQ(m_service->ecuDescription(), "");
        expectNoItems();
        EXPECT_THAT(m_log.lines(), IsEmpty());
        EXPECT_EQ(proxy().count(), 0);
    }

    void expectNoItems()
    {
        EXPECT_FALSE(m_service->hasVehicleIdentificationNumber());
        EXPECT_FALSE(m_service->hasCalibrationIds());
        EXPECT_FALSE(m_service->hasVerificationNumbers());
        EXPECT_FALSE(m_service->hasEngineSerialNumber());
        EXPECT_FALSE(m_service->hasErotan());
        expectNothingFetched();
    }

    void expectNothingFetched()
    {
        EXPECT_EQ(m_service->fetchVehicleIdentificationNumber(), "");
        EXPECT_THAT(m_service->fetchCalibrationIds(), IsEmpty());
        EXPECT_THAT(m_service->fetchVerificationNumbers(), IsEmpty());
        EXPECT_EQ(m_service->fetchEngineSerialNumber(), "");
        EXPECT_EQ(m_service->fetchErotan(), "");
    }

    static std::shared_ptr<obd::ParameterDataModel> model(int id)
    {
        return std::make_shared<obd::ParameterDataModel>(obd::ParameterIdentifier(id).id(), "",
                                                         std::vector<std::shared_ptr<obd::SensorDataModel>>());
    }

    std::shared_ptr<obd::IEcuService> m_service = obd::EcuServiceBuilder::createEcuService();
};

std::vector<int> ids(ParameterModels const& models)
{
    std::vector<int> all;
    for (auto const& model : models) {
        all.push_back(model->id);
    }
    return all;
}

// Null if there is none.
std::shared_ptr<obd::ParameterDataModel> find(ParameterModels const& models, int id)
{
    auto const found = std::find_if(models.begin(), models.end(), [id](auto const& model) { return model->id == id; });
    return found != models.end() ? *found : nullptr;
}

TEST_F(EcuService, FetchVehicleIdentificationNumberOnADisconnectedServiceReturnsTheEmptyStringAtOnce)
{
    EXPECT_EQ(m_service->fetchVehicleIdentificationNumber(), "");
    EXPECT_THAT(m_log.lines(), IsEmpty());
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(EcuService, WithoutAConnectionThereIsNothing)
{
    supportEverything();
    expectNothing();
    open();
    m_rig.close();
    expectNothing();
}

TEST_F(EcuService, FromTheClosingOnNothingIsAskedThoughThereStillIsAModule)
{
    supportEverything();
    open();
    support::tellClosed(*m_service);
    expectNothingFetched();
    EXPECT_THAT(m_log.lines(), IsEmpty());
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(EcuService, WithoutASelectedModuleThereIsNothing)
{
    supportEverything();
    open();
    m_rig.getEcuManager()->setCurrentEcu(0x123);
    expectNothing();
}

TEST_F(EcuService, EachCallOfTheBuilderGivesANewService)
{
    EXPECT_NE(obd::EcuServiceBuilder::createEcuService(), m_service);
}

TEST_F(EcuService, TellsWhatIsKnownOfTheModule)
{
    open();
    EXPECT_EQ(m_service->standardDescription(), "EOBD");
    EXPECT_EQ(m_service->protocolDescription(), "ISO 15765-4 (CAN 11/500)");
    EXPECT_EQ(m_service->ecuName(), "ECM");
    EXPECT_EQ(m_service->ecuDescription(), "Engine Control");
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(EcuService, HasErotanIsFalseAndNoRequestIsSentOnAnEcuWithoutInfoType0F)
{
    m_engine->setSupported(ObdMode::VehicleInformation, {0x02, 0x0E});
    open();
    EXPECT_FALSE(m_service->hasErotan());
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(EcuService, EachItemHasItsInfoType)
{
    open();
    for (int id = 0; id < 256; ++id) {
        m_engine->setSupported(ObdMode::VehicleInformation, {static_cast<unsigned char>(id)});
        EXPECT_EQ(m_service->hasVehicleIdentificationNumber(), id == 0x02);
        EXPECT_EQ(m_service->hasCalibrationIds(), id == 0x04);
        EXPECT_EQ(m_service->hasVerificationNumbers(), id == 0x06);
        EXPECT_EQ(m_service->hasEngineSerialNumber(), id == 0x0D);
        EXPECT_EQ(m_service->hasErotan(), id == 0x0F);
    }
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(EcuService, TheItemsAreReadFromTheVehicle)
{
    open();
    proxy().answer("09 02", "49 02 01 31 47 31 4A 43 35 34 34 34 52 37 32 35 32 33 36 37");
    proxy().answer("09 04", "49 04 02 43 41 4C 2D 31 00 00 00 00 00 00 00 00 00 00 00"
                            "43 41 4C 2D 32 00 00 00 00 00 00 00 00 00 00 00");
    proxy().answer("09 06", "49 06 02 17 91 BC 82 16 E0 62 BE");
    EXPECT_EQ(m_service->fetchVehicleIdentificationNumber(), "1G1JC5444R7252367");
    EXPECT_THAT(m_service->fetchCalibrationIds(), ElementsAre("CAL-1", "CAL-2"));
    EXPECT_THAT(m_service->fetchVerificationNumbers(), ElementsAre("1791BC82", "16E062BE"));
    EXPECT_THAT(m_log.lines(), testing::Each(testing::StartsWith("INFO ")));
}

TEST_F(EcuService, EngineSerialNumberAndTypeApprovalHaveRequestsOfTheirOwn)
{
    open();
    proxy().answer("09 0D", "49 0D 01 31 32 33 34 35 36 37 38 39 30 41 42 43 44 45 46 47");
    EXPECT_EQ(m_service->fetchEngineSerialNumber(), "1234567890ABCDEFG");
    EXPECT_EQ(m_service->fetchErotan(), "");
    EXPECT_EQ(proxy().count("09 0D"), 1);
    EXPECT_EQ(proxy().count("09 0F"), 1);
    proxy().answer("09 0F", "49 0F 01 45 34 2D 31 32 33 34 35 36 37 38 39 30 41 42 43 44");
    EXPECT_EQ(m_service->fetchErotan(), "E4-1234567890ABCD");
}

TEST_F(EcuService, AFailedFetchGivesNothingAndIsLogged)
{
    open();
    expectNothingFetched();
    EXPECT_EQ(m_log.lines(), Lines(5, "ERROR Fetch done with failure"));
}

TEST_F(EcuService, SupportedParametersHoldsAnEntryForAPidThatTheEcuDoesNotSupport)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x0C});
    open();
    auto const all = m_service->supportedParameters();
    ASSERT_NE(find(all, 0x0C), nullptr);
    EXPECT_TRUE(m_service->isParameterSupported(find(all, 0x0C)));
    ASSERT_NE(find(all, 0x0D), nullptr);
    EXPECT_FALSE(m_service->isParameterSupported(find(all, 0x0D)));
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(EcuService, NoParameterOrOneOutsideTheRangeOfPidsIsNotSupported)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x0C});
    open();
    EXPECT_FALSE(m_service->isParameterSupported(nullptr));
    EXPECT_FALSE(m_service->isParameterSupported(model(0x10C)));
    EXPECT_FALSE(m_service->isParameterSupported(model(-0xF4)));
}

TEST_F(EcuService, ParametersRiseByPidAndThoseOfTheLibraryFollow)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x0D, 0x10, 0x44});
    open();
    std::vector<int> const all = ids(m_service->supportedParameters());
    ASSERT_EQ(all.size(), 1 + 119 + 5U); // readiness, those with a class, those of the library
    EXPECT_EQ(all.front(), 0x01);
    EXPECT_TRUE(std::is_sorted(all.begin(), all.end()));
    EXPECT_EQ(std::vector<int>(all.end() - 6, all.end()), (std::vector<int>{0x7F, 0xF0, 0xF4, 0xF5, 0xF6, 0xF7}));
    EXPECT_THAT(m_log.lines(), testing::Each(testing::StartsWith("INFO ")));
}

TEST_F(EcuService, WithoutAModelOfTheConsumptionItIsLeftOut)
{
    open();
    std::vector<int> const all = ids(m_service->supportedParameters());
    EXPECT_THAT(std::vector<int>(all.end() - 5, all.end()), ElementsAre(0x7F, 0xF4, 0xF5, 0xF6, 0xF7));
}

TEST_F(EcuService, SensorsCarryNamesUnitsAndRanges)
{
    open();
    auto const all = m_service->supportedParameters();
    auto const speed = find(all, 0x0D);
    ASSERT_NE(speed, nullptr);
    ASSERT_EQ(speed->sensors.size(), 1U);
    EXPECT_EQ(speed->sensors[0]->name, speed->name);
    EXPECT_EQ(speed->sensors[0]->uid, 0x0D * 10);
    EXPECT_FALSE(speed->sensors[0]->selectable);
    EXPECT_EQ(speed->sensors[0]->unit, UnitKmPerHour);
    ASSERT_NE(speed->sensors[0]->numeric, nullptr);
    EXPECT_EQ(speed->sensors[0]->numeric->minimum, 0);
    EXPECT_EQ(speed->sensors[0]->numeric->maximum, 255);
    EXPECT_EQ(speed->sensors[0]->value, nullptr);

    auto const fuelSystem = find(all, 0x03);
    ASSERT_NE(fuelSystem, nullptr);
    ASSERT_EQ(fuelSystem->sensors.size(), 2U);
    EXPECT_THAT(fuelSystem->sensors[1]->name, testing::StartsWith(fuelSystem->name + ": "));
    EXPECT_EQ(fuelSystem->sensors[1]->uid, 31);
    EXPECT_TRUE(fuelSystem->sensors[1]->selectable);
    EXPECT_EQ(fuelSystem->sensors[1]->numeric, nullptr) << "a textual sensor";
}

TEST_F(EcuService, UnitsAreThoseOfTheSettings)
{
    open();
    m_rig.getSettings()->setUnitSystem(obd::UnitSystem::Imperial);
    auto const speed = find(m_service->supportedParameters(), 0x0D);
    ASSERT_NE(speed, nullptr);
    EXPECT_EQ(speed->sensors[0]->unit, UnitMilesPerHour);
}

} // namespace
