#include "libobd/powertrain/consumptionchoice.h"

#include "libobd/powertrain/fuelconsumption.h"
#include "libobd/powertrain/numericparameters.h"
#include "libobd/powertrain/oxygensensors.h"

namespace obd {
namespace {

template <typename Parameter>
std::shared_ptr<Parameter> make(IEcu const& ecu, ConsumptionSettings const& settings)
{
    auto parameter = std::make_shared<Parameter>(ecu);
    parameter->setCorrectionFactor(settings.correctionFactor);
    return parameter;
}

template <typename Parameter>
std::unique_ptr<TableParameter> makeSource()
{
    return std::make_unique<Parameter>(ObdMode::CurrentData, static_cast<unsigned char>(0));
}

// The best first: what is commanded is steadier than what a sensor sees.
constexpr LambdaSource sources[] = {
    {0x44, "Using Commanded FA ratio as lambda source", makeSource<CommandedFar>},
    {0x24, "Using O2S ER-V as lambda source", makeSource<OxygenSensorErvSensor1>},
    {0x34, "Using O2S ER-C as lambda source", makeSource<OxygenSensor1Erc>},
};

} // namespace

ConsumptionKind chooseConsumption(IEcu const& ecu, IgnitionType ignitionType)
{
    if (ignitionType == IgnitionType::Compression) {
        return DieselConsumption::isValid(ecu) ? ConsumptionKind::Diesel : ConsumptionKind::None;
    }
    if (GasConsumption::isValid(ecu)) {
        return ConsumptionKind::GasMaf;
    }
    return GasConsumptionMap::isValid(ecu) ? ConsumptionKind::GasMap : ConsumptionKind::None;
}

std::shared_ptr<PowertrainParameter> createConsumption(IEcu const& ecu, IgnitionType ignitionType,
                                                       ConsumptionSettings const& settings)
{
    switch (chooseConsumption(ecu, ignitionType)) {
    case ConsumptionKind::GasMaf:
        return make<GasConsumption>(ecu, settings);
    case ConsumptionKind::GasMap: {
        auto parameter = make<GasConsumptionMap>(ecu, settings);
        parameter->setVolumetricEfficiency(settings.volumetricEfficiency);
        parameter->setEngineDisplacement(settings.engineDisplacement);
        return parameter;
    }
    case ConsumptionKind::Diesel:
        return make<DieselConsumption>(ecu, settings);
    case ConsumptionKind::None:
        break;
    }
    return nullptr;
}

LambdaSource const* findLambdaSource(IEcu const& ecu)
{
    for (LambdaSource const& source : sources) {
        if (ecu.isSupported(ObdMode::CurrentData, source.pid, 0)) {
            return &source;
        }
    }
    return nullptr;
}

char const* lambdaSourceText(LambdaSource const* source)
{
    return source != nullptr ? source->text : "No lambda source available";
}

} // namespace obd
