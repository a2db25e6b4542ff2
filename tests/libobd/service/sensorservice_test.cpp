#include "tests/libobd/service/sensorservicefixture.h"

#include <obd/sensordatamodels.h>

namespace {

using support::pid;
using testing::ElementsAre;
using testing::IsEmpty;

class SensorService : public support::SensorServiceFixture
{
protected:
    std::vector<int> descriptorIds() const
    {
        std::vector<int> ids;
        for (auto const& descriptor : service->getDescriptors()) {
            ids.push_back(descriptor->pid());
        }
        return ids;
    }
};

TEST_F(SensorService, IsEmptyWithoutAConnection)
{
    EXPECT_FALSE(service->isConnected());
    EXPECT_THAT(service->getDescriptors(), IsEmpty());
    EXPECT_THAT(service->getSupportedIds(), IsEmpty());
    EXPECT_FALSE(service->isSupported(pid(0x0C)));
    EXPECT_EQ(service->getParameter(pid(0x0C)), nullptr);
    EXPECT_THAT(service->fetchSensors(pid(0x0C)), IsEmpty());
    service->startUpdates({pid(0x0C)});
    service->reset();
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(SensorService, FillsOnAConnectionWithoutANotification)
{
    open();
    EXPECT_TRUE(service->isConnected());
    EXPECT_THAT(descriptorIds(), ElementsAre(0x05, 0x06, 0x0C, 0x0D, 0x0F, 0x1C, 0x21, 0xF4, 0xF5, 0xF6));
    EXPECT_EQ(recorder.invalidated, 0);
}

TEST_F(SensorService, BuiltOnALiveConnectionIsFull)
{
    open();
    auto const late = obd::SensorServiceBuilder::createSensorService();
    EXPECT_TRUE(late->isConnected());
    EXPECT_EQ(late->getDescriptors().size(), service->getDescriptors().size());
}

TEST_F(SensorService, ClosingEmptiesIt)
{
    open();
    rig.close();
    EXPECT_FALSE(service->isConnected());
    EXPECT_THAT(service->getDescriptors(), IsEmpty());
}

TEST_F(SensorService, BuildsItsParametersWithoutAWordInTheLog)
{
    rig.open();
    for (std::string const& line : log.lines()) {
        EXPECT_EQ(line.find("ERROR"), std::string::npos) << line;
    }
}

TEST_F(SensorService, AnEcuWithoutFuelPidsHasNoConsumptionParameterButBatteryVoltageEnginePowerAndTorque)
{
    engine->setSupported(obd::ObdMode::CurrentData, {0x00, 0x05});
    open();
    EXPECT_THAT(descriptorIds(), ElementsAre(0x05, 0xF4, 0xF5, 0xF6));
}

TEST_F(SensorService, AnEcuWithAirFlowAndSpeedHasAConsumptionParameter)
{
    engine->setSupported(obd::ObdMode::CurrentData, {0x0D, 0x10});
    open();
    EXPECT_THAT(descriptorIds(), ElementsAre(0x0D, 0x10, 0xF0, 0xF4, 0xF5, 0xF6));
}

TEST_F(SensorService, TheUsersFuelTypeStandsInForTheVehicles)
{
    engine->setSupported(obd::ObdMode::CurrentData, {0x0D, 0x10}); // enough for gasoline; diesel needs the load
    settings().setIgnitionType(obd::IgnitionType::Compression);
    open();
    EXPECT_THAT(descriptorIds(), testing::Contains(0xF0));
    settings().setFuelTypeOverride(true);
    EXPECT_THAT(descriptorIds(), testing::Not(testing::Contains(0xF0)));
}

TEST_F(SensorService, AnEcuWithManifoldPressureHasABoostParameter)
{
    engine->setSupported(obd::ObdMode::CurrentData, {0x0B});
    open();
    EXPECT_THAT(descriptorIds(), ElementsAre(0x0B, 0xF4, 0xF5, 0xF6, 0xF7));
}

TEST_F(SensorService, SupportedIdsLeaveOutMasksReadinessAndTheFreezeFrameCode)
{
    open();
    EXPECT_THAT(service->getSupportedIds(),
                ElementsAre(pid(0x05), pid(0x06), pid(0x0C), pid(0x0D), pid(0x0F), pid(0x1C), pid(0x21)));
}

TEST_F(SensorService, AsksTheModuleWhatItSupports)
{
    open();
    EXPECT_TRUE(service->isSupported(pid(0x0C)));
    EXPECT_FALSE(service->isSupported(pid(0x0B)));
    EXPECT_FALSE(service->isSupported(pid(0xF5)));
    EXPECT_FALSE(service->isSupported(pid(0x10C)));
    EXPECT_FALSE(service->isSupported(pid(-1)));
}

TEST_F(SensorService, DescribesAParameterWithoutARequest)
{
    open();
    auto const model = service->getParameter(pid(0x05));
    ASSERT_NE(model, nullptr);
    EXPECT_EQ(model->id, 0x05);
    EXPECT_EQ(model->name, "Engine Coolant Temperature");
    ASSERT_EQ(model->sensors.size(), 1U);
    obd::SensorDataModel const& sensor = *model->sensors[0];
    EXPECT_FALSE(sensor.selectable);
    EXPECT_EQ(sensor.uid, 50);
    EXPECT_EQ(sensor.name, "Engine Coolant Temperature");
    EXPECT_EQ(sensor.unit, UnitCelsius);
    ASSERT_NE(sensor.numeric, nullptr);
    EXPECT_EQ(sensor.numeric->minimum, -40);
    EXPECT_EQ(sensor.numeric->maximum, 215);
    EXPECT_EQ(sensor.value, nullptr);
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(SensorService, DescribesInTheUnitSystem)
{
    settings().setUnitSystem(obd::UnitSystem::Imperial);
    open();
    auto const model = service->getParameter(pid(0x05));
    EXPECT_EQ(model->sensors.at(0)->unit, UnitFahrenheit);
    EXPECT_EQ(model->sensors.at(0)->numeric->maximum, 419);
}

TEST_F(SensorService, NamesTheSensorsOfAParameterWithSeveralBehindItsOwnName)
{
    open();
    auto const model = service->getParameter(pid(0x06));
    EXPECT_EQ(model->name, "Short Term Fuel Trim - Bank 1");
    ASSERT_EQ(model->sensors.size(), 2U);
    EXPECT_EQ(model->sensors[0]->name, "Short Term Fuel Trim - Bank 1: Bank 1");
    EXPECT_EQ(model->sensors[1]->name, "Short Term Fuel Trim - Bank 1: Bank 3");
    EXPECT_TRUE(model->sensors[0]->selectable);
    EXPECT_EQ(model->sensors[0]->numeric->minimum, -100);
    EXPECT_EQ(model->sensors[0]->numeric->maximum, 100);
}

TEST_F(SensorService, TellsThatThereIsNoSuchParameter)
{
    open();
    EXPECT_EQ(service->getParameter(pid(0x20)), nullptr);
    EXPECT_THAT(log.lines(), ElementsAre("ERROR No such parameter (32)"));
}

TEST_F(SensorService, MakesPowerAndTorqueWithTheVehiclesWeight)
{
    open();
    EXPECT_NE(service->getParameter(pid(0xF5)), nullptr);
    EXPECT_NE(service->getParameter(pid(0xF6)), nullptr);
    EXPECT_THAT(log.lines(), IsEmpty());
}

TEST_F(SensorService, FetchesOnce)
{
    open();
    auto const sensors = service->fetchSensors(pid(0x0C));
    ASSERT_EQ(sensors.size(), 1U);
    EXPECT_EQ(sensors[0]->name, "Engine RPM");
    EXPECT_FALSE(sensors[0]->selectable);
    ASSERT_NE(sensors[0]->value, nullptr);
    EXPECT_EQ(sensors[0]->value->value, "1726");
    EXPECT_EQ(sensors[0]->value->mean, "1726");
    EXPECT_EQ(proxy().count(), 1);
}

TEST_F(SensorService, FetchesGoIntoTheStatistics)
{
    open();
    service->fetchSensors(pid(0x0C));
    proxy().answer("01 0C", "41 0C 1F 40"); // 2000 rpm
    auto const sensors = service->fetchSensors(pid(0x0C));
    EXPECT_EQ(sensors.at(0)->value->minimum, "1726");
    EXPECT_EQ(sensors.at(0)->value->maximum, "2000");
    EXPECT_EQ(sensors.at(0)->value->mean, "1863");
}

TEST_F(SensorService, AFetchThatFailsIsEmpty)
{
    open();
    EXPECT_THAT(service->fetchSensors(pid(0x0F)), IsEmpty()); // no response
    EXPECT_THAT(service->fetchSensors(pid(0x20)), IsEmpty()); // no parameter
}

TEST_F(SensorService, TellsWhichSensorOfAParameterHasNoValue)
{
    open();
    auto const sensors = service->fetchSensors(pid(0x06));
    ASSERT_EQ(sensors.size(), 2U);
    EXPECT_EQ(sensors[0]->value->value, "0.0");
    EXPECT_EQ(sensors[1]->value, nullptr);
    EXPECT_THAT(log.lines(), ElementsAre("ERROR No value for 1 (Short Term Fuel Trim - Bank 1)"));
}

TEST_F(SensorService, AFetchOfWhatTheModuleDoesNotReportHasNoStatistics)
{
    open();
    proxy().answer("01 11", "41 11 33");
    auto const sensors = service->fetchSensors(pid(0x11));
    ASSERT_EQ(sensors.size(), 1U);
    EXPECT_EQ(sensors[0]->value->uid, 170);
    EXPECT_EQ(sensors[0]->value->value, "20.0");
    EXPECT_EQ(sensors[0]->value->minimum, "");
}

TEST_F(SensorService, GivesNumbersBesideTheTexts)
{
    open();
    auto const speed = service->fetchSensors(pid(0x0C)).at(0)->value;
    EXPECT_EQ(speed->number, 1726.0);
    ASSERT_TRUE(speed->statistics);
    EXPECT_EQ(speed->statistics->mean, 1726.0);

    proxy().answer("01 11", "41 11 34");
    auto const throttle = service->fetchSensors(pid(0x11)).at(0)->value; // of no set, so without statistics
    EXPECT_EQ(throttle->value, "20.4");
    EXPECT_DOUBLE_EQ(throttle->number.value(), 52 * 100.0 / 255);
    EXPECT_FALSE(throttle->statistics);

    proxy().answer("01 21", "41 21 01 02"); // digits, and a state in words
    EXPECT_EQ(service->fetchSensors(pid(0x21)).at(0)->value->number, 258.0);
    proxy().answer("01 1C", "41 1C 06");
    EXPECT_EQ(service->fetchSensors(pid(0x1C)).at(0)->value->number, std::nullopt);
}

TEST_F(SensorService, AFetchMayRunBesideTheCycleOnAThreadOfItsOwn)
{
    open();
    service->startUpdates({pid(0x0D)});
    std::atomic<bool> done{false};
    std::size_t fetched = 0;
    std::thread fetching([&] {
        for (int i = 0; i < 5; ++i) {
            fetched += service->fetchSensors(pid(0x0C)).size();
        }
        done = true;
    });
    EXPECT_TRUE(loop().runUntil([&] { return done.load(); }));
    fetching.join();
    EXPECT_EQ(fetched, 5U);
    EXPECT_EQ(proxy().mostAtOnce(), 1);
}

} // namespace
