#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/read/topicanswer.h"
#include "libvelmora/report/unitlabel.h"

#include <obd/idiagnosticsservice.h>

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
        return LimitTest::Verdict::NoResult;
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

} // namespace velmora
