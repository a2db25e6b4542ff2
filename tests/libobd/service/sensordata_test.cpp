#include "libobd/service/sensordata.h"

#include <obd/sensorvalue.h>
#include <obd/sensorvaluedatamodel.h>

#include <gtest/gtest.h>

namespace {

using Number = obd::ConcreateNumericSensorValue<double>;

void update(obd::SensorData& data, std::vector<double> const& numbers, int decimals = 1)
{
    for (double const number : numbers) {
        data.update(Number::buildObject(120, number, decimals));
    }
}

TEST(SensorData, TheFirstValueGivesMinimumMaximumAndMeanAllEqualToIt)
{
    obd::SensorData data(120);
    update(data, {-7.25}, 2);
    EXPECT_EQ(data.current(), "-7.25");
    EXPECT_EQ(data.minimum(), "-7.25");
    EXPECT_EQ(data.maximum(), "-7.25");
    EXPECT_EQ(data.mean(), "-7.25");
    EXPECT_EQ(data.count(), 1U);
}

TEST(SensorData, FollowsTheExtremesAndTheRunningMean)
{
    obd::SensorData data(120);
    update(data, {10.0, 40.0, 4.0, 6.0});
    EXPECT_EQ(data.current(), "6.0");
    EXPECT_EQ(data.minimum(), "4.0");
    EXPECT_EQ(data.maximum(), "40.0");
    EXPECT_EQ(data.mean(), "15.0");
    EXPECT_EQ(data.count(), 4U);
}

TEST(SensorData, ShowsTheMeanOfWholeNumbersWithTheDecimalsOfTheSensor)
{
    obd::SensorData data(130);
    for (int const speed : {50, 51}) {
        data.update(obd::ConcreateNumericSensorValue<int>::buildObject(130, speed, 0));
    }
    EXPECT_EQ(data.current(), "51");
    EXPECT_EQ(data.mean(), "51"); // 50.5, rounded half up
}

TEST(SensorData, OfATextHasTheTextAlone)
{
    obd::SensorData data(30);
    data.update(std::make_shared<obd::TextualSensorValue>(30, "Closed loop"));
    EXPECT_EQ(data.current(), "Closed loop");
    EXPECT_EQ(data.minimum(), "");
    EXPECT_EQ(data.maximum(), "");
    EXPECT_EQ(data.mean(), "");
    EXPECT_EQ(data.count(), 0U);
}

TEST(SensorData, IsEmptyBeforeTheFirstReading)
{
    obd::SensorData const data(120);
    EXPECT_EQ(data.current(), "");
    EXPECT_EQ(data.minimum(), "");
    EXPECT_EQ(data.uid(), 120);
}

TEST(SensorData, ItsModelHoldsAllTexts)
{
    obd::SensorData data(120);
    update(data, {1.0, 3.0});
    std::shared_ptr<obd::SensorValueDataModel> const model = data.model();
    EXPECT_EQ(model->uid, 120);
    EXPECT_EQ(model->value, "3.0");
    EXPECT_EQ(model->minimum, "1.0");
    EXPECT_EQ(model->maximum, "3.0");
    EXPECT_EQ(model->mean, "2.0");
}

} // namespace
