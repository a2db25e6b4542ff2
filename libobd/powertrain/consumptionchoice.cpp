#include "libobd/powertrain/consumptionchoice.h"

#include "libobd/powertrain/fuelconsumption.h"

namespace obd {
namespace {

template <typename Parameter>
std::shared_ptr<Parameter> make(IEcu const& ecu, ConsumptionSettings const& settings)
{
    auto parameter = std::make_shared<Parameter>(ecu);
    parameter->setCorrectionFactor(settings.correctionFactor);
    return parameter;
}

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

} // namespace obd
