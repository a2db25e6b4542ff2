#include <obd/sensordatamodels.h>

#include <gtest/gtest.h>

namespace {

using obd::SensorDataModel;
using obd::SensorValueDataModel;

TEST(SensorValueDataModel, HasNoStatisticsForATextualSensor)
{
    SensorValueDataModel const model(280, "EOBD");
    EXPECT_EQ(model.uid, 280);
    EXPECT_EQ(model.value, "EOBD");
    EXPECT_EQ(model.minimum, "");
    EXPECT_EQ(model.maximum, "");
    EXPECT_EQ(model.mean, "");
}

TEST(SensorValueDataModel, CarriesTheStatisticsInTheirPlaces)
{
    SensorValueDataModel const model(120, "850", "800", "900", "840");
    EXPECT_EQ(model.uid, 120);
    EXPECT_EQ(model.value, "850");
    EXPECT_EQ(model.minimum, "800");
    EXPECT_EQ(model.maximum, "900");
    EXPECT_EQ(model.mean, "840");
}

TEST(SensorDataModel, StandsWithAndWithoutAReading)
{
    auto const range = std::make_shared<SensorDataModel::Numeric>(SensorDataModel::Numeric{-40, 215});
    auto const reading = std::make_shared<SensorValueDataModel>(50, "90");
    SensorDataModel const without(true, 50, "Engine Coolant Temperature", UnitCelsius, range);
    EXPECT_TRUE(without.selectable);
    EXPECT_EQ(without.value, nullptr);
    EXPECT_EQ(without.numeric->minimum, -40);
    EXPECT_EQ(without.numeric->maximum, 215);

    SensorDataModel const with(false, 50, "Engine Coolant Temperature", UnitCelsius, reading, range);
    EXPECT_FALSE(with.selectable);
    EXPECT_EQ(with.uid, 50);
    EXPECT_EQ(with.name, "Engine Coolant Temperature");
    EXPECT_EQ(with.unit, UnitCelsius);
    EXPECT_EQ(with.value, reading);
    EXPECT_EQ(with.numeric, range);
}

TEST(ParameterDataModel, HoldsItsSensors)
{
    auto const sensor = std::make_shared<SensorDataModel>(true, 120, "Engine RPM", UnitRpm, nullptr);
    obd::ParameterDataModel const model(obd::ParameterIdentifier::Id(0x0C), "Engine RPM", {sensor});
    obd::ParameterDataModel const copy(model);
    EXPECT_EQ(copy.id, 0x0C);
    EXPECT_EQ(copy.name, "Engine RPM");
    ASSERT_EQ(copy.sensors.size(), 1u);
    EXPECT_EQ(copy.sensors[0], sensor);
}

} // namespace
