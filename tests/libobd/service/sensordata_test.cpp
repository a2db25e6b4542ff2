#include "libobd/service/sensordata.h"

#include <obd/sensordatamodels.h>
#include <obd/sensorvalue.h>

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

TEST(SensorData, ItsModelHoldsTheNumbersUnrounded)
{
    obd::SensorData data(120);
    update(data, {1.125, 4.5, 3.0625}, 0);
    std::shared_ptr<obd::SensorValueDataModel> const model = data.model();
    EXPECT_EQ(model->value, "3");
    EXPECT_EQ(model->number, 3.0625);
    ASSERT_TRUE(model->statistics);
    EXPECT_EQ(model->statistics->minimum, 1.125);
    EXPECT_EQ(model->statistics->maximum, 4.5);
    EXPECT_DOUBLE_EQ(model->statistics->mean, 8.6875 / 3);
    EXPECT_EQ(model->statistics->count, 3U);
}

TEST(SensorData, OfDigitsHasANumberWithoutStatisticsAndOfWordsNone)
{
    obd::SensorData data(310);
    EXPECT_EQ(data.model()->number, std::nullopt);
    data.update(std::make_shared<obd::TextualSensorValue>(310, "1800", 1800));
    EXPECT_EQ(data.model()->value, "1800");
    EXPECT_EQ(data.model()->number, 1800);
    EXPECT_FALSE(data.model()->statistics);
    data.update(std::make_shared<obd::TextualSensorValue>(310, "Closed loop"));
    EXPECT_EQ(data.model()->number, std::nullopt);
}

} // namespace
