#include "libobd/service/sensormodels.h"

#include <obd/sensorinfo.h>

#include <gtest/gtest.h>

namespace {

using Values = std::vector<std::shared_ptr<obd::SensorValue>>;

std::shared_ptr<obd::SensorValue> value(int uid, std::string const& text)
{
    return std::make_shared<obd::TextualSensorValue>(uid, text);
}

TEST(SensorModels, FourSensorsAreNotSelectable)
{
    for (int pid = 0; pid <= 0xFF; ++pid) {
        bool const alwaysShown = pid == 0x05 || pid == 0x0C || pid == 0x0D || pid == 0x0F;
        EXPECT_EQ(obd::isSelectable(obd::Pid2Uid(pid)), !alwaysShown) << pid;
    }
}

TEST(SensorModels, AModelTellsTheSensorUnderTheGivenName)
{
    auto const info = std::make_shared<obd::SensorInfo>(130, "Speed", true);
    info->add(obd::UnitSystem::Imperial, UnitMilesPerHour, 0.0, 158.0);
    obd::SensorDescriptor const sensor(info, obd::UnitSystem::Imperial);
    auto const model = obd::makeSensorModel(sensor, "Vehicle: Speed", value(130, "55"));
    EXPECT_FALSE(model->selectable);
    EXPECT_EQ(model->uid, 130);
    EXPECT_EQ(model->name, "Vehicle: Speed");
    EXPECT_EQ(model->unit, UnitMilesPerHour);
    EXPECT_EQ(model->numeric, nullptr);
    EXPECT_EQ(model->value->uid, 130);
    EXPECT_EQ(model->value->value, "55");
    EXPECT_EQ(model->value->mean, "");
}

TEST(SensorModels, AModelCanBeWithoutAReading)
{
    auto const info = std::make_shared<obd::SensorInfo>(200, "State", false);
    EXPECT_EQ(obd::makeSensorModel({info, obd::UnitSystem::Metric}, "State", nullptr)->value, nullptr);
}

TEST(SensorModels, AValueIsFoundByItsSensorThoughOthersAreLeftOut)
{
    Values const values = {value(781, "second"), nullptr, value(783, "fourth")};
    EXPECT_EQ(obd::findValue(values, 780), nullptr);
    EXPECT_EQ(obd::findValue(values, 781)->textualValue(), "second");
    EXPECT_EQ(obd::findValue(values, 782), nullptr);
    EXPECT_EQ(obd::findValue(values, 783)->textualValue(), "fourth");
}

TEST(SensorModels, WidenTheRangeToWholeNumbers)
{
    struct Case
    {
        double minimum;
        double maximum;
        int low;
        int high;
    };
    Case const cases[] = {
        {-40.0, 215.0, -40, 215},
        {-100.0, 99.6, -100, 100},
        {-100.0, 99.22, -100, 100},
        {-99.2, 100.0, -100, 100},
        {0.0, 16383.75, 0, 16384},
        {0.0, 1.275, 0, 2},
        {0.0, 0.5, -1, 1},
        {0.0, 0.0, 0, 0},
        {-64.0, 63.5, -64, 64},
        {-3.0, 4.0, -3, 4},
        {0.5, 0.5, 0, 1},
        {-210.0, 301.99, -210, 302},
        {0.0, 4294967295.0, 0, 2147483647},
    };
    for (Case const& each : cases) {
        SCOPED_TRACE(testing::Message() << each.minimum << " to " << each.maximum);
        obd::SensorDataModel::Numeric const range = obd::displayRange(each.minimum, each.maximum);
        EXPECT_EQ(range.minimum, each.low);
        EXPECT_EQ(range.maximum, each.high);
    }
}

} // namespace
