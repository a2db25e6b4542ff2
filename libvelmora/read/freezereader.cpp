#include "libvelmora/read/freezereader.h"

#include "libvelmora/read/oxygencurrent.h"
#include "libvelmora/report/unitlabel.h"

#include <obd/itroublecodeservice.h>
#include <obd/troublecodecatalogue.h>

namespace velmora {

namespace {

FreezeFrame::Reading toReading(obd::SensorDataModel const& sensor)
{
    return {sensor.name, sensor.value ? std::optional(shownText(sensor.uid, sensor.value->value)) : std::nullopt,
            unitLabel(sensor.uid, sensor.unit)};
}

// The library gives the generic meaning only; the catalogue knows the makers' as well.
TroubleCode explain(obd::DtcDataModel const& model)
{
    return groupByCode(obd::TroubleCodeCatalogue::getTroubleCodes(model.code)).front();
}

std::optional<FreezeFrame> readFrame(Session& session, obd::ITroubleCodeService& service, unsigned char frame)
{
    std::vector<obd::ParameterIdentifier::Id> const pids = service.fetchFreezeFramePids(frame);
    auto const code = pids.empty() ? nullptr : service.fetchFreezeFrameTroubleCode(frame);
    session.check();
    if (code == nullptr) {
        return std::nullopt;
    }
    FreezeFrame found{explain(*code), {}};
    for (obd::ParameterIdentifier::Id const pid : pids) {
        for (auto const& sensor : service.fetchFreezeFrameSensors(frame, pid)) {
            found.readings.push_back(toReading(*sensor));
        }
        session.check();
    }
    return found;
}

} // namespace

FreezeReport readFreeze(Session& session, obd::IEcu const& ecu, unsigned char frame)
{
    session.select(ecu);
    auto const service = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    FreezeReport report{frame, false, readFrame(session, *service, frame)};
    report.answered = !ecu.supportedIds(obd::ObdMode::FreezeFrame, frame).empty();
    return report;
}

} // namespace velmora
