#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/report/unitlabel.h"

#include <obd/idiagnosticsservice.h>
#include <obd/protocolfamily.h>

namespace velmora {

namespace {

LimitTest toTest(obd::OxygenSensorMonitorDataModel const& model)
{
    std::string const unit = unitLabel(model.unit);
    if (obd::isConstantTest(model.tid)) {
        return {model.tid, model.description, model.value, {}, {}, unit, LimitTest::Verdict::None};
    }
    LimitTest::Verdict const verdict = model.status == 0 ? LimitTest::Verdict::Passed : LimitTest::Verdict::Failed;
    return {model.tid, model.description, model.value, model.minimum, model.maximum, unit, verdict};
}

} // namespace

OxygenReport readOxygen(Session& session, obd::IEcu const& ecu)
{
    session.select(ecu);
    auto const service = obd::DiagnosticsServiceBuilder::create();
    std::vector<obd::OxygenSensorLocation> const locations = service->oxygenSensorLocations();
    if (locations.empty()) {
        return {};
    }
    OxygenReport report;
    report.answer = TopicAnswer::Read;
    report.onCan = obd::isCan(ecu.protocol());
    auto const complete = service->askOxygenSensorTestComplete();
    if (complete.kind == obd::OutcomeKind::Answered) {
        report.complete = complete.value;
    }
    for (obd::OxygenSensorLocation const location : locations) {
        session.check();
        OxygenSensor sensor{location, {}};
        for (auto const& test : service->askOxygenSensorTests(location).value) {
            sensor.tests.push_back(toTest(*test));
        }
        report.sensors.push_back(std::move(sensor));
    }
    session.check();
    return report;
}

} // namespace velmora
