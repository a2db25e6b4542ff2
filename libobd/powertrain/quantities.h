#pragma once

#include "libobd/powertrain/quantity.h"
#include "libobd/value/unitconversion.h"

// The quantities that sensors measure, with their display ranges and decimals in both unit systems.
namespace obd::quantities {

inline constexpr Scale celsiusWhole{UnitCelsius, NumberForm::Int, 0};
inline constexpr Scale fahrenheitWhole{UnitFahrenheit, NumberForm::Int, 0};
inline constexpr Scale kilometreDigits{UnitKilometre, NumberForm::Digits, 0};
inline constexpr Scale mileDigits{UnitMile, NumberForm::Digits, 0};

constexpr Scale kilopascal(NumberForm form, int decimals)
{
    return {UnitKilopascal, form, decimals};
}

constexpr Scale number(MeasurementUnit unit, int decimals)
{
    return {unit, NumberForm::Double, decimals};
}

constexpr Quantity digits(MeasurementUnit unit, double maximum)
{
    return sameInBoth(0.0, maximum, {unit, NumberForm::Digits, 0});
}

inline double manifoldPressureMaximum(IEcu const& ecu)
{
    return ecu.intakeManifoldAbsolutePressureMax();
}

inline double airFlowMaximum(IEcu const& ecu)
{
    return ecu.airFlowRateMax();
}

inline double equivalenceRatioMaximum(IEcu const& ecu)
{
    return ecu.equivalenceRatioMax();
}

inline double oxygenSensorVoltageMaximum(IEcu const& ecu)
{
    return ecu.oxygenSensorVoltageMax();
}

// The number of a reply reaches twice the maximum.
inline double oxygenSensorCurrentMaximum(IEcu const& ecu)
{
    return 2.0 * ecu.oxygenSensorCurrentMax();
}

// clang-format off
inline constexpr Quantity percent = sameInBoth(0.0, 100.0, number(UnitPercent, 1));
inline constexpr Quantity trim = sameInBoth(-100.0, 99.22, number(UnitPercent, 1));
inline constexpr Quantity torquePercent = sameInBoth(-125.0, 130.0, number(UnitPercent, 1));
inline constexpr Quantity absoluteLoad = sameInBoth(0.0, 25700.0, number(UnitPercent, 1));
inline constexpr Quantity rpm = sameInBoth(0.0, 16383.75, {UnitRpm, NumberForm::Unsigned, 0});
inline constexpr Quantity turboRpm = sameInBoth(0.0, 655350.0, {UnitRpm, NumberForm::Unsigned, 0});
inline constexpr Quantity sparkAdvance = sameInBoth(-64.0, 63.5, number(UnitNone, 1));
inline constexpr Quantity injectionTiming = sameInBoth(-210.0, 301.992, number(UnitNone, 2));
inline constexpr Quantity moduleVoltage = sameInBoth(0.0, 65.535, number(UnitVolt, 2));
inline constexpr Quantity narrowVoltage = sameInBoth(0.0, 1.275, number(UnitVolt, 3));
inline constexpr Quantity fuelRate = sameInBoth(0.0, 3276.75, number(UnitLitrePerHour, 2));
inline constexpr Quantity torque = sameInBoth(0.0, 65535.0, number(UnitNewtonMetre, 1));
inline constexpr Quantity seconds = digits(UnitSecond, 65535.0);
inline constexpr Quantity longSeconds = digits(UnitSecond, 4294967295.0);
inline constexpr Quantity minutes = digits(UnitMinute, 65535.0);
inline constexpr Quantity count = digits(UnitNone, 255.0);

inline constexpr Quantity equivalenceRatio{
    0.0, 0.0, number(UnitNone, 3), number(UnitNone, 3), nullptr, equivalenceRatioMaximum};
inline constexpr Quantity wideVoltage{
    0.0, 0.0, number(UnitVolt, 3), number(UnitVolt, 3), nullptr, oxygenSensorVoltageMaximum};
inline constexpr Quantity wideCurrent{
    0.0, 0.0, number(UnitMilliampere, 2), number(UnitMilliampere, 2), nullptr, oxygenSensorCurrentMaximum};

inline constexpr Quantity temperature{
    -40.0, 215.0, celsiusWhole, fahrenheitWhole, unitconversion::celsiusToFahrenheit};
inline constexpr Quantity exhaustTemperature{
    -40.0, 6513.5, celsiusWhole, fahrenheitWhole, unitconversion::celsiusToFahrenheit};
inline constexpr Quantity exhaustTemperatureTenths{
    -40.0, 6513.5, number(UnitCelsius, 1), number(UnitFahrenheit, 1), unitconversion::celsiusToFahrenheit};
inline constexpr Quantity recirculationTemperature{
    -40.0, 980.0, celsiusWhole, fahrenheitWhole, unitconversion::celsiusToFahrenheit};

inline constexpr Quantity speed{
    0.0, 255.0, {UnitKmPerHour, NumberForm::Unsigned, 0}, {UnitMilesPerHour, NumberForm::Unsigned, 0},
    unitconversion::kilometreToMile};
inline constexpr Quantity distance{
    0.0, 65535.0, kilometreDigits, mileDigits, unitconversion::kilometreToMile};
inline constexpr Quantity airFlow{
    0.0, 0.0, number(UnitGramPerSecond, 1), number(UnitPoundPerMinute, 0),
    unitconversion::gramPerSecondToPoundPerMinute, airFlowMaximum};
inline constexpr Quantity sensorAirFlow{
    0.0, 2047.96875, number(UnitGramPerSecond, 1), number(UnitPoundPerMinute, 0),
    unitconversion::gramPerSecondToPoundPerMinute};

inline constexpr Quantity gaugePressure{
    0.0, 765.0, kilopascal(NumberForm::Int, 0), number(UnitPsi, 1), unitconversion::kilopascalToPsi};
inline constexpr Quantity relativeRailPressure{
    0.0, 5177.27, kilopascal(NumberForm::Double, 1), number(UnitPsi, 1), unitconversion::kilopascalToPsi};
inline constexpr Quantity railPressure{
    0.0, 655350.0, kilopascal(NumberForm::Double, 0), number(UnitPsi, 1), unitconversion::kilopascalToPsi};
inline constexpr Quantity absoluteRailPressure{
    0.0, 655350.0, kilopascal(NumberForm::Unsigned, 0), number(UnitPsi, 1), unitconversion::kilopascalToPsi};
inline constexpr Quantity manifoldPressure{
    0.0, 0.0, kilopascal(NumberForm::Double, 1), number(UnitInchHg, 1), unitconversion::kilopascalToInchHg,
    manifoldPressureMaximum};
inline constexpr Quantity barometricPressure{
    0.0, 255.0, kilopascal(NumberForm::Int, 0), number(UnitInchHg, 1), unitconversion::kilopascalToInchHg};
inline constexpr Quantity inletPressure{
    0.0, 2040.0, kilopascal(NumberForm::Int, 0), number(UnitInchHg, 1), unitconversion::kilopascalToInchHg};
inline constexpr Quantity boostPressure{
    0.0, 2047.96875, kilopascal(NumberForm::Double, 2), number(UnitPsi, 2), unitconversion::kilopascalToPsi};
inline constexpr Quantity exhaustPressure{
    0.0, 655.35, kilopascal(NumberForm::Double, 2), number(UnitPsi, 3), unitconversion::kilopascalToPsi};
// The declared ends stand as users know them; the reply's number has no sign and reaches 655.35.
inline constexpr Quantity filterPressure{
    0.0, 355.35, kilopascal(NumberForm::Double, 2), number(UnitPsi, 3), unitconversion::kilopascalToPsi};
inline constexpr Quantity filterDeltaPressure{
    -327.68, 327.67, kilopascal(NumberForm::Double, 2), number(UnitPsi, 3), unitconversion::kilopascalToPsi};
inline constexpr Quantity vapourPressure{
    -8192.0, 8191.75, number(UnitPascal, 0), number(UnitInchH2O, 1), unitconversion::pascalToInchH2O};
inline constexpr Quantity wideVapourPressure{
    -32768.0, 32767.0, number(UnitPascal, 0), number(UnitInchH2O, 2), unitconversion::pascalToInchH2O};
inline constexpr Quantity absoluteVapourPressure{
    0.0, 327.675, kilopascal(NumberForm::Double, 3), number(UnitInchH2O, 2), unitconversion::kilopascalToInchH2O};
// clang-format on

} // namespace obd::quantities
