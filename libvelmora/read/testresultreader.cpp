#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/report/unitlabel.h"

#include <obd/idiagnosticsservice.h>

#include <algorithm>

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

// The tests 01 to 04 of service 05 are thresholds that the module works with, not results (SAE J1979).
bool isConstant(int tid)
{
    return tid >= 0x01 && tid <= 0x04;
}

LimitTest toTest(obd::OxygenSensorMonitorDataModel const& model)
{
    std::string const unit = unitLabel(model.unit);
    if (isConstant(model.tid)) {
        return {model.tid, model.description, model.value, {}, {}, unit, LimitTest::Verdict::None};
    }
    LimitTest::Verdict const verdict = model.status == 0 ? LimitTest::Verdict::Passed : LimitTest::Verdict::Failed;
    return {model.tid, model.description, model.value, model.minimum, model.maximum, unit, verdict};
}

bool offersMonitorTests(obd::IEcu const& ecu)
{
    std::vector<unsigned char> const ids = ecu.supportedIds(obd::ObdMode::MonitorTests, 0);
    // Those that end a range only tell of the next one.
    return std::any_of(ids.begin(), ids.end(), [](unsigned char id) { return (id & 0x1FU) != 0; });
}

} // namespace

MonitorsReport readMonitors(Session& session, obd::IEcu const& ecu)
{
    session.select(ecu);
    if (!offersMonitorTests(ecu)) {
        return {};
    }
    MonitorsReport report{TopicAnswer::Silent, {}};
    for (auto const& monitor : obd::DiagnosticsServiceBuilder::create()->fetchMonitorTests()) {
        report.answer = TopicAnswer::Read;
        report.monitors.push_back(toMonitor(*monitor));
    }
    session.check();
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
    report.onCan = ecu.protocol() == obd::ObdProtocolCan11 || ecu.protocol() == obd::ObdProtocolCan29;
    // Whether the monitor has run means nothing of a module that does not tell what monitors it has.
    if (tellsReadiness(ecu) && !service->fetchReadinessMonitors().empty()) {
        report.complete = service->isOxygenSensorTestComplete();
    }
    for (obd::OxygenSensorLocation const location : locations) {
        session.check();
        OxygenSensor sensor{location, {}};
        for (auto const& test : service->fetchOxygenSensorTests(location)) {
            sensor.tests.push_back(toTest(*test));
        }
        report.sensors.push_back(std::move(sensor));
    }
    session.check();
    return report;
}

} // namespace velmora
