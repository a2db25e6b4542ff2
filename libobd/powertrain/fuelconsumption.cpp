#include "libobd/powertrain/fuelconsumption.h"

#include "libobd/powertrain/consumptionchoice.h"
#include "libobd/powertrain/numericparameters.h"

#include <common/logrecord.h>
#include <obd/iobdproxy.h>

#include <cmath>
#include <utility>

namespace obd {
namespace {

constexpr DerivedRow fuelConsumptionRow{ParameterIdentifier::FuelConsumption,
                                        "Fuel consumption",
                                        1,
                                        {UnitConsumptionMetric, 0.0, 500.0},
                                        {UnitConsumptionImperial, 0.0, 500.0}};

constexpr unsigned char gasPids[] = {0x10, 0x0D};
constexpr unsigned char gasMapPids[] = {0x0F, 0x0D, 0x0C, 0x0B};
constexpr unsigned char dieselPids[] = {0x10, 0x04, 0x0D};

constexpr double milesPerGallonAtOneLitre = 235.214583; // at one litre per 100 km; of the US gallon

} // namespace

FuelConsumption::FuelConsumption() : DerivedParameter(fuelConsumptionRow) {}

void FuelConsumption::addInput(ConsumptionInput input, std::unique_ptr<TableParameter> parameter)
{
    m_inputs.push_back({input, std::move(parameter)});
}

void FuelConsumption::addLambda(IEcu const& ecu)
{
    LambdaSource const* const source = findLambdaSource(ecu);
    TERVEX_LOG(Info) << lambdaSourceText(source);
    if (source != nullptr) {
        addInput(ConsumptionInput::Lambda, source->make());
    }
}

IQuery::UpdateStatus FuelConsumption::update(std::shared_ptr<IObdProxy> const& proxy)
{
    Ecus const ecus = choose(proxy->ecus(), [this](IEcu const& ecu) { return suits(ecu); });
    bool success = false;
    for (Input const& each : m_inputs) {
        success |= poll(*each.parameter, proxy, ecus,
                        [this, &each](IEcu const& ecu, Sample const& sample) { feed(ecu, each.input, sample); });
    }
    judge(ecus, [this](IEcu const& ecu) { return neededBy(ecu); });
    return status(success);
}

// A module without lambda is taken to burn the ideal mixture.
DerivedParameter::Inputs FuelConsumption::neededBy(IEcu const& ecu) const
{
    Inputs needed;
    for (Input const& each : m_inputs) {
        unsigned char const pid = ParameterIdentifier(each.parameter->pid()).toOid();
        if (each.input != ConsumptionInput::Lambda || ecu.isSupported(ObdMode::CurrentData, pid, 0)) {
            needed.push_back(each.parameter.get());
        }
    }
    return needed;
}

double FuelConsumption::consumption(IEcu const& ecu, UnitSystem system) const
{
    return convert(mean(ecu) * m_correctionFactor, system);
}

double FuelConsumption::convert(double litres, UnitSystem system) const
{
    if (system != UnitSystem::Imperial) {
        return litres;
    }
    // So little is an idling engine's; it would read as hundreds of miles.
    return std::fabs(litres) < 1.0 ? 0.0 : milesPerGallonAtOneLitre / litres;
}

GasConsumption::GasConsumption(IEcu const& ecu)
{
    addInput<AirFlowRate>(ConsumptionInput::Air);
    addLambda(ecu);
    addInput<VehicleSpeed>(ConsumptionInput::Speed);
}

bool GasConsumption::isValid(IEcu const& ecu)
{
    return supportsAll(ecu, gasPids);
}

GasConsumptionMap::GasConsumptionMap(IEcu const& ecu)
{
    addInput<ManifoldPressure>(ConsumptionInput::Air);
    addLambda(ecu);
    addInput<IntakeAirTemperature>(ConsumptionInput::IntakeTemperature);
    addInput<EngineRpm>(ConsumptionInput::Rpm);
    addInput<VehicleSpeed>(ConsumptionInput::Speed);
}

bool GasConsumptionMap::isValid(IEcu const& ecu)
{
    return supportsAll(ecu, gasMapPids);
}

DieselConsumption::DieselConsumption(IEcu const& ecu)
{
    addInput<AirFlowRate>(ConsumptionInput::Air);
    addInput<CalculatedEngineLoad>(ConsumptionInput::Load);
    addLambda(ecu);
    addInput<VehicleSpeed>(ConsumptionInput::Speed);
}

bool DieselConsumption::isValid(IEcu const& ecu)
{
    return supportsAll(ecu, dieselPids);
}

} // namespace obd
