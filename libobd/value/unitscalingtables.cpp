#include "libobd/value/unitscalingtables.h"

#include "libobd/value/unitconversion.h"

namespace obd {
namespace {

constexpr double gramPerSecondToPoundPerSecond(double gramPerSecond)
{
    return gramPerSecond * 0.00220462262;
}

constexpr double gramToPound(double gram)
{
    return gram * 0.00220462262185;
}

constexpr double kilojouleToBtu(double kilojoule)
{
    return kilojoule * 0.947816987913;
}

constexpr double newtonMetreToPoundFoot(double newtonMetre)
{
    return newtonMetre * 0.737562149277;
}

constexpr double kelvinToFahrenheitDifference(double kelvin)
{
    return kelvin * 1.8;
}

constexpr ScalingRow metricRows[] = {
    // identifier, factor, decimals, unit
    {0x01, 1.0, 0, UnitNone},
    {0x02, 0.1, 1, UnitNone},
    {0x03, 0.01, 2, UnitNone},
    {0x04, 0.001, 3, UnitNone},
    {0x05, 3.0517578125e-05, 7, UnitNone},
    {0x06, 0.00030517578125, 6, UnitNone},
    {0x07, 0.25, 2, UnitRpm},
    {0x08, 0.01, 2, UnitKmPerHour},
    {0x09, 1.0, 0, UnitKmPerHour},
    {0x0A, 0.0001220703125, 6, UnitVolt},
    {0x0B, 0.001, 3, UnitVolt},
    {0x0C, 0.01, 2, UnitVolt},
    {0x0D, 0.00390625, 8, UnitMilliampere},
    {0x0E, 0.001, 3, UnitAmpere},
    {0x0F, 0.01, 2, UnitAmpere},
    {0x10, 0.001, 3, UnitSecond},
    {0x11, 0.1, 1, UnitSecond},
    {0x12, 1.0, 0, UnitSecond},
    {0x13, 0.001, 3, UnitOhm},
    {0x14, 0.001, 3, UnitKiloOhm},
    {0x15, 1.0, 0, UnitKiloOhm},
    {0x16, 0.1, 1, UnitCelsius},
    {0x17, 0.01, 2, UnitKilopascal},
    {0x18, 0.0117, 4, UnitKilopascal},
    {0x19, 0.079, 3, UnitKilopascal},
    {0x1A, 1.0, 0, UnitKilopascal},
    {0x1B, 10.0, 0, UnitKilopascal},
    {0x1C, 0.01, 2, UnitDegree},
    {0x1D, 0.5, 1, UnitDegree},
    {0x1E, 3.0517578125e-05, 7, UnitLambda},
    {0x1F, 0.05, 2, UnitAirFuelRatio},
    {0x20, 0.00390625, 7, UnitNone},
    {0x21, 0.001, 3, UnitHertz},
    {0x22, 1.0, 0, UnitHertz},
    {0x23, 0.001, 3, UnitMegahertz},
    {0x24, 1.0, 0, UnitCount},
    {0x25, 1.0, 0, UnitKilometre},
    {0x26, 0.0001, 4, UnitVoltPerMillisecond},
    {0x27, 0.01, 2, UnitGramPerSecond},
    {0x28, 1.0, 0, UnitGramPerSecond},
    {0x29, 0.00025, 4, UnitKilopascalPerSecond},
    {0x2A, 0.001, 3, UnitKilogramPerHour},
    {0x2B, 1.0, 0, UnitSwitches},
    {0x2C, 0.01, 2, UnitGramPerCylinder},
    {0x2D, 0.01, 2, UnitMilligramPerStroke},
    {0x2E, 0.0, 0, UnitNone},
    {0x2F, 0.01, 2, UnitPercent},
    {0x30, 0.0015259021896696422, 6, UnitPercent},
    {0x31, 0.001, 3, UnitLitre},
    {0x32, 0.000775146484375, 7, UnitMillimetre},
    {0x33, 0.000244140625, 8, UnitLambda},
    {0x34, 1.0, 0, UnitMinute},
    {0x35, 0.01, 2, UnitSecond},
    {0x36, 0.01, 2, UnitGram},
    {0x37, 0.1, 1, UnitGram},
    {0x38, 1.0, 0, UnitGram},
    {0x39, 0.01, 2, UnitPercent},
    {0x3A, 0.001, 3, UnitGram},
    {0x3B, 0.0001, 4, UnitGram},
    {0x3C, 0.1, 1, UnitScaling3C},
    {0x3D, 0.01, 2, UnitMilliampere},
    {0x3E, 6.103516e-05, 2, UnitSquareMillimetre},
    {0x3F, 0.01, 2, UnitLitre},
    {0x40, 1.0, 0, UnitPpm},
    {0x41, 0.01, 2, UnitMicroampere},
    {0x42, 0.1, 1, UnitKilojoule},
    {0x43, 0.000244140625, 6, UnitScaling43},
    {0x44, 1.0, 0, UnitScaling44},
    {0x45, 0.1, 2, UnitPercent},
    {0x46, 5e-05, 2, UnitPercent},
    {0x81, 1.0, 0, UnitNone},
    {0x82, 0.1, 1, UnitNone},
    {0x83, 0.01, 2, UnitNone},
    {0x84, 0.001, 3, UnitNone},
    {0x85, 3.0517578125e-05, 7, UnitNone},
    {0x86, 0.00030517578125, 6, UnitNone},
    {0x87, 1.0, 0, UnitPpm},
    {0x8A, 0.0001220703125, 6, UnitVolt},
    {0x8B, 0.001, 3, UnitVolt},
    {0x8C, 0.01, 2, UnitVolt},
    {0x8D, 0.00390625, 8, UnitMilliampere},
    {0x8E, 0.001, 3, UnitAmpere},
    {0x8F, 1.0, 0, UnitScaling3C},
    {0x90, 0.001, 3, UnitSecond},
    {0x91, 0.1, 1, UnitSecond},
    {0x92, 0.1, 1, UnitNewtonMetre},
    {0x93, 10.0, 1, UnitRpm},
    {0x96, 0.1, 1, UnitCelsius},
    {0x97, 0.01, 2, UnitKelvinDifference},
    {0x98, 1.0, 0, UnitMilligramPerStroke},
    {0x99, 0.1, 1, UnitKilopascal},
    {0x9C, 0.01, 2, UnitDegree},
    {0x9D, 0.5, 1, UnitDegree},
    {0xA8, 1.0, 0, UnitGramPerSecond},
    {0xA9, 0.25, 2, UnitPascalPerSecond},
    {0xAA, 10.0, 0, UnitGramPerSecond},
    {0xAB, 0.01, 2, UnitGramPerSecond},
    {0xAD, 0.01, 2, UnitMilligramPerStroke},
    {0xAE, 0.1, 1, UnitMilligramPerStroke},
    {0xAF, 0.01, 2, UnitPercent},
    {0xB0, 0.0030517578125, 6, UnitPercent},
    {0xB1, 2.0, 0, UnitMillivoltPerSecond},
    {0xB2, 0.05, 6, UnitLitrePerHour},
    {0xB3, 0.015625, 6, UnitScalingB3},
    {0xFA, 20.0, 0, UnitKilopascal},
    {0xFB, 10.0, 0, UnitKilopascal},
    {0xFC, 0.01, 2, UnitKilopascal},
    {0xFD, 0.001, 3, UnitKilopascal},
    {0xFE, 0.25, 2, UnitPascal},
};

// Where the factor is not the metric one, it gives the unit that the conversion starts from.
constexpr ScalingRow imperialRows[] = {
    // identifier, factor, decimals, unit, conversion
    {0x08, 0.01, 2, UnitMilesPerHour, unitconversion::kilometreToMile},
    {0x09, 1.0, 0, UnitMilesPerHour, unitconversion::kilometreToMile},
    {0x16, 0.1, 1, UnitFahrenheit, unitconversion::celsiusToFahrenheit},
    {0x17, 0.01, 1, UnitPsi, unitconversion::kilopascalToPsi},
    {0x18, 0.0117, 1, UnitPsi, unitconversion::kilopascalToPsi},
    {0x19, 0.079, 1, UnitPsi, unitconversion::kilopascalToPsi},
    {0x1A, 1.0, 1, UnitPsi, unitconversion::kilopascalToPsi},
    {0x1B, 10.0, 1, UnitPsi, unitconversion::kilopascalToPsi},
    {0x25, 1.0, 0, UnitMile, unitconversion::kilometreToMile},
    {0x27, 0.01, 3, UnitPoundPerSecond, gramPerSecondToPoundPerSecond},
    {0x28, 1.0, 2, UnitPoundPerSecond, gramPerSecondToPoundPerSecond},
    {0x29, 0.00025, 3, UnitInchH2OPerSecond, unitconversion::kilopascalToInchH2O},
    {0x32, 3.05e-05, 3, UnitInch},
    {0x36, 0.01, 3, UnitPound, gramToPound},
    {0x37, 0.1, 3, UnitPound, gramToPound},
    {0x38, 1.0, 2, UnitPound, gramToPound},
    {0x3A, 0.001, 4, UnitPound, gramToPound},
    {0x3B, 0.0001, 5, UnitPound, gramToPound},
    {0x42, 0.1, 1, UnitBtu, kilojouleToBtu},
    {0x92, 0.1, 2, UnitPoundFoot, newtonMetreToPoundFoot},
    {0x96, 0.1, 1, UnitFahrenheit, unitconversion::celsiusToFahrenheit},
    {0x97, 0.01, 2, UnitFahrenheitDifference, kelvinToFahrenheitDifference},
    {0x99, 0.1, 2, UnitPsi, unitconversion::kilopascalToPsi},
    {0xAA, 10.0, 2, UnitPoundPerSecond, gramPerSecondToPoundPerSecond},
    {0xAB, 0.01, 2, UnitPoundPerSecond, gramPerSecondToPoundPerSecond},
    {0xA8, 1.0, 2, UnitPoundPerSecond, gramPerSecondToPoundPerSecond},
    {0xA9, 0.00025, 3, UnitInchH2OPerSecond, unitconversion::kilopascalToInchH2O},
    {0xFA, 20.0, 1, UnitPsi, unitconversion::kilopascalToPsi},
    {0xFB, 10.0, 1, UnitPsi, unitconversion::kilopascalToPsi},
    {0xFE, 0.00025, 3, UnitInchH2O, unitconversion::kilopascalToInchH2O},
};

constexpr TestScalingRow testRows[] = {
    // first and last test, factor, decimals, unit
    {0x01, 0x04, 0.005f, 3, UnitVolt},  {0x05, 0x06, 0.004f, 3, UnitSecond}, {0x07, 0x08, 0.005f, 3, UnitVolt},
    {0x09, 0x0A, 0.04f, 2, UnitSecond}, {0x21, 0x2F, 0.004f, 3, UnitSecond}, {0x30, 0x3F, 0.04f, 2, UnitSecond},
    {0x41, 0x4F, 0.005f, 3, UnitVolt},  {0x50, 0x5F, 0.05f, 2, UnitVolt},    {0x61, 0x6F, 0.1f, 1, UnitHertz},
    {0x70, 0x7F, 1.0f, 0, UnitCount},
};

} // namespace

std::span<ScalingRow const> metricScalings()
{
    return metricRows;
}

std::span<ScalingRow const> imperialScalings()
{
    return imperialRows;
}

std::span<TestScalingRow const> testScalings()
{
    return testRows;
}

} // namespace obd
