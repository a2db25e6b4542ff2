#include "libobd/powertrain/batteryvoltage.h"
#include "libobd/powertrain/boostpressure.h"
#include "libobd/powertrain/codedparameters.h"
#include "libobd/powertrain/fueltrim.h"
#include "libobd/powertrain/monitorstatus.h"
#include "libobd/powertrain/multisensorparameters.h"
#include "libobd/powertrain/numericparameters.h"
#include "libobd/powertrain/oxygensensors.h"
#include "libobd/powertrain/oxygensensorspresent.h"
#include "libobd/powertrain/sensorpids.h"
#include "libobd/powertrain/torque.h"

#include <common/logrecord.h>
#include <obd/parameterfactory.h>

#include <algorithm>
#include <iterator>
#include <type_traits>

namespace obd {
namespace {

using Maker = std::shared_ptr<PowertrainParameter> (*)(ObdMode mode, unsigned char frame);

struct FactoryRow
{
    int pid;
    Maker make;
    std::size_t (*dataLength)();
};

template <typename Parameter>
std::shared_ptr<PowertrainParameter> make(ObdMode mode, unsigned char frame)
{
    return std::make_shared<Parameter>(mode, frame);
}

// The shortest payload that a class accepts is the whole of what a module sends, but for the trim of a second bank.
template <typename Parameter>
std::size_t dataLength()
{
    bool const second = std::is_base_of_v<FuelTrim, Parameter> && FuelTrim::byteBInUse();
    return second ? Parameter::bytes + 1 : Parameter::bytes;
}

template <typename Parameter>
constexpr FactoryRow row(int pid)
{
    return {pid, make<Parameter>, dataLength<Parameter>};
}

// The PIDs that are read as sensors. Not among them, on purpose: the support masks (0x00, 0x20, ...), the readiness
// (0x01, 0x41), the trouble code of the freeze frame (0x02) and the test equipment configurations (0x4F, 0x50), which
// have their own ways.
constexpr FactoryRow sensors[] = {
    row<FuelSystem>(0x03),
    row<CalculatedEngineLoad>(0x04),
    row<EngineCoolantTemperature>(0x05),
    row<ShortTermFuelTrimBank1>(0x06),
    row<LongTermFuelTrimBank1>(0x07),
    row<ShortTermFuelTrimBank2>(0x08),
    row<LongTermFuelTrimBank2>(0x09),
    row<FuelPressure>(0x0A),
    row<ManifoldPressure>(0x0B),
    row<EngineRpm>(0x0C),
    row<VehicleSpeed>(0x0D),
    row<TimingAdvance>(0x0E),
    row<IntakeAirTemperature>(0x0F),
    row<AirFlowRate>(0x10),
    row<ThrottlePosition>(0x11),
    row<SecondaryAirStatus>(0x12),
    row<OxygenSensorsPresent13>(0x13),
    row<OxygenSensor1Bank1>(0x14),
    row<OxygenSensor2Bank1>(0x15),
    row<OxygenSensor3Bank1>(0x16),
    row<OxygenSensor4Bank1>(0x17),
    row<OxygenSensor1Bank2>(0x18),
    row<OxygenSensor2Bank2>(0x19),
    row<OxygenSensor3Bank2>(0x1A),
    row<OxygenSensor4Bank2>(0x1B),
    row<SaeStandard>(0x1C),
    row<OxygenSensorsPresent1d>(0x1D),
    row<AuxiliaryInputStatus>(0x1E),
    row<EngineRuntime>(0x1F),
    row<MilDistance>(0x21),
    row<RelativeFuelRailPressure>(0x22),
    row<FuelRailPressure>(0x23),
    row<OxygenSensorErvSensor1>(0x24),
    row<OxygenSensorErvSensor2>(0x25),
    row<OxygenSensorErvSensor3>(0x26),
    row<OxygenSensorErvSensor4>(0x27),
    row<OxygenSensorErvSensor5>(0x28),
    row<OxygenSensorErvSensor6>(0x29),
    row<OxygenSensorErvSensor7>(0x2A),
    row<OxygenSensorErvSensor8>(0x2B),
    row<CommandedEgr>(0x2C),
    row<EgrError>(0x2D),
    row<EvaporativePurge>(0x2E),
    row<FuelLevelInput>(0x2F),
    row<WarmUps>(0x30),
    row<DistanceTraveled>(0x31),
    row<VaporPressure>(0x32),
    row<BarometricPressure>(0x33),
    row<OxygenSensor1Erc>(0x34),
    row<OxygenSensor2Erc>(0x35),
    row<OxygenSensor3Erc>(0x36),
    row<OxygenSensor4Erc>(0x37),
    row<OxygenSensor5Erc>(0x38),
    row<OxygenSensor6Erc>(0x39),
    row<OxygenSensor7Erc>(0x3A),
    row<OxygenSensor8Erc>(0x3B),
    row<CatalystTemperatureBank1Sensor1>(0x3C),
    row<CatalystTemperatureBank2Sensor1>(0x3D),
    row<CatalystTemperatureBank1Sensor2>(0x3E),
    row<CatalystTemperatureBank2Sensor2>(0x3F),
    row<ControlModuleVoltage>(0x42),
    row<AbsoluteLoadValue>(0x43),
    row<CommandedFar>(0x44),
    row<RelativeThrottlePosition>(0x45),
    row<AmbientAirTemperature>(0x46),
    row<AbsoluteThrottlePositionB>(0x47),
    row<AbsoluteThrottlePositionC>(0x48),
    row<AcceleratorPedalPositionD>(0x49),
    row<AcceleratorPedalPositionE>(0x4A),
    row<AcceleratorPedalPositionF>(0x4B),
    row<CommandedThrottleActuatorControl>(0x4C),
    row<EngineRuntimeMil>(0x4D),
    row<EngineRuntimeDtc>(0x4E),
    row<FuelTypeParameter>(0x51),
    row<AlcoholFuelPercentage>(0x52),
    row<AbsoluteEvapSystemVaporPressure>(0x53),
    row<EvapSystemVaporPressure>(0x54),
    row<ShortTermSecondaryFuelTrimBank1>(0x55),
    row<LongTermSecondaryFuelTrimBank1>(0x56),
    row<ShortTermSecondaryFuelTrimBank2>(0x57),
    row<LongTermSecondaryFuelTrimBank2>(0x58),
    row<AbsoluteFuelRailPressure>(0x59),
    row<RelativeAcceleratorPedalPosition>(0x5A),
    row<BatteryPackRemainingCharge>(0x5B),
    row<EngineOilTemperature>(0x5C),
    row<FuelInjectionTiming>(0x5D),
    row<EngineFuelRate>(0x5E),
    row<EmissionStandard>(0x5F),
    row<RequestedTorque>(0x61),
    row<ActualTorque>(0x62),
    row<ReferenceTorque>(0x63),
    row<EngineTorqueData>(0x64),
    row<AuxiliaryIo>(0x65),
    row<MassAirFlow>(0x66),
    row<EngineCoolantTemperature2>(0x67),
    row<IntakeAirTemperature2>(0x68),
    row<Egr>(0x69),
    row<DieselIntakeAirFlow>(0x6A),
    row<ExhaustGasRecirculationTemperature>(0x6B),
    row<ThrottleControlPosition>(0x6C),
    row<FuelPressureControlSystem>(0x6D),
    row<InjectionPressureControlSystem>(0x6E),
    row<TurbochargerCompressorInletPressure>(0x6F),
    row<BoostPressureControl>(0x70),
    row<VariableGeometryTurboControl>(0x71),
    row<WastegateControl>(0x72),
    row<ExhaustPressure>(0x73),
    row<TurbochargerRpm>(0x74),
    row<TurbochargerATemperature>(0x75),
    row<TurbochargerBTemperature>(0x76),
    row<ChargeAirCoolerTemperature>(0x77),
    row<ExhaustGasTemperatureBank1>(0x78),
    row<ExhaustGasTemperatureBank2>(0x79),
    row<DieselParticulateFilterBank1>(0x7A),
    row<DieselParticulateFilterBank2>(0x7B),
    row<DieselParticulateFilterTemperature>(0x7C),
    row<NOxControlAreaStatus>(0x7D),
    row<PmControlAreaStatus>(0x7E),
    row<EngineRuntime2>(0x7F),
};
static_assert(pidsRise(sensors), "PIDs must rise, none twice");
static_assert(std::size(sensors) == 119);

// Null for an identifier that is no sensor.
FactoryRow const* findSensor(ParameterIdentifier::Id id)
{
    auto const* const found = std::lower_bound(std::begin(sensors), std::end(sensors), static_cast<int>(id),
                                               [](FactoryRow const& row, int pid) { return row.pid < pid; });
    return found != std::end(sensors) && found->pid == id ? found : nullptr;
}

std::shared_ptr<PowertrainParameter> makeSensor(ParameterIdentifier::Id id, ObdMode mode, unsigned char frame)
{
    FactoryRow const* const found = findSensor(id);
    return found != nullptr ? found->make(mode, frame) : nullptr;
}

// Of those that are no sensors: masks, readiness and tester configurations fill four bytes.
std::optional<std::size_t> otherDataLength(int pid)
{
    constexpr std::size_t codeLength = 2;
    constexpr std::size_t fieldsLength = 4;
    switch (pid) {
    case freezeFrameCodePid:
        return codeLength;
    case monitorStatusPid:
    case 0x41:
    case 0x4F:
    case 0x50:
        return fieldsLength;
    default:
        break;
    }
    bool const isMask = pid >= 0 && pid <= lastSupportMask && pid % supportMaskStep == 0;
    return isMask ? std::optional(fieldsLength) : std::nullopt;
}

// Of a usual car, for who does not know the vehicle's.
constexpr unsigned int usualWeight = 1500; // kg

template <typename Parameter>
std::shared_ptr<PowertrainParameter> makeWithUsualWeight(char const* name)
{
    TERVEX_LOG(Error) << name << " created without setting the vehicle weight";
    return std::make_shared<Parameter>(usualWeight);
}

} // namespace

// No freeze frame holds the readiness or a derived value, so they have no row.
std::shared_ptr<PowertrainParameter> ParameterFactory::createParameter(ParameterIdentifier::Id id)
{
    switch (static_cast<int>(id)) {
    case 0x01:
        return std::make_shared<MonitorStatus>();
    case ParameterIdentifier::BatteryVoltage:
        return std::make_shared<BatteryVoltage>();
    case ParameterIdentifier::EnginePower:
        return makeWithUsualWeight<EnginePower>("EnginePower");
    case ParameterIdentifier::Torque:
        return makeWithUsualWeight<Torque>("Torque");
    case ParameterIdentifier::BoostPressure:
        return std::make_shared<BoostPressure>();
    default:
        return makeSensor(id, ObdMode::CurrentData, 0);
    }
}

std::shared_ptr<PowertrainParameter> ParameterFactory::createFreezeFrameParameter(ParameterIdentifier::Id id,
                                                                                  unsigned char frame)
{
    return makeSensor(id, ObdMode::FreezeFrame, frame);
}

std::optional<std::size_t> ParameterFactory::dataLength(ParameterIdentifier::Id id)
{
    FactoryRow const* const found = findSensor(id);
    return found != nullptr ? found->dataLength() : otherDataLength(id);
}

} // namespace obd
