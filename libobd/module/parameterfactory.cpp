#include "libobd/powertrain/batteryvoltage.h"
#include "libobd/powertrain/boostpressure.h"
#include "libobd/powertrain/monitorstatus.h"
#include "libobd/powertrain/parametertables.h"
#include "libobd/powertrain/torque.h"

#include <common/logrecord.h>
#include <obd/parameterfactory.h>
#include <obd/sensorpids.h>

namespace obd {
namespace {

std::shared_ptr<PowertrainParameter> makeSensor(ParameterIdentifier::Id id, ObdMode mode, unsigned char frame)
{
    ParameterEntry const* const found = findParameter(id);
    return found != nullptr ? found->parameter(mode, frame) : nullptr;
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
    ParameterEntry const* const found = findParameter(id);
    return found != nullptr ? found->dataLength() : otherDataLength(id);
}

} // namespace obd
