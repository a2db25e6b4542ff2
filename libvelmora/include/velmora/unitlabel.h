#pragma once

#include <obd/measurementunit.h>

namespace velmora {

/// The sign of a unit as people write it, such as "km/h", in UTF-8; empty for a value without one. Never null.
constexpr char const* unitLabel(MeasurementUnit unit)
{
    switch (unit) {
    case UnitNone:
    case UnitCount:
    case UnitSwitches:
        return "";
    case UnitRpm:
        return "rpm";
    case UnitKmPerHour:
        return "km/h";
    case UnitMilesPerHour:
        return "mph";
    case UnitVolt:
        return "V";
    case UnitAmpere:
        return "A";
    case UnitMilliampere:
        return "mA";
    case UnitKiloOhm:
        return "kΩ";
    case UnitSecond:
        return "s";
    case UnitPercent:
        return "%";
    case UnitCelsius:
        return "°C";
    case UnitFahrenheit:
        return "°F";
    case UnitOhm:
        return "Ω";
    case UnitKilopascal:
        return "kPa";
    case UnitDegree:
        return "°";
    case UnitLambda:
        return "lambda";
    case UnitAirFuelRatio:
        return "A/F";
    case UnitHertz:
        return "Hz";
    case UnitMegahertz:
        return "MHz";
    case UnitKilometre:
        return "km";
    case UnitVoltPerMillisecond:
        return "V/ms";
    case UnitGramPerSecond:
        return "g/s";
    case UnitKilopascalPerSecond:
        return "kPa/s";
    case UnitKilogramPerHour:
        return "kg/h";
    case UnitGramPerCylinder:
        return "g/cyl";
    case UnitMilligramPerStroke:
        return "mg/stroke";
    case UnitLitre:
        return "l";
    case UnitMillimetre:
        return "mm";
    case UnitGram:
        return "g";
    case UnitSquareMillimetre:
        return "mm²";
    case UnitPascalPerSecond:
        return "Pa/s";
    case UnitMillivoltPerSecond:
        return "mV/s";
    case UnitPascal:
        return "Pa";
    case UnitPsi:
        return "psi";
    case UnitMile:
        return "mi";
    case UnitPoundPerSecond:
        return "lb/s";
    case UnitInchH2OPerSecond:
        return "inH2O/s";
    case UnitInch:
        return "in";
    case UnitPound:
        return "lb";
    case UnitInchH2O:
        return "inH2O";
    case UnitMinute:
        return "min";
    case UnitPoundPerMinute:
        return "lb/min";
    case UnitInchHg:
        return "inHg";
    case UnitLitrePerHour:
        return "l/h";
    case UnitConsumptionMetric:
        return "l/100 km";
    case UnitConsumptionImperial:
        return "mpg";
    case UnitNewtonMetre:
        return "Nm";
    case UnitKilowatt:
        return "kW";
    case UnitHorsepower:
        return "hp";
    case UnitPpm:
        return "ppm";
    case UnitMicroampere:
        return "µA";
    case UnitKilojoule:
        return "kJ";
    case UnitBtu:
        return "BTU";
    case UnitPoundFoot:
        return "lb-ft";
    case UnitKelvinDifference:
        return "K";
    case UnitFahrenheitDifference:
        return "°F";
    case UnitScaling3C: // the standard gives the same code to several quantities
    case UnitScaling43:
    case UnitScaling44:
    case UnitScalingB3:
        return "";
    }
    return "";
}

} // namespace velmora
