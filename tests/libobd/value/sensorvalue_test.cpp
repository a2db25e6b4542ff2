#include <obd/sensorvalue.h>

#include <gtest/gtest.h>

#include <climits>

namespace {

using obd::ConcreateNumericSensorValue;
using obd::TextualSensorValue;

TEST(SensorValue, ADoubleIsRoundedInItsTextOnly)
{
    ConcreateNumericSensorValue<double> value(10, 1.25, 1);
    EXPECT_EQ(value.uid(), 10);
    EXPECT_EQ(value.numericValue(), 1.25);
    EXPECT_EQ(value.textualValue(), "1.3");
    EXPECT_EQ(value.toString(2.0), "2.0");
}

TEST(SensorValue, AnIntUsesItsDecimalsForOtherNumbersOnly)
{
    ConcreateNumericSensorValue<int> value(10, 7, 2);
    EXPECT_EQ(value.numericValue(), 7.0);
    EXPECT_EQ(value.textualValue(), "7");
    EXPECT_EQ(value.toString(7.0), "7.00");
}

TEST(SensorValue, WholeNumbersKeepTheirWholeRange)
{
    EXPECT_EQ(ConcreateNumericSensorValue<int>::buildObject(1, INT_MIN, 0)->textualValue(), "-2147483648");
    auto const large = ConcreateNumericSensorValue<unsigned int>::buildObject(1, UINT_MAX, 0);
    EXPECT_EQ(large->textualValue(), "4294967295");
    EXPECT_EQ(large->numericValue(), 4294967295.0);
}

TEST(SensorValue, ATextIsItself)
{
    TextualSensorValue value(280, "EOBD");
    EXPECT_EQ(value.uid(), 280);
    EXPECT_EQ(value.textualValue(), "EOBD");
}

TEST(SensorValue, NumbersAndTextsCanBeToldApart)
{
    std::shared_ptr<obd::SensorValue> const number = ConcreateNumericSensorValue<double>::buildObject(10, 1.0, 1);
    std::shared_ptr<obd::SensorValue> const text = std::make_shared<TextualSensorValue>(10, "x");
    EXPECT_NE(std::dynamic_pointer_cast<obd::NumericSensorValue>(number), nullptr);
    EXPECT_EQ(std::dynamic_pointer_cast<obd::NumericSensorValue>(text), nullptr);
}

} // namespace
