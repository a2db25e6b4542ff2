#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/report/unitlabel.h"
#include "libvelmora/text/text.h"

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

InfoReport::Travel readTravel(Session& session, bool sinceMil)
{
    auto const service = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    InfoReport::Travel travel;
    travel.distance = toReading(service->fetchDistance(sinceMil));
    session.check();
    travel.runTime = toReading(service->fetchRuntime(sinceMil));
    session.check();
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

// Asks the vehicle only for what the module says it has.
class InfoFetch
{
public:
    explicit InfoFetch(Session& session) : m_session(session), m_service(obd::EcuServiceBuilder::createEcuService()) {}

    obd::IEcuService& service() const { return *m_service; }

    template <typename Value>
    Value operator()(bool (obd::IEcuService::*has)(), Value (obd::IEcuService::*fetch)()) const
    {
        if (!((*m_service).*has)()) {
            return {};
        }
        Value const value = ((*m_service).*fetch)();
        m_session.check();
        return shown(value);
    }

private:
    Session& m_session;
    std::shared_ptr<obd::IEcuService> m_service;
};

} // namespace

std::string readVin(Session& session, obd::IEcu const& ecu)
{
    using Service = obd::IEcuService;
    session.select(ecu);
    return InfoFetch(session)(&Service::hasVehicleIdentificationNumber, &Service::fetchVehicleIdentificationNumber);
}

InfoReport readInfo(Session& session, obd::IEcu const& ecu)
{
    using Service = obd::IEcuService;
    session.select(ecu);
    InfoFetch const fetch(session);
    InfoReport report;
    report.description = readable(fetch.service().ecuDescription());
    report.standard = fetch.service().standardDescription();
    report.protocol = fetch.service().protocolDescription();
    report.vin = fetch(&Service::hasVehicleIdentificationNumber, &Service::fetchVehicleIdentificationNumber);
    auto const ids = fetch(&Service::hasCalibrationIds, &Service::fetchCalibrationIds);
    auto const numbers = fetch(&Service::hasVerificationNumbers, &Service::fetchVerificationNumbers);
    report.calibrations = pairCalibrations(ids, numbers);
    report.engineSerialNumber = fetch(&Service::hasEngineSerialNumber, &Service::fetchEngineSerialNumber);
    report.erotan = fetch(&Service::hasErotan, &Service::fetchErotan);
    report.withLamp = readTravel(session, true);
    report.sinceCleared = readTravel(session, false);
    return report;
}

} // namespace velmora
