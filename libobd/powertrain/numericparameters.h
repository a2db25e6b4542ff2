#pragma once

#include "libobd/powertrain/formula.h"
#include "libobd/powertrain/quantities.h"
#include "libobd/powertrain/tableparameter.h"

namespace obd {

// The PIDs that decode to one number, in PID order.
// clang-format off
inline constexpr ParameterRow numericRows[] = {
    single(0x04, byteAt(0), formula::percent,              quantities::percent,                "Calculated engine load"),
    single(0x05, byteAt(0), formula::celsius,              quantities::temperature,            "Engine Coolant Temperature"),
    single(0x0A, byteAt(0), formula::timesThree,           quantities::gaugePressure,          "Fuel Pressure (gauge)"),
    single(0x0B, byteAt(0), formula::manifoldPressure,     quantities::manifoldPressure,       "Intake Manifold Absolute Pressure"),
    single(0x0C, wordAt(0), formula::wholeRpm,             quantities::rpm,                    "Engine RPM"),
    single(0x0D, byteAt(0), formula::plain,                quantities::speed,                  "Vehicle Speed Sensor"),
    single(0x0E, byteAt(0), formula::sparkAdvance,         quantities::sparkAdvance,           "Ignition Timing Advance for #1 Cylinder"),
    single(0x0F, byteAt(0), formula::celsius,              quantities::temperature,            "Intake Air Temperature"),
    single(0x10, wordAt(0), formula::airFlow,              quantities::airFlow,                "Air Flow Rate from Mass Flow Sensor"),
    single(0x11, byteAt(0), formula::percent,              quantities::percent,                "Absolute Throttle Position"),
    single(0x1F, wordAt(0), formula::plain,                quantities::seconds,                "Time Since Engine Start"),
    single(0x21, wordAt(0), formula::plain,                quantities::distance,               "Distance Traveled While MIL is Activated"),
    single(0x22, wordAt(0), formula::relativeRailPressure, quantities::relativeRailPressure,   "Fuel Pressure relative to manifold vacuum"),
    single(0x23, wordAt(0), formula::timesTen,             quantities::railPressure,           "Fuel Rail Pressure"),
    single(0x2C, byteAt(0), formula::percent,              quantities::percent,                "Commanded EGR"),
    single(0x2D, byteAt(0), formula::trim,                 quantities::trim,                   "EGR Error"),
    single(0x2E, byteAt(0), formula::percent,              quantities::percent,                "Commanded Evaporative Purge"),
    single(0x2F, byteAt(0), formula::percent,              quantities::percent,                "Fuel Level Input"),
    single(0x30, byteAt(0), formula::plain,                quantities::count,                  "Number of warm-ups since DTCs cleared"),
    single(0x31, wordAt(0), formula::plain,                quantities::distance,               "Distance traveled since DTCs cleared"),
    single(0x32, wordAt(0), formula::signedQuarters,       quantities::vapourPressure,         "Evap System Vapor Pressure"),
    single(0x33, byteAt(0), formula::plain,                quantities::barometricPressure,     "Barometric Pressure"),
    single(0x3C, wordAt(0), formula::wholeCelsius,         quantities::exhaustTemperature,     "Catalyst Temperature Bank 1, Sensor 1"),
    single(0x3D, wordAt(0), formula::wholeCelsius,         quantities::exhaustTemperature,     "Catalyst Temperature Bank 2, Sensor 1"),
    single(0x3E, wordAt(0), formula::wholeCelsius,         quantities::exhaustTemperature,     "Catalyst Temperature Bank 1, Sensor 2"),
    single(0x3F, wordAt(0), formula::wholeCelsius,         quantities::exhaustTemperature,     "Catalyst Temperature Bank 2, Sensor 2"),
    single(0x42, wordAt(0), formula::thousandths,          quantities::moduleVoltage,          "Control module voltage"),
    single(0x43, wordAt(0), formula::percent,              quantities::absoluteLoad,           "Absolute Load Value"),
    single(0x44, wordAt(0), formula::equivalenceRatio,     quantities::equivalenceRatio,       "Fuel/Air Commanded Equivalence Ratio"),
    single(0x45, byteAt(0), formula::percent,              quantities::percent,                "Relative Throttle Position"),
    single(0x46, byteAt(0), formula::celsius,              quantities::temperature,            "Ambient Air Temperature"),
    single(0x47, byteAt(0), formula::percent,              quantities::percent,                "Absolute Throttle Position B"),
    single(0x48, byteAt(0), formula::percent,              quantities::percent,                "Absolute Throttle Position C"),
    single(0x49, byteAt(0), formula::percent,              quantities::percent,                "Accelerator Pedal Position D"),
    single(0x4A, byteAt(0), formula::percent,              quantities::percent,                "Accelerator Pedal Position E"),
    single(0x4B, byteAt(0), formula::percent,              quantities::percent,                "Accelerator Pedal Position F"),
    single(0x4C, byteAt(0), formula::percent,              quantities::percent,                "Commanded Throttle Actuator Control"),
    single(0x4D, wordAt(0), formula::plain,                quantities::minutes,                "Engine run time while MIL activated"),
    single(0x4E, wordAt(0), formula::plain,                quantities::minutes,                "Engine run time since DTCs cleared"),
    single(0x52, byteAt(0), formula::percent,              quantities::percent,                "Alcohol Fuel Percentage"),
    single(0x53, wordAt(0), formula::twoHundredths,        quantities::absoluteVapourPressure, "Absolute Evap System Vapor Pressure"),
    single(0x54, wordAt(0), formula::signedWord,           quantities::wideVapourPressure,     "Evap System Vapor Pressure"),
    single(0x59, wordAt(0), formula::timesTen,             quantities::absoluteRailPressure,   "Absolute Fuel Rail Pressure"),
    single(0x5A, byteAt(0), formula::percent,              quantities::percent,                "Relative Accelerator Pedal Position"),
    single(0x5B, byteAt(0), formula::percent,              quantities::percent,                "Hybrid/EV Battery Pack Remaining Charge"),
    single(0x5C, byteAt(0), formula::celsius,              quantities::temperature,            "Engine Oil Temperature"),
    single(0x5D, wordAt(0), formula::injectionTiming,      quantities::injectionTiming,        "Fuel Injection Timing"),
    single(0x5E, wordAt(0), formula::twentieths,           quantities::fuelRate,               "Engine Fuel Rate"),
    single(0x61, byteAt(0), formula::torquePercent,        quantities::torquePercent,          "Requested Engine Torque"),
    single(0x62, byteAt(0), formula::torquePercent,        quantities::torquePercent,          "Actual Engine Torque"),
    single(0x63, wordAt(0), formula::plain,                quantities::torque,                 "Engine Reference Torque"),
};
// clang-format on
static_assert(pidsRise(numericRows), "PIDs must rise, none twice");
static_assert(allHoldTheirFields(numericRows));

template <int id>
using NumericParameter = RowParameter<TableParameter, numericRows, id>;

using CalculatedEngineLoad = NumericParameter<0x04>;
using EngineCoolantTemperature = NumericParameter<0x05>;
using FuelPressure = NumericParameter<0x0A>;
using ManifoldPressure = NumericParameter<0x0B>;

class EngineRpm : public NumericParameter<0x0C>
{
public:
    using NumericParameter<0x0C>::NumericParameter;

    // Whole revolutions per minute; 0 if the module has not answered.
    unsigned int engineRpm(IEcu const& ecu) const { return static_cast<unsigned int>(value(ecu, UnitSystem::Metric)); }
};

template <>
struct ParameterClass<numericRows, 0x0C>
{
    using Type = EngineRpm;
};

using VehicleSpeed = NumericParameter<0x0D>;
using TimingAdvance = NumericParameter<0x0E>;
using IntakeAirTemperature = NumericParameter<0x0F>;
using AirFlowRate = NumericParameter<0x10>;
using ThrottlePosition = NumericParameter<0x11>;
using EngineRuntime = NumericParameter<0x1F>;
using MilDistance = NumericParameter<0x21>;
using RelativeFuelRailPressure = NumericParameter<0x22>;
using FuelRailPressure = NumericParameter<0x23>;
using CommandedEgr = NumericParameter<0x2C>;
using EgrError = NumericParameter<0x2D>;
using EvaporativePurge = NumericParameter<0x2E>;
using FuelLevelInput = NumericParameter<0x2F>;
using WarmUps = NumericParameter<0x30>;
using DistanceTraveled = NumericParameter<0x31>;
using VaporPressure = NumericParameter<0x32>;
using BarometricPressure = NumericParameter<0x33>;
using CatalystTemperatureBank1Sensor1 = NumericParameter<0x3C>;
using CatalystTemperatureBank2Sensor1 = NumericParameter<0x3D>;
using CatalystTemperatureBank1Sensor2 = NumericParameter<0x3E>;
using CatalystTemperatureBank2Sensor2 = NumericParameter<0x3F>;
using ControlModuleVoltage = NumericParameter<0x42>;
using AbsoluteLoadValue = NumericParameter<0x43>;
using CommandedFar = NumericParameter<0x44>;
using RelativeThrottlePosition = NumericParameter<0x45>;
using AmbientAirTemperature = NumericParameter<0x46>;
using AbsoluteThrottlePositionB = NumericParameter<0x47>;
using AbsoluteThrottlePositionC = NumericParameter<0x48>;
using AcceleratorPedalPositionD = NumericParameter<0x49>;
using AcceleratorPedalPositionE = NumericParameter<0x4A>;
using AcceleratorPedalPositionF = NumericParameter<0x4B>;
using CommandedThrottleActuatorControl = NumericParameter<0x4C>;
using EngineRuntimeMil = NumericParameter<0x4D>;
using EngineRuntimeDtc = NumericParameter<0x4E>;
using AlcoholFuelPercentage = NumericParameter<0x52>;
using AbsoluteEvapSystemVaporPressure = NumericParameter<0x53>;
using EvapSystemVaporPressure = NumericParameter<0x54>;
using AbsoluteFuelRailPressure = NumericParameter<0x59>;
using RelativeAcceleratorPedalPosition = NumericParameter<0x5A>;
using BatteryPackRemainingCharge = NumericParameter<0x5B>;
using EngineOilTemperature = NumericParameter<0x5C>;
using FuelInjectionTiming = NumericParameter<0x5D>;
using EngineFuelRate = NumericParameter<0x5E>;
using RequestedTorque = NumericParameter<0x61>;
using ActualTorque = NumericParameter<0x62>;
using ReferenceTorque = NumericParameter<0x63>;

} // namespace obd
