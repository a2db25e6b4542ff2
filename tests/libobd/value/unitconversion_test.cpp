#include "libobd/value/unitconversion.h"

#include <obd/measurementunit.h>
#include <obd/typedvalueformater.h>
#include <obd/unitsystem.h>

#include <gtest/gtest.h>

namespace {

namespace convert = obd::unitconversion;

TEST(UnitConversion, TemperatureScalesAgreeAtTheirFixedPoints)
{
    obd::TypedValueFormater const oneDecimal(1);
    EXPECT_EQ(oneDecimal.toString(convert::celsiusToFahrenheit(100.0)), "212.0");
    EXPECT_EQ(oneDecimal.toString(convert::celsiusToFahrenheit(-40.0)), "-40.0");
    EXPECT_EQ(oneDecimal.toString(convert::celsiusToFahrenheit(0.0)), "32.0");
}

TEST(UnitConversion, FactorsAreExactToTheLastDigit)
{
    EXPECT_EQ(convert::kilopascalToPsi(1.0), 0.1450377);
    EXPECT_EQ(convert::kilopascalToInchHg(1.0), 0.295300586467);
    EXPECT_EQ(convert::kilopascalToInchH2O(1.0), 4.01463092093);
    EXPECT_EQ(convert::pascalToInchH2O(1.0), 0.00401463092093);
    EXPECT_EQ(convert::gramPerSecondToPoundPerMinute(1.0), 0.132277357);
    EXPECT_EQ(convert::kilometreToMile(1.0), 0.62137);
}

// Applications compile these codes in.
TEST(MeasurementUnit, CodesStandFirm)
{
    EXPECT_EQ(UnitNone, 0);
    EXPECT_EQ(UnitMilliampere, 6);
    EXPECT_EQ(UnitKiloOhm, 8);
    EXPECT_EQ(UnitInchHg, 46);
    EXPECT_EQ(UnitLitrePerHour, 48);
    EXPECT_EQ(UnitNewtonMetre, 51);
    EXPECT_EQ(UnitKilowatt, 53);
    EXPECT_EQ(UnitHorsepower, 54);
    EXPECT_EQ(UnitPpm, 56);
    EXPECT_EQ(UnitScalingB3, 65);
    EXPECT_EQ(static_cast<int>(obd::UnitSystem::Metric), 0);
    EXPECT_EQ(static_cast<int>(obd::UnitSystem::Imperial), 1);
}

} // namespace
