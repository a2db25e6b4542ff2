#include "libobd/service/troublecodeservice.h"

#include "libobd/dispatch/fetcher.h"
#include "libobd/parameters/cleartroublecodes.h"
#include "libobd/parameters/troublecodelists.h"
#include "libobd/powertrain/freezeframetroublecode.h"
#include "libobd/powertrain/monitorstatus.h"
#include "libobd/powertrain/numericparameters.h"
#include "libobd/powertrain/sensorpids.h"
#include "libobd/service/builtservice.h"
#include "libobd/service/sensormodels.h"

#include <common/logrecord.h>
#include <common/tracestream.h>
#include <obd/parameterdescriptor.h>
#include <obd/parameterfactory.h>

namespace obd {

namespace {

std::shared_ptr<PowertrainParameter> makeFrameParameter(ParameterIdentifier::Id id, unsigned char frame)
{
    return ParameterFactory().createFreezeFrameParameter(id, frame);
}

// What was read of a parameter of a frame, all in one unit system.
struct FrameReading
{
    std::string name;
    std::vector<std::shared_ptr<SensorDescriptor>> sensors;
    std::vector<std::shared_ptr<SensorValue>> values;
};

FrameReading read(std::shared_ptr<PowertrainParameter> const& parameter, std::shared_ptr<IEcu> const& ecu,
                  UnitSystem system)
{
    ParameterDescriptor const descriptor(parameter, ecu, system);
    return {descriptor.description(), descriptor.sensors(), parameter->values(*ecu, system)};
}

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
std::vector<std::shared_ptr<DtcDataModel>> TroubleCodeService::fetchCodes() const
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const codes = std::make_shared<Codes>();
    if (module == nullptr || !fetch(codes)) {
        return {};
    }
    return codes->getTroubleCodes(*module);
}

std::vector<std::shared_ptr<DtcDataModel>> TroubleCodeService::fetchConfirmedCodes()
{
    return fetchCodes<ConfirmedTroubleCodes>();
}

std::vector<std::shared_ptr<DtcDataModel>> TroubleCodeService::fetchPendingCodes()
{
    return fetchCodes<PendingTroubleCodes>();
}

std::vector<std::shared_ptr<DtcDataModel>> TroubleCodeService::fetchPermanentCodes()
{
    return fetchCodes<PermanentTroubleCodes>();
}

std::shared_ptr<ITroubleCodeService::MilStatus> TroubleCodeService::fetchMilStatus()
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const status = std::make_shared<MonitorStatus>();
    if (module == nullptr || !fetch(status)) {
        return nullptr;
    }
    bool const on = status->isMalfunctionIndicatorLightOn(*module);
    tervex::TraceStream << (on ? "MIL on" : "MIL off");
    return std::make_shared<MilStatus>(on ? MilStatus::On : MilStatus::Off);
}

std::shared_ptr<SensorDataModel> TroubleCodeService::fetchDistance(bool sinceMil)
{
    return fetchRequest(sinceMil ? makeCurrent<MilDistance>() : makeCurrent<DistanceTraveled>());
}

std::shared_ptr<SensorDataModel> TroubleCodeService::fetchRuntime(bool sinceMil)
{
    return fetchRequest(sinceMil ? makeCurrent<EngineRuntimeMil>() : makeCurrent<EngineRuntimeDtc>());
}

std::shared_ptr<SensorDataModel>
TroubleCodeService::fetchRequest(std::shared_ptr<PowertrainParameter> const& parameter) const
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr ||
        !module->isSupported(ObdMode::CurrentData, ParameterIdentifier(parameter->pid()).toOid(), 0)) {
        return nullptr; // no request for what the vehicle does not have
    }
    if (!fetch(parameter)) {
        return nullptr;
    }
    UnitSystem const system = unitSystem(); // once, for it may change meanwhile
    std::shared_ptr<SensorDescriptor> const sensor = getFirstSensor(parameter, module, system);
    std::shared_ptr<SensorValue> const value = getFirstSensorValue(parameter, module, system);
    if (sensor == nullptr || value == nullptr) {
        return nullptr;
    }
    return makeSensorModel(*sensor, sensor->description(), value);
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

std::shared_ptr<DtcDataModel> TroubleCodeService::fetchFreezeFrameTroubleCode(unsigned char frame)
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const code = std::make_shared<FreezeFrameTroubleCode>(frame);
    if (module == nullptr || !fetch(code)) {
        return nullptr;
    }
    return code->getTroubleCode(*module);
}

std::vector<ParameterIdentifier::Id> TroubleCodeService::fetchFreezeFramePids(unsigned char frame)
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr) {
        return {};
    }
    if (module->detectFreezeFrameConfiguration(frame)) {
        tervex::TraceStream << "FF configuration updated";
    }
    if (!module->isSupported(ObdMode::FreezeFrame, freezeFrameCodePid, frame)) {
        tervex::TraceStream << "No freeze frame available for frame #" << static_cast<int>(frame);
        return {};
    }
    std::vector<ParameterIdentifier::Id> pids;
    for (unsigned char const id : module->supportedIds(ObdMode::FreezeFrame, frame)) {
        if (isSensor(id)) {
            pids.push_back(ParameterIdentifier(id).id());
        }
    }
    return pids;
}

std::vector<std::shared_ptr<SensorDataModel>> TroubleCodeService::fetchFreezeFrameSensors(unsigned char frame,
                                                                                          ParameterIdentifier::Id id)
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    std::shared_ptr<PowertrainParameter> const parameter = makeFrameParameter(id, frame);
    if (module == nullptr || parameter == nullptr || !fetch(parameter)) {
        return {};
    }
    FrameReading const reading = read(parameter, module, unitSystem());
    std::vector<std::shared_ptr<SensorDataModel>> models;
    for (auto const& sensor : reading.sensors) {
        bool const alone = reading.sensors.size() == 1;
        std::string const name = alone ? reading.name : reading.name + ": " + sensor->description();
        models.push_back(makeSensorModel(*sensor, name, findValue(reading.values, sensor->uid())));
    }
    return models;
}

std::shared_ptr<ParameterDataModel> TroubleCodeService::fetchFreezeFrameParameter(unsigned char frame,
                                                                                  ParameterIdentifier::Id id)
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr) {
        return nullptr;
    }
    std::shared_ptr<PowertrainParameter> const parameter = makeFrameParameter(id, frame);
    if (parameter == nullptr) {
        TERVEX_LOG(Error) << "No such parameter (" << static_cast<int>(id) << ")";
        return nullptr;
    }
    if (!fetch(parameter)) {
        TERVEX_LOG(Error) << "Failed to update parameter (" << static_cast<int>(id) << ")";
        return nullptr;
    }
    FrameReading const reading = read(parameter, module, unitSystem());
    std::vector<std::shared_ptr<SensorDataModel>> models;
    for (std::size_t i = 0; i < reading.sensors.size(); ++i) {
        SensorDescriptor const& sensor = *reading.sensors[i];
        std::shared_ptr<SensorValue> const value = findValue(reading.values, sensor.uid());
        if (value == nullptr) {
            TERVEX_LOG(Error) << "No value for " << i << " (" << reading.name << ")";
        }
        models.push_back(makeSensorModel(sensor, sensor.description(), value));
    }
    return std::make_shared<ParameterDataModel>(parameter->pid(), reading.name, models);
}

bool TroubleCodeService::resetCodes() const
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const clearing = std::make_shared<ClearTroubleCodes>();
    if (module == nullptr || !fetch(clearing)) {
        return false;
    }
    module->resetFreezeFrameConfiguration(); // the vehicle has erased what was known of them
    return clearing->isCleared(*module);
}

std::shared_ptr<ITroubleCodeService> TroubleCodeServiceBuilder::createTroubleCodeService()
{
    return buildService<TroubleCodeService>();
}

} // namespace obd
