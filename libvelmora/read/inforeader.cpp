#include "common/text/text.h"
#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/report/unitlabel.h"

#include <obd/iecuservice.h>
#include <obd/itroublecodeservice.h>

#include <algorithm>

namespace velmora {

namespace {

std::optional<InfoReport::Reading> toReading(std::shared_ptr<obd::SensorDataModel> const& sensor)
{
    if (sensor == nullptr || sensor->value == nullptr) {
        return std::nullopt;
    }
    return InfoReport::Reading{sensor->value->value, unitLabel(sensor->unit)};
}

// PIDs of service 01 that tell how far and how long.
struct TravelPids
{
    unsigned int distance;
    unsigned int runTime;
};
constexpr TravelPids withLamp{0x21, 0x4D};
constexpr TravelPids sinceCleared{0x31, 0x4E};

std::optional<InfoReport::Reading> findReading(std::vector<LiveValue> const& values, unsigned int pid)
{
    auto const found =
        std::find_if(values.begin(), values.end(), [pid](LiveValue const& value) { return value.pid == pid; });
    return found != values.end() ? std::optional(InfoReport::Reading{found->value, found->unit}) : std::nullopt;
}

InfoReport::Travel readTravel(Session& session, TravelPids const& pids, std::vector<LiveValue> const& values)
{
    bool const sinceMil = pids.distance == withLamp.distance;
    auto const service = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    InfoReport::Travel travel{findReading(values, pids.distance), findReading(values, pids.runTime)};
    if (!travel.distance) {
        travel.distance = toReading(service->askDistance(sinceMil).value);
        session.check();
    }
    if (!travel.runTime) {
        travel.runTime = toReading(service->askRuntime(sinceMil).value);
        session.check();
    }
    return travel;
}

std::string shown(std::string const& text)
{
    return readable(text);
}

std::vector<std::string> shown(std::vector<std::string> texts)
{
    std::transform(texts.begin(), texts.end(), texts.begin(), readable);
    return texts;
}

// Asks the vehicle for one thing, unless the module says that it lacks it.
template <typename Value>
Value askFor(Session& session, obd::Outcome<Value> (obd::IEcuService::*ask)())
{
    auto const service = obd::EcuServiceBuilder::createEcuService();
    Value const value = ((*service).*ask)().value;
    session.check();
    return shown(value);
}

} // namespace

std::string readVin(Session& session, obd::IEcu const& ecu)
{
    session.select(ecu);
    return askFor(session, &obd::IEcuService::askVehicleIdentificationNumber);
}

InfoReport readInfo(Session& session, obd::IEcu const& ecu)
{
    return readInfoBeside(session, ecu, {});
}

InfoReport readInfoBeside(Session& session, obd::IEcu const& ecu, std::vector<LiveValue> const& values)
{
    using Service = obd::IEcuService;
    session.select(ecu);
    InfoReport report;
    auto const service = obd::EcuServiceBuilder::createEcuService();
    report.description = readable(service->ecuDescription());
    report.standard = service->standardDescription();
    report.protocol = service->protocolDescription();
    report.vin = askFor(session, &Service::askVehicleIdentificationNumber);
    auto const ids = askFor(session, &Service::askCalibrationIds);
    auto const numbers = askFor(session, &Service::askVerificationNumbers);
    report.calibrations = pairCalibrations(ids, numbers);
    report.engineSerialNumber = askFor(session, &Service::askEngineSerialNumber);
    report.erotan = askFor(session, &Service::askErotan);
    report.withLamp = readTravel(session, withLamp, values);
    report.sinceCleared = readTravel(session, sinceCleared, values);
    return report;
}

} // namespace velmora
