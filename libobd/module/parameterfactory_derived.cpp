// What no module reports, made for one module in one vehicle.

#include "libobd/powertrain/consumptionchoice.h"
#include "libobd/powertrain/torque.h"

#include <common/tracestream.h>
#include <obd/ivelmorasettings.h>
#include <obd/parameterfactory.h>

namespace obd {
namespace {

IgnitionType ignitionType(IEcu const& ecu, IVelmoraSettings const& settings)
{
    if (!settings.fuelTypeOverride()) {
        return ecu.ignitionType();
    }
    tervex::TraceStream << "Override default fuel type";
    return settings.ignitionType();
}

std::shared_ptr<PowertrainParameter> makeFuelConsumption(IEcu const& ecu, IVelmoraSettings const& settings)
{
    ConsumptionSettings const vehicle{settings.fuelCorrectionFactor(),
                                      static_cast<double>(settings.volumetricEfficiency()),
                                      settings.engineDisplacement()};
    return createConsumption(ecu, ignitionType(ecu, settings), vehicle);
}

} // namespace

std::shared_ptr<PowertrainParameter>
ParameterFactory::createParameter(IEcu const& ecu, IVelmoraSettings const& settings, ParameterIdentifier::Id id)
{
    switch (id) {
    case ParameterIdentifier::FuelConsumption:
        return makeFuelConsumption(ecu, settings);
    case ParameterIdentifier::EnginePower:
        return std::make_shared<EnginePower>(static_cast<unsigned int>(settings.vehicleWeight()));
    case ParameterIdentifier::Torque:
        return std::make_shared<Torque>(static_cast<unsigned int>(settings.vehicleWeight()));
    default:
        return createParameter(id);
    }
}

} // namespace obd
