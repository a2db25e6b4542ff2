#pragma once

#include "libobd/powertrain/codedparameters.h"
#include "libobd/powertrain/fueltrim.h"
#include "libobd/powertrain/multisensorparameters.h"
#include "libobd/powertrain/numericparameters.h"
#include "libobd/powertrain/oxygensensors.h"
#include "libobd/powertrain/oxygensensorspresent.h"

#include <map>
#include <memory>
#include <string>

namespace support {

using MakeParameter = std::shared_ptr<obd::PowertrainParameter> (*)(obd::ObdMode mode, unsigned char frame);

template <typename Parameter>
std::shared_ptr<obd::PowertrainParameter> makeParameter(obd::ObdMode mode, unsigned char frame)
{
    return std::make_shared<Parameter>(mode, frame);
}

#define SUPPORT_PARAMETER(name)                                                                                        \
    {                                                                                                                  \
#name, makeParameter < obd::name>                                                                              \
    }

// Every PID class by its name.
inline std::map<std::string, MakeParameter> const& parameterClasses()
{
    static std::map<std::string, MakeParameter> const classes{
        SUPPORT_PARAMETER(FuelSystem),
        SUPPORT_PARAMETER(CalculatedEngineLoad),
        SUPPORT_PARAMETER(EngineCoolantTemperature),
        SUPPORT_PARAMETER(ShortTermFuelTrimBank1),
        SUPPORT_PARAMETER(LongTermFuelTrimBank1),
        SUPPORT_PARAMETER(ShortTermFuelTrimBank2),
        SUPPORT_PARAMETER(LongTermFuelTrimBank2),
        SUPPORT_PARAMETER(FuelPressure),
        SUPPORT_PARAMETER(ManifoldPressure),
        SUPPORT_PARAMETER(EngineRpm),
        SUPPORT_PARAMETER(VehicleSpeed),
        SUPPORT_PARAMETER(TimingAdvance),
        SUPPORT_PARAMETER(IntakeAirTemperature),
        SUPPORT_PARAMETER(AirFlowRate),
        SUPPORT_PARAMETER(ThrottlePosition),
        SUPPORT_PARAMETER(SecondaryAirStatus),
        SUPPORT_PARAMETER(OxygenSensorsPresent13),
        SUPPORT_PARAMETER(OxygenSensor1Bank1),
        SUPPORT_PARAMETER(OxygenSensor2Bank1),
        SUPPORT_PARAMETER(OxygenSensor3Bank1),
        SUPPORT_PARAMETER(OxygenSensor4Bank1),
        SUPPORT_PARAMETER(OxygenSensor1Bank2),
        SUPPORT_PARAMETER(OxygenSensor2Bank2),
        SUPPORT_PARAMETER(OxygenSensor3Bank2),
        SUPPORT_PARAMETER(OxygenSensor4Bank2),
        SUPPORT_PARAMETER(SaeStandard),
        SUPPORT_PARAMETER(OxygenSensorsPresent1d),
        SUPPORT_PARAMETER(AuxiliaryInputStatus),
        SUPPORT_PARAMETER(EngineRuntime),
        SUPPORT_PARAMETER(MilDistance),
        SUPPORT_PARAMETER(RelativeFuelRailPressure),
        SUPPORT_PARAMETER(FuelRailPressure),
        SUPPORT_PARAMETER(OxygenSensorErvSensor1),
        SUPPORT_PARAMETER(OxygenSensorErvSensor2),
        SUPPORT_PARAMETER(OxygenSensorErvSensor3),
        SUPPORT_PARAMETER(OxygenSensorErvSensor4),
        SUPPORT_PARAMETER(OxygenSensorErvSensor5),
        SUPPORT_PARAMETER(OxygenSensorErvSensor6),
        SUPPORT_PARAMETER(OxygenSensorErvSensor7),
        SUPPORT_PARAMETER(OxygenSensorErvSensor8),
        SUPPORT_PARAMETER(CommandedEgr),
        SUPPORT_PARAMETER(EgrError),
        SUPPORT_PARAMETER(EvaporativePurge),
        SUPPORT_PARAMETER(FuelLevelInput),
        SUPPORT_PARAMETER(WarmUps),
        SUPPORT_PARAMETER(DistanceTraveled),
        SUPPORT_PARAMETER(VaporPressure),
        SUPPORT_PARAMETER(BarometricPressure),
        SUPPORT_PARAMETER(OxygenSensor1Erc),
        SUPPORT_PARAMETER(OxygenSensor2Erc),
        SUPPORT_PARAMETER(OxygenSensor3Erc),
        SUPPORT_PARAMETER(OxygenSensor4Erc),
        SUPPORT_PARAMETER(OxygenSensor5Erc),
        SUPPORT_PARAMETER(OxygenSensor6Erc),
        SUPPORT_PARAMETER(OxygenSensor7Erc),
        SUPPORT_PARAMETER(OxygenSensor8Erc),
        SUPPORT_PARAMETER(CatalystTemperatureBank1Sensor1),
        SUPPORT_PARAMETER(CatalystTemperatureBank2Sensor1),
        SUPPORT_PARAMETER(CatalystTemperatureBank1Sensor2),
        SUPPORT_PARAMETER(CatalystTemperatureBank2Sensor2),
        SUPPORT_PARAMETER(ControlModuleVoltage),
        SUPPORT_PARAMETER(AbsoluteLoadValue),
        SUPPORT_PARAMETER(CommandedFar),
        SUPPORT_PARAMETER(RelativeThrottlePosition),
        SUPPORT_PARAMETER(AmbientAirTemperature),
        SUPPORT_PARAMETER(AbsoluteThrottlePositionB),
        SUPPORT_PARAMETER(AbsoluteThrottlePositionC),
        SUPPORT_PARAMETER(AcceleratorPedalPositionD),
        SUPPORT_PARAMETER(AcceleratorPedalPositionE),
        SUPPORT_PARAMETER(AcceleratorPedalPositionF),
        SUPPORT_PARAMETER(CommandedThrottleActuatorControl),
        SUPPORT_PARAMETER(EngineRuntimeMil),
        SUPPORT_PARAMETER(EngineRuntimeDtc),
        SUPPORT_PARAMETER(FuelTypeParameter),
        SUPPORT_PARAMETER(AlcoholFuelPercentage),
        SUPPORT_PARAMETER(AbsoluteEvapSystemVaporPressure),
        SUPPORT_PARAMETER(EvapSystemVaporPressure),
        SUPPORT_PARAMETER(ShortTermSecondaryFuelTrimBank1),
        SUPPORT_PARAMETER(LongTermSecondaryFuelTrimBank1),
        SUPPORT_PARAMETER(ShortTermSecondaryFuelTrimBank2),
        SUPPORT_PARAMETER(LongTermSecondaryFuelTrimBank2),
        SUPPORT_PARAMETER(AbsoluteFuelRailPressure),
        SUPPORT_PARAMETER(RelativeAcceleratorPedalPosition),
        SUPPORT_PARAMETER(BatteryPackRemainingCharge),
        SUPPORT_PARAMETER(EngineOilTemperature),
        SUPPORT_PARAMETER(FuelInjectionTiming),
        SUPPORT_PARAMETER(EngineFuelRate),
        SUPPORT_PARAMETER(EmissionStandard),
        SUPPORT_PARAMETER(RequestedTorque),
        SUPPORT_PARAMETER(ActualTorque),
        SUPPORT_PARAMETER(ReferenceTorque),
        SUPPORT_PARAMETER(EngineTorqueData),
        SUPPORT_PARAMETER(AuxiliaryIo),
        SUPPORT_PARAMETER(MassAirFlow),
        SUPPORT_PARAMETER(EngineCoolantTemperature2),
        SUPPORT_PARAMETER(IntakeAirTemperature2),
        SUPPORT_PARAMETER(Egr),
        SUPPORT_PARAMETER(DieselIntakeAirFlow),
        SUPPORT_PARAMETER(ExhaustGasRecirculationTemperature),
        SUPPORT_PARAMETER(ThrottleControlPosition),
        SUPPORT_PARAMETER(FuelPressureControlSystem),
        SUPPORT_PARAMETER(InjectionPressureControlSystem),
        SUPPORT_PARAMETER(TurbochargerCompressorInletPressure),
        SUPPORT_PARAMETER(BoostPressureControl),
        SUPPORT_PARAMETER(VariableGeometryTurboControl),
        SUPPORT_PARAMETER(WastegateControl),
        SUPPORT_PARAMETER(ExhaustPressure),
        SUPPORT_PARAMETER(TurbochargerRpm),
        SUPPORT_PARAMETER(TurbochargerATemperature),
        SUPPORT_PARAMETER(TurbochargerBTemperature),
        SUPPORT_PARAMETER(ChargeAirCoolerTemperature),
        SUPPORT_PARAMETER(ExhaustGasTemperatureBank1),
        SUPPORT_PARAMETER(ExhaustGasTemperatureBank2),
        SUPPORT_PARAMETER(DieselParticulateFilterBank1),
        SUPPORT_PARAMETER(DieselParticulateFilterBank2),
        SUPPORT_PARAMETER(DieselParticulateFilterTemperature),
        SUPPORT_PARAMETER(NOxControlAreaStatus),
        SUPPORT_PARAMETER(PmControlAreaStatus),
        SUPPORT_PARAMETER(EngineRuntime2),
    };
    return classes;
}

#undef SUPPORT_PARAMETER

// A live reading of the class. Throws if there is none of that name.
inline std::shared_ptr<obd::PowertrainParameter> liveParameter(std::string const& name)
{
    return parameterClasses().at(name)(obd::ObdMode::CurrentData, 0);
}

} // namespace support
