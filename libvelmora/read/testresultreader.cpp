#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/read/topicanswer.h"
#include "libvelmora/report/unitlabel.h"

#include <obd/idiagnosticsservice.h>
#include <obd/protocolfamily.h>

namespace velmora {

namespace {

LimitTest::Verdict toVerdict(obd::DiagnosticTestDataModel::Status status)
{
    switch (status) {
    case obd::DiagnosticTestDataModel::Status::Failed:
        return LimitTest::Verdict::Failed;
    case obd::DiagnosticTestDataModel::Status::Passed:
        return LimitTest::Verdict::Passed;
    case obd::DiagnosticTestDataModel::Status::NoResult:
        break;
    }
    return LimitTest::Verdict::NoResult;
}

OnBoardMonitor toMonitor(obd::DiagnosticMonitorDataModel const& model)
{
    OnBoardMonitor monitor{model.id, model.description, {}};
    for (auto const& test : model.tests) {
        monitor.tests.push_back({test->testId, test->description, test->value, test->minimum, test->maximum,
                                 unitLabel(test->unit), toVerdict(test->status)});
    }
    return monitor;
}

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

MonitorsReport readMonitors(Session& session, obd::IEcu const& ecu)
{
    session.select(ecu);
    auto const outcome = obd::DiagnosticsServiceBuilder::create()->askMonitorTests();
    session.check();
    MonitorsReport report{toAnswer(outcome), {}};
    for (auto const& monitor : outcome.value) {
        report.monitors.push_back(toMonitor(*monitor));
    }
    return report;
}

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
