#include "libvelmora/read/freezereader.h"

#include "libvelmora/read/oxygencurrent.h"
#include "libvelmora/read/topicanswer.h"
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

void addReadings(Session& session, obd::ITroubleCodeService& service, unsigned char frame,
                 std::vector<obd::ParameterIdentifier::Id> const& pids, FreezeFrame& found)
{
    for (obd::ParameterIdentifier::Id const pid : pids) {
        for (auto const& sensor : service.askFreezeFrameSensors(frame, pid).value) {
            found.readings.push_back(toReading(*sensor));
        }
        session.check();
    }
}

} // namespace

// A frame without a code holds nothing; of one whose code was not told nobody knows.
FreezeReport readFreeze(Session& session, obd::IEcu const& ecu, unsigned char frame)
{
    session.select(ecu);
    auto const service = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    auto const pids = service->askFreezeFramePids(frame);
    session.check();
    if (pids.kind != obd::OutcomeKind::Answered) {
        return {frame, toAnswer(pids), std::nullopt};
    }
    auto const code = service->askFreezeFrameTroubleCode(frame);
    session.check();
    if (code.value == nullptr) {
        return {frame, toAnswer(code), std::nullopt};
    }
    FreezeFrame found{explain(*code.value), {}};
    addReadings(session, *service, frame, pids.value, found);
    return {frame, TopicAnswer::Read, std::move(found)};
}

} // namespace velmora
