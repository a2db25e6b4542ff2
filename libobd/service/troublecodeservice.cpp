#include "libobd/service/troublecodeservice.h"

#include "libobd/parameters/cleartroublecodes.h"
#include "libobd/parameters/dtcparameter.h"
#include "libobd/powertrain/monitorstatus.h"
#include "libobd/powertrain/numericparameters.h"
#include "libobd/service/builtservice.h"
#include "libobd/service/sensormodels.h"

#include <common/tracestream.h>
#include <obd/parameterdescriptor.h>
#include <obd/sensorpids.h>

namespace obd {

namespace {

template <typename Parameter>
std::shared_ptr<PowertrainParameter> makeCurrent()
{
    return std::make_shared<Parameter>(ObdMode::CurrentData, static_cast<unsigned char>(0));
}

} // namespace

TroubleCodeService::TroubleCodeService(IObdVelmora const* obd, Following following)
    : BaseService(obd, servicePriority, following)
{}

template <typename Codes>
Outcome<TroubleCodeService::Dtcs> TroubleCodeService::askCodes() const
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const codes = std::make_shared<Codes>();
    return ask(*this, module, std::nullopt, codes, [&] { return codes->getTroubleCodes(*module); });
}

Outcome<TroubleCodeService::Dtcs> TroubleCodeService::askConfirmedCodes()
{
    return askCodes<ConfirmedTroubleCodes>();
}

Outcome<TroubleCodeService::Dtcs> TroubleCodeService::askPendingCodes()
{
    return askCodes<PendingTroubleCodes>();
}

Outcome<TroubleCodeService::Dtcs> TroubleCodeService::askPermanentCodes()
{
    return askCodes<PermanentTroubleCodes>();
}

std::vector<std::shared_ptr<DtcDataModel>> TroubleCodeService::fetchConfirmedCodes()
{
    return askConfirmedCodes().value;
}

std::vector<std::shared_ptr<DtcDataModel>> TroubleCodeService::fetchPendingCodes()
{
    return askPendingCodes().value;
}

std::vector<std::shared_ptr<DtcDataModel>> TroubleCodeService::fetchPermanentCodes()
{
    return askPermanentCodes().value;
}

Outcome<std::shared_ptr<ITroubleCodeService::MilStatus>> TroubleCodeService::askMil(Need const& needed) const
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const status = std::make_shared<MonitorStatus>();
    return ask(*this, module, needed, status, [&] {
        bool const on = status->isMalfunctionIndicatorLightOn(*module);
        tervex::TraceStream << (on ? "MIL on" : "MIL off");
        return std::make_shared<MilStatus>(on ? MilStatus::On : MilStatus::Off);
    });
}

Outcome<std::shared_ptr<ITroubleCodeService::MilStatus>> TroubleCodeService::askMilStatus()
{
    return askMil(Needed{ObdMode::CurrentData, monitorStatusPid});
}

std::shared_ptr<ITroubleCodeService::MilStatus> TroubleCodeService::fetchMilStatus()
{
    return askMil(std::nullopt).value;
}

Outcome<std::shared_ptr<SensorDataModel>> TroubleCodeService::askDistance(bool sinceMil)
{
    return askRequest(sinceMil ? makeCurrent<MilDistance>() : makeCurrent<DistanceTraveled>());
}

Outcome<std::shared_ptr<SensorDataModel>> TroubleCodeService::askRuntime(bool sinceMil)
{
    return askRequest(sinceMil ? makeCurrent<EngineRuntimeMil>() : makeCurrent<EngineRuntimeDtc>());
}

std::shared_ptr<SensorDataModel> TroubleCodeService::fetchDistance(bool sinceMil)
{
    return askDistance(sinceMil).value;
}

std::shared_ptr<SensorDataModel> TroubleCodeService::fetchRuntime(bool sinceMil)
{
    return askRuntime(sinceMil).value;
}

Outcome<std::shared_ptr<SensorDataModel>>
TroubleCodeService::askRequest(std::shared_ptr<PowertrainParameter> const& parameter) const
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    unsigned char const pid = ParameterIdentifier(parameter->pid()).toOid();
    if (module != nullptr && !module->isSupported(ObdMode::CurrentData, pid, 0)) {
        // No request for what the vehicle does not have, nor for what it may have had no time to tell of.
        Verdict const detection = module->detection(ObdMode::CurrentData, 0);
        return detection.isTold() ? Verdict{OutcomeKind::NotOffered} : detection;
    }
    return ask(*this, module, std::nullopt, parameter, [&]() -> std::shared_ptr<SensorDataModel> {
        UnitSystem const system = unitSystem(); // once, for it may change meanwhile
        std::shared_ptr<SensorDescriptor> const sensor = getFirstSensor(parameter, module, system);
        std::shared_ptr<SensorValue> const value = getFirstSensorValue(parameter, module, system);
        return sensor != nullptr && value != nullptr ? makeSensorModel(*sensor, sensor->description(), value) : nullptr;
    });
}

std::shared_ptr<SensorDescriptor>
TroubleCodeService::getFirstSensor(std::shared_ptr<PowertrainParameter> const& parameter,
                                   std::shared_ptr<IEcu> const& ecu, UnitSystem system)
{
    auto const sensors = ParameterDescriptor(parameter, ecu, system).sensors();
    return sensors.empty() ? nullptr : sensors.front();
}

std::shared_ptr<SensorValue>
TroubleCodeService::getFirstSensorValue(std::shared_ptr<PowertrainParameter> const& parameter,
                                        std::shared_ptr<IEcu> const& ecu, UnitSystem system)
{
    auto const values = parameter->values(*ecu, system);
    return values.empty() ? nullptr : values.front();
}

Outcome<bool> TroubleCodeService::askResetCodes() const
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const clearing = std::make_shared<ClearTroubleCodes>();
    if (module == nullptr) {
        return Verdict{OutcomeKind::NotConnected};
    }
    FetchEnd const end = runFetch(clearing);
    bool cleared = false;
    if (end == FetchEnd::Succeeded) {
        module->resetFreezeFrameConfiguration(); // the vehicle has erased what was known of them
        cleared = clearing->isCleared(*module);
    }
    return {judged(*this, judgeFetch(end, *clearing, *module)), cleared};
}

bool TroubleCodeService::resetCodes() const
{
    return askResetCodes().value;
}

std::shared_ptr<ITroubleCodeService> TroubleCodeServiceBuilder::createTroubleCodeService()
{
    return buildService<TroubleCodeService>();
}

} // namespace obd
