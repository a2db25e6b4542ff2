// What a freeze frame holds.

#include "libobd/powertrain/freezeframetroublecode.h"
#include "libobd/service/sensormodels.h"
#include "libobd/service/troublecodeservice.h"

#include <common/logrecord.h>
#include <common/tracestream.h>
#include <obd/parameterdescriptor.h>
#include <obd/parameterfactory.h>
#include <obd/sensorpids.h>

namespace obd {
namespace {

using Sensors = std::vector<std::shared_ptr<SensorDataModel>>;
using Pids = std::vector<ParameterIdentifier::Id>;

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

Sensors fullNamed(FrameReading const& reading)
{
    Sensors models;
    for (auto const& sensor : reading.sensors) {
        bool const alone = reading.sensors.size() == 1;
        std::string const name = alone ? reading.name : reading.name + ": " + sensor->description();
        models.push_back(makeSensorModel(*sensor, name, findValue(reading.values, sensor->uid())));
    }
    return models;
}

Sensors ownNamed(FrameReading const& reading)
{
    Sensors models;
    for (std::size_t i = 0; i < reading.sensors.size(); ++i) {
        SensorDescriptor const& sensor = *reading.sensors[i];
        std::shared_ptr<SensorValue> const value = findValue(reading.values, sensor.uid());
        if (value == nullptr) {
            TERVEX_LOG(Error) << "No value for " << i << " (" << reading.name << ")";
        }
        models.push_back(makeSensorModel(sensor, sensor.description(), value));
    }
    return models;
}

std::optional<Needed> inFrame(ParameterIdentifier::Id id, unsigned char frame)
{
    return Needed{ObdMode::FreezeFrame, ParameterIdentifier(id).toOid(), frame};
}

} // namespace

Outcome<std::shared_ptr<DtcDataModel>> TroubleCodeService::askFreezeFrameTroubleCode(unsigned char frame)
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const code = std::make_shared<FreezeFrameTroubleCode>(frame);
    return ask(*this, module, std::nullopt, code, [&] { return code->getTroubleCode(*module); });
}

std::shared_ptr<DtcDataModel> TroubleCodeService::fetchFreezeFrameTroubleCode(unsigned char frame)
{
    return askFreezeFrameTroubleCode(frame).value;
}

Outcome<Pids> TroubleCodeService::askFreezeFramePids(unsigned char frame)
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr) {
        return Verdict{OutcomeKind::NotConnected};
    }
    bool const detected = module->detectFreezeFrameConfiguration(frame);
    if (detected) {
        tervex::TraceStream << "FF configuration updated";
    }
    if (module->isSupported(ObdMode::FreezeFrame, freezeFrameCodePid, frame)) {
        Pids pids;
        for (unsigned char const id : module->supportedIds(ObdMode::FreezeFrame, frame)) {
            if (isSensor(id)) {
                pids.push_back(ParameterIdentifier(id).id());
            }
        }
        return {Verdict{}, std::move(pids)};
    }
    tervex::TraceStream << "No freeze frame available for frame #" << static_cast<int>(frame);
    Verdict const detection = judged(*this, module->detection(ObdMode::FreezeFrame, frame));
    if (detection.kind != OutcomeKind::Answered) {
        return detection;
    }
    return Verdict{detected ? OutcomeKind::NothingStored : OutcomeKind::ModuleSilent};
}

Pids TroubleCodeService::fetchFreezeFramePids(unsigned char frame)
{
    return askFreezeFramePids(frame).value;
}

template <typename Make>
auto TroubleCodeService::askFrame(std::shared_ptr<PowertrainParameter> const& parameter, Need const& needed,
                                  Make const& make) const
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    return ask(*this, module, needed, parameter, [&] { return make(read(parameter, module, unitSystem())); });
}

Outcome<Sensors> TroubleCodeService::askSensors(unsigned char frame, ParameterIdentifier::Id id,
                                                Need const& needed) const
{
    std::shared_ptr<PowertrainParameter> const parameter = makeFrameParameter(id, frame);
    if (parameter == nullptr) {
        return withoutParameter();
    }
    return askFrame(parameter, needed, fullNamed);
}

Outcome<Sensors> TroubleCodeService::askFreezeFrameSensors(unsigned char frame, ParameterIdentifier::Id id)
{
    return askSensors(frame, id, inFrame(id, frame));
}

Sensors TroubleCodeService::fetchFreezeFrameSensors(unsigned char frame, ParameterIdentifier::Id id)
{
    return askSensors(frame, id, std::nullopt).value;
}

Outcome<std::shared_ptr<ParameterDataModel>>
TroubleCodeService::askParameter(unsigned char frame, ParameterIdentifier::Id id, Need const& needed) const
{
    std::shared_ptr<PowertrainParameter> const parameter = makeFrameParameter(id, frame);
    if (parameter == nullptr) {
        return withoutParameter();
    }
    return askFrame(parameter, needed, [&parameter](FrameReading const& reading) {
        return std::make_shared<ParameterDataModel>(parameter->pid(), reading.name, ownNamed(reading));
    });
}

Outcome<std::shared_ptr<ParameterDataModel>> TroubleCodeService::askFreezeFrameParameter(unsigned char frame,
                                                                                         ParameterIdentifier::Id id)
{
    return askParameter(frame, id, inFrame(id, frame));
}

std::shared_ptr<ParameterDataModel> TroubleCodeService::fetchFreezeFrameParameter(unsigned char frame,
                                                                                  ParameterIdentifier::Id id)
{
    bool const isConnected = connectedEcu() != nullptr;
    auto const outcome = askParameter(frame, id, std::nullopt);
    if (isConnected && !outcome.isTold()) {
        bool const isUnknown = makeFrameParameter(id, frame) == nullptr;
        TERVEX_LOG(Error) << (isUnknown ? "No such parameter (" : "Failed to update parameter (")
                          << static_cast<int>(id) << ")";
    }
    return outcome.value;
}

Verdict TroubleCodeService::withoutParameter() const
{
    return {connectedEcu() == nullptr ? OutcomeKind::NotConnected : OutcomeKind::NotOffered};
}

} // namespace obd
