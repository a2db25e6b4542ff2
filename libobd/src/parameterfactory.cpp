#include "libobd/src/parameterfactory.h"

#include "libobd/powertrain/codedparameters.h"
#include "libobd/powertrain/fueltrim.h"
#include "libobd/powertrain/monitorstatus.h"
#include "libobd/powertrain/numericparameters.h"
#include "libobd/powertrain/oxygensensorspresent.h"

#include <algorithm>
#include <iterator>

namespace obd {
namespace {

using Maker = std::shared_ptr<PowertrainParameter> (*)(ObdMode mode, unsigned char frame);

struct FactoryRow
{
    int pid;
    Maker make;
};

template <typename Parameter>
std::shared_ptr<PowertrainParameter> make(ObdMode mode, unsigned char frame)
{
    return std::make_shared<Parameter>(mode, frame);
}

template <typename Parameter>
constexpr FactoryRow row(int pid)
{
    return {pid, make<Parameter>};
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
    row<SaeStandard>(0x1C),
    row<OxygenSensorsPresent1d>(0x1D),
    row<AuxiliaryInputStatus>(0x1E),
    row<EngineRuntime>(0x1F),
    row<MilDistance>(0x21),
    row<RelativeFuelRailPressure>(0x22),
    row<FuelRailPressure>(0x23),
    row<CommandedEgr>(0x2C),
    row<EgrError>(0x2D),
    row<EvaporativePurge>(0x2E),
    row<FuelLevelInput>(0x2F),
    row<WarmUps>(0x30),
    row<DistanceTraveled>(0x31),
    row<VaporPressure>(0x32),
    row<BarometricPressure>(0x33),
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
    row<AuxiliaryIo>(0x65),
    row<NOxControlAreaStatus>(0x7D),
    row<PmControlAreaStatus>(0x7E),
};
static_assert(pidsRise(sensors), "PIDs must rise, none twice");
static_assert(std::size(sensors) == 70);

std::shared_ptr<PowertrainParameter> makeSensor(ParameterIdentifier::Id id, ObdMode mode, unsigned char frame)
{
    auto const* const found = std::lower_bound(std::begin(sensors), std::end(sensors), static_cast<int>(id),
                                               [](FactoryRow const& row, int pid) { return row.pid < pid; });
    return found != std::end(sensors) && found->pid == id ? found->make(mode, frame) : nullptr;
}

} // namespace

std::shared_ptr<PowertrainParameter> ParameterFactory::createParameter(ParameterIdentifier::Id id)
{
    // No freeze frame holds the readiness, so it has no row.
    return id == 0x01 ? std::make_shared<MonitorStatus>() : makeSensor(id, ObdMode::CurrentData, 0);
}

std::shared_ptr<PowertrainParameter> ParameterFactory::createFreezeFrameParameter(ParameterIdentifier::Id id,
                                                                                  unsigned char frame)
{
    return makeSensor(id, ObdMode::FreezeFrame, frame);
}

} // namespace obd
