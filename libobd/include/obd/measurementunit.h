#pragma once

/// \file
/// The units that values come in.

/// \ingroup parameters
/// The unit of a value, as a code. The library holds no labels: showing a unit is the application's affair. Codes 7,
/// 47, 52 and 55 are not in use. The scaling identifiers are those of SAE J1979 for on-board monitor results.
enum MeasurementUnit : int
{
    UnitNone = 0,                  ///< ratio, count or angle: no unit of its own
    UnitRpm = 1,                   ///< 1/min
    UnitKmPerHour = 2,             ///< km/h
    UnitMilesPerHour = 3,          ///< mph
    UnitVolt = 4,                  ///< V
    UnitAmpere = 5,                ///< A
    UnitMilliampere = 6,           ///< mA
    UnitKiloOhm = 8,               ///< kΩ
    UnitSecond = 9,                ///< s
    UnitPercent = 10,              ///< %
    UnitCelsius = 11,              ///< °C
    UnitFahrenheit = 12,           ///< °F
    UnitOhm = 13,                  ///< Ω
    UnitKilopascal = 14,           ///< kPa
    UnitDegree = 15,               ///< ° of angle
    UnitLambda = 16,               ///< equivalence ratio
    UnitAirFuelRatio = 17,         ///< air to fuel ratio
    UnitHertz = 18,                ///< Hz
    UnitMegahertz = 19,            ///< MHz
    UnitCount = 20,                ///< counts
    UnitKilometre = 21,            ///< km
    UnitVoltPerMillisecond = 22,   ///< V/ms
    UnitGramPerSecond = 23,        ///< g/s
    UnitKilopascalPerSecond = 24,  ///< kPa/s
    UnitKilogramPerHour = 25,      ///< kg/h
    UnitSwitches = 26,             ///< switches
    UnitGramPerCylinder = 27,      ///< g/cyl
    UnitMilligramPerStroke = 28,   ///< mg/stroke
    UnitLitre = 29,                ///< l
    UnitMillimetre = 30,           ///< mm
    UnitGram = 31,                 ///< g
    UnitScaling3C = 32,            ///< of the scaling identifiers 3C and 8F
    UnitSquareMillimetre = 33,     ///< mm²
    UnitPascalPerSecond = 34,      ///< Pa/s
    UnitMillivoltPerSecond = 35,   ///< mV/s
    UnitPascal = 36,               ///< Pa
    UnitPsi = 37,                  ///< psi
    UnitMile = 38,                 ///< mi
    UnitPoundPerSecond = 39,       ///< lb/s
    UnitInchH2OPerSecond = 40,     ///< inH2O/s
    UnitInch = 41,                 ///< in
    UnitPound = 42,                ///< lb
    UnitInchH2O = 43,              ///< inH2O
    UnitMinute = 44,               ///< min
    UnitPoundPerMinute = 45,       ///< lb/min
    UnitInchHg = 46,               ///< inHg
    UnitLitrePerHour = 48,         ///< l/h
    UnitConsumptionMetric = 49,    ///< l/100 km
    UnitConsumptionImperial = 50,  ///< miles per gallon
    UnitNewtonMetre = 51,          ///< Nm
    UnitKilowatt = 53,             ///< kW
    UnitHorsepower = 54,           ///< hp
    UnitPpm = 56,                  ///< ppm
    UnitMicroampere = 57,          ///< µA
    UnitKilojoule = 58,            ///< kJ
    UnitBtu = 59,                  ///< BTU
    UnitScaling43 = 60,            ///< of the scaling identifier 43
    UnitPoundFoot = 61,            ///< lb-ft
    UnitKelvinDifference = 62,     ///< K, a difference
    UnitFahrenheitDifference = 63, ///< °F, a difference
    UnitScaling44 = 64,            ///< of the scaling identifier 44
    UnitScalingB3 = 65,            ///< of the scaling identifier B3
};
