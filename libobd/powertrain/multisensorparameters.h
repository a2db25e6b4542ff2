#pragma once

#include "libobd/powertrain/codedparameters.h"
#include "libobd/powertrain/formula.h"
#include "libobd/powertrain/quantities.h"
#include "libobd/powertrain/tableparameter.h"

namespace obd {

// The PIDs with several numbers, in PID order. All but 0x64 begin with a byte that tells which sensors the vehicle has.
// clang-format off
constexpr ParameterRow turbochargerRow(int pid, char const* title)
{
    return {pid, 7, 0, title, {
        {"Compressor Inlet Temperature",  bit(0), byteAt(1), formula::celsius,        &quantities::temperature},
        {"Compressor Outlet Temperature", bit(1), byteAt(2), formula::celsius,        &quantities::temperature},
        {"Turbine Inlet Temperature",     bit(2), wordAt(3), formula::turbineCelsius, &quantities::exhaustTemperature},
        {"Turbine Outlet Temperature",    bit(3), wordAt(5), formula::turbineCelsius, &quantities::exhaustTemperature}}};
}

constexpr ParameterRow exhaustGasRow(int pid, char const* title)
{
    return {pid, 9, 0, title, {
        {"Sensor 1", bit(0), wordAt(1), formula::tenthCelsius, &quantities::exhaustTemperatureTenths},
        {"Sensor 2", bit(1), wordAt(3), formula::tenthCelsius, &quantities::exhaustTemperatureTenths},
        {"Sensor 3", bit(2), wordAt(5), formula::tenthCelsius, &quantities::exhaustTemperatureTenths},
        {"Sensor 4", bit(3), wordAt(7), formula::tenthCelsius, &quantities::exhaustTemperatureTenths}}};
}

constexpr ParameterRow particulateFilterRow(int pid, char const* title)
{
    return {pid, 7, 0, title, {
        {"Delta Pressure",  bit(0), wordAt(1), formula::hundredths, &quantities::filterDeltaPressure},
        {"Inlet Pressure",  bit(1), wordAt(3), formula::hundredths, &quantities::filterPressure},
        {"Outlet Pressure", bit(2), wordAt(5), formula::hundredths, &quantities::filterPressure}}};
}

inline constexpr ParameterRow multiSensorRows[] = {
    {0x64, 5, 0, "Engine Percent Torque Data", {
        {"Point 1", always, byteAt(0), formula::torquePercent, &quantities::torquePercent},
        {"Point 2", always, byteAt(1), formula::torquePercent, &quantities::torquePercent},
        {"Point 3", always, byteAt(2), formula::torquePercent, &quantities::torquePercent},
        {"Point 4", always, byteAt(3), formula::torquePercent, &quantities::torquePercent},
        {"Point 5", always, byteAt(4), formula::torquePercent, &quantities::torquePercent}}},
    {0x66, 5, 0, "Air Flow Rate from Mass Flow Sensor", {
        {"Sensor A", bit(0), wordAt(1), formula::thirtySeconds, &quantities::sensorAirFlow},
        {"Sensor B", bit(1), wordAt(3), formula::thirtySeconds, &quantities::sensorAirFlow}}},
    {0x67, 3, 0, "Engine Coolant Temperature", {
        {"Sensor 1", bit(0), byteAt(1), formula::celsius, &quantities::temperature},
        {"Sensor 2", bit(1), byteAt(2), formula::celsius, &quantities::temperature}}},
    {0x68, 7, 0, "Intake Air Temperature", {
        {"Bank 1 - Sensor 1", bit(0), byteAt(1), formula::celsius, &quantities::temperature},
        {"Bank 1 - Sensor 2", bit(1), byteAt(2), formula::celsius, &quantities::temperature},
        {"Bank 1 - Sensor 3", bit(2), byteAt(3), formula::celsius, &quantities::temperature},
        {"Bank 2 - Sensor 1", bit(3), byteAt(4), formula::celsius, &quantities::temperature},
        {"Bank 2 - Sensor 2", bit(4), byteAt(5), formula::celsius, &quantities::temperature},
        {"Bank 2 - Sensor 3", bit(5), byteAt(6), formula::celsius, &quantities::temperature}}},
    {0x69, 7, 0, "Exhaust Gas Recirculation", {
        {"Commanded EGR Duty Cycle/Position A", bit(0), byteAt(1), formula::percent, &quantities::percent},
        {"Actual EGR Duty Cycle/Position A",    bit(1), byteAt(2), formula::percent, &quantities::percent},
        {"EGR Error A",                         bit(2), byteAt(3), formula::trim,    &quantities::trim},
        {"Commanded EGR Duty Cycle/Position B", bit(3), byteAt(4), formula::percent, &quantities::percent},
        {"Actual EGR Duty Cycle/Position B",    bit(4), byteAt(5), formula::percent, &quantities::percent},
        {"EGR Error B",                         bit(5), byteAt(6), formula::trim,    &quantities::trim}}},
    {0x6A, 5, 0, "Diesel Intake Air Flow", {
        {"Commanded IAF Control A", bit(0), byteAt(1), formula::percent, &quantities::percent},
        {"Relative IAF Position A", bit(1), byteAt(2), formula::percent, &quantities::percent},
        {"Commanded IAF Control B", bit(2), byteAt(3), formula::percent, &quantities::percent},
        {"Relative IAF Position B", bit(3), byteAt(4), formula::percent, &quantities::percent}}},
    {0x6B, 5, 0, "Exhaust Gas Recirculation Temperature", {
        {"Bank 1 - Sensor 1", bit(0), byteAt(1), formula::celsius, &quantities::recirculationTemperature, bit(4), formula::wideCelsius},
        {"Bank 1 - Sensor 2", bit(1), byteAt(2), formula::celsius, &quantities::recirculationTemperature, bit(5), formula::wideCelsius},
        {"Bank 2 - Sensor 1", bit(2), byteAt(3), formula::celsius, &quantities::recirculationTemperature, bit(6), formula::wideCelsius},
        {"Bank 2 - Sensor 2", bit(3), byteAt(4), formula::celsius, &quantities::recirculationTemperature, bit(7), formula::wideCelsius}}},
    {0x6C, 5, 0, "Throttle Actuator Control", {
        {"Commanded Actuator Control A", bit(0), byteAt(1), formula::percent, &quantities::percent},
        {"Relative Position A",          bit(1), byteAt(2), formula::percent, &quantities::percent},
        {"Commanded Actuator Control B", bit(2), byteAt(3), formula::percent, &quantities::percent},
        {"Relative Position B",          bit(3), byteAt(4), formula::percent, &quantities::percent}}},
    {0x6D, 11, 0, "Fuel Pressure Control", {
        {"Commanded Fuel Rail Pressure A", bit(0), wordAt(1),  formula::timesTen, &quantities::absoluteRailPressure},
        {"Fuel Rail Pressure A",           bit(1), wordAt(3),  formula::timesTen, &quantities::absoluteRailPressure},
        {"Fuel Temperature A",             bit(2), byteAt(5),  formula::celsius,  &quantities::temperature},
        {"Commanded Fuel Rail Pressure B", bit(3), wordAt(6),  formula::timesTen, &quantities::absoluteRailPressure},
        {"Fuel Rail Pressure B",           bit(4), wordAt(8),  formula::timesTen, &quantities::absoluteRailPressure},
        {"Fuel Temperature B",             bit(5), byteAt(10), formula::celsius,  &quantities::temperature}}},
    {0x6E, 9, 0, "Injection Pressure Control", {
        {"Commanded Injection Control Pressure A", bit(0), wordAt(1), formula::timesTen, &quantities::absoluteRailPressure},
        {"Injection Pressure A",                   bit(1), wordAt(3), formula::timesTen, &quantities::absoluteRailPressure},
        {"Commanded Injection Control Pressure B", bit(2), wordAt(5), formula::timesTen, &quantities::absoluteRailPressure},
        {"Injection Pressure B",                   bit(3), wordAt(7), formula::timesTen, &quantities::absoluteRailPressure}}},
    {0x6F, 3, 0, "Turbocharger Compressor Inlet Pressure", {
        {"Sensor A", bit(0), byteAt(1), formula::plain, &quantities::inletPressure, bit(2), formula::timesEight},
        {"Sensor B", bit(1), byteAt(2), formula::plain, &quantities::inletPressure, bit(3), formula::timesEight}}},
    {0x70, 10, 0, "Boost Pressure Control", {
        {"Commanded Boost Pressure A",      bit(0), wordAt(1), formula::thirtySeconds, &quantities::boostPressure},
        {"Boost Pressure A",                bit(1), wordAt(3), formula::thirtySeconds, &quantities::boostPressure},
        {"Boost Pressure Control Status A", bit(2), byteAt(9), coded::bits<0, 2>,      &states::controlStatus},
        {"Commanded Boost Pressure B",      bit(3), wordAt(5), formula::thirtySeconds, &quantities::boostPressure},
        {"Boost Pressure B",                bit(4), wordAt(7), formula::thirtySeconds, &quantities::boostPressure},
        {"Boost Pressure Control Status B", bit(5), byteAt(9), coded::bits<2, 2>,      &states::controlStatus}}},
    {0x71, 6, 0, "Variable Geometry Turbo Control", {
        {"Commanded Variable Geometry Turbo Position A", bit(0), byteAt(1), formula::percent,  &quantities::percent},
        {"Variable Geometry Turbo Position A",           bit(1), byteAt(2), formula::percent,  &quantities::percent},
        {"Variable Geometry Turbo Control Status A",     bit(2), byteAt(5), coded::bits<0, 2>, &states::controlStatus},
        {"Commanded Variable Geometry Turbo Position B", bit(3), byteAt(3), formula::percent,  &quantities::percent},
        {"Variable Geometry Turbo Position B",           bit(4), byteAt(4), formula::percent,  &quantities::percent},
        {"Variable Geometry Turbo Control Status B",     bit(5), byteAt(5), coded::bits<2, 2>, &states::controlStatus}}},
    {0x72, 5, 0, "Wastegate Control", {
        {"Commanded Wastegate Position A", bit(0), byteAt(1), formula::percent, &quantities::percent},
        {"Wastegate Position A",           bit(1), byteAt(2), formula::percent, &quantities::percent},
        {"Commanded Wastegate Position B", bit(2), byteAt(3), formula::percent, &quantities::percent},
        {"Wastegate Position B",           bit(3), byteAt(4), formula::percent, &quantities::percent}}},
    {0x73, 5, 0, "Exhaust Pressure", {
        {"Sensor Bank 1", bit(0), wordAt(1), formula::hundredths, &quantities::exhaustPressure},
        {"Sensor Bank 2", bit(1), wordAt(3), formula::hundredths, &quantities::exhaustPressure}}},
    {0x74, 5, 0, "Turbocharger RPM", {
        {"Turbo A", bit(0), wordAt(1), formula::timesTen, &quantities::turboRpm},
        {"Turbo B", bit(1), wordAt(3), formula::timesTen, &quantities::turboRpm}}},
    turbochargerRow(0x75, "Turbocharger A Temperature"),
    turbochargerRow(0x76, "Turbocharger B Temperature"),
    {0x77, 5, 0, "Charge Air Cooler Temperature", {
        {"Bank 1 - Sensor 1", bit(0), byteAt(1), formula::celsius, &quantities::temperature},
        {"Bank 1 - Sensor 2", bit(1), byteAt(2), formula::celsius, &quantities::temperature},
        {"Bank 2 - Sensor 1", bit(2), byteAt(3), formula::celsius, &quantities::temperature},
        {"Bank 2 - Sensor 2", bit(3), byteAt(4), formula::celsius, &quantities::temperature}}},
    exhaustGasRow(0x78, "Exhaust Gas Temperature Bank 1"),
    exhaustGasRow(0x79, "Exhaust Gas Temperature Bank 2"),
    particulateFilterRow(0x7A, "Diesel Particulate Filter Bank 1"),
    particulateFilterRow(0x7B, "Diesel Particulate Filter Bank 2"),
    {0x7C, 9, 0, "Diesel Particulate Filter Temperature", {
        {"Inlet Temperature Bank 1",  bit(0), wordAt(1), formula::tenthCelsius, &quantities::exhaustTemperatureTenths},
        {"Outlet Temperature Bank 1", bit(1), wordAt(3), formula::tenthCelsius, &quantities::exhaustTemperatureTenths},
        {"Inlet Temperature Bank 2",  bit(2), wordAt(5), formula::tenthCelsius, &quantities::exhaustTemperatureTenths},
        {"Outlet Temperature Bank 2", bit(3), wordAt(7), formula::tenthCelsius, &quantities::exhaustTemperatureTenths}}},
    {0x7F, 13, 0, "Engine Run Time", {
        {"Total Engine Run Time",          bit(0), longAt(1), formula::plain, &quantities::longSeconds},
        {"Total Idle Run Time",            bit(1), longAt(5), formula::plain, &quantities::longSeconds},
        {"Total Run Time With PTO Active", bit(2), longAt(9), formula::plain, &quantities::longSeconds}}},
};
// clang-format on
static_assert(pidsRise(multiSensorRows), "PIDs must rise, none twice");
static_assert(allHoldTheirFields(multiSensorRows));

template <int id>
using MultiSensorParameter = RowParameter<TableParameter, multiSensorRows, id>;

using EngineTorqueData = MultiSensorParameter<0x64>;
using MassAirFlow = MultiSensorParameter<0x66>;
using EngineCoolantTemperature2 = MultiSensorParameter<0x67>;
using IntakeAirTemperature2 = MultiSensorParameter<0x68>;
using Egr = MultiSensorParameter<0x69>;
using DieselIntakeAirFlow = MultiSensorParameter<0x6A>;
using ExhaustGasRecirculationTemperature = MultiSensorParameter<0x6B>;
using ThrottleControlPosition = MultiSensorParameter<0x6C>;
using FuelPressureControlSystem = MultiSensorParameter<0x6D>;
using InjectionPressureControlSystem = MultiSensorParameter<0x6E>;
using TurbochargerCompressorInletPressure = MultiSensorParameter<0x6F>;
using BoostPressureControl = MultiSensorParameter<0x70>;
using VariableGeometryTurboControl = MultiSensorParameter<0x71>;
using WastegateControl = MultiSensorParameter<0x72>;
using ExhaustPressure = MultiSensorParameter<0x73>;
using TurbochargerRpm = MultiSensorParameter<0x74>;
using TurbochargerATemperature = MultiSensorParameter<0x75>;
using TurbochargerBTemperature = MultiSensorParameter<0x76>;
using ChargeAirCoolerTemperature = MultiSensorParameter<0x77>;
using ExhaustGasTemperatureBank1 = MultiSensorParameter<0x78>;
using ExhaustGasTemperatureBank2 = MultiSensorParameter<0x79>;
using DieselParticulateFilterBank1 = MultiSensorParameter<0x7A>;
using DieselParticulateFilterBank2 = MultiSensorParameter<0x7B>;
using DieselParticulateFilterTemperature = MultiSensorParameter<0x7C>;
using EngineRuntime2 = MultiSensorParameter<0x7F>;

} // namespace obd
