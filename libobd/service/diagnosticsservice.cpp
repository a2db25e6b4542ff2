#include "libobd/service/diagnosticsservice.h"

#include "libobd/dispatch/fetcher.h"
#include "libobd/parameters/monitortestresult.h"
#include "libobd/parameters/oxygensensortestresult.h"
#include "libobd/parameters/performancetracking.h"
#include "libobd/powertrain/readinessmonitors.h"
#include "libobd/service/builtservice.h"

#include <common/tracestream.h>
#include <obd/iecu.h>

namespace obd {

namespace {

constexpr unsigned char thisCyclePid = 0x41;
constexpr unsigned char sparkCounters = 0x08;
constexpr unsigned char compressionCounters = 0x0B;

using ReadinessMonitors = std::vector<std::shared_ptr<ReadinessMonitorDataModel>>;
using DiagnosticTests = std::vector<std::shared_ptr<DiagnosticTestDataModel>>;
using PerformanceCounters = std::vector<std::shared_ptr<PerformanceCounterDataModel>>;

// A record for each monitor that the engine can have; judge tells its status.
template <typename Judge>
ReadinessMonitors makeReadinessMonitors(IgnitionType ignition, Judge const& judge)
{
    ReadinessMonitors monitors;
    for (ReadinessMonitorTest const test : readinessMonitorTests(ignition)) {
        monitors.push_back(std::make_shared<ReadinessMonitorDataModel>(readinessMonitorText(test), judge(test)));
    }
    return monitors;
}

// The identifiers of the support masks, which are asked for at the opening of a connection.
bool isSupportMask(unsigned char id)
{
    return (id & 0x1FU) == 0;
}

// The application counts the other way round than the reply does: the better, the higher.
DiagnosticTestDataModel::Status testStatus(IMonitorTestItem::Status status)
{
    switch (status) {
    case IMonitorTestItem::Passed:
        return DiagnosticTestDataModel::Status::Passed;
    case IMonitorTestItem::Failed:
        return DiagnosticTestDataModel::Status::Failed;
    default:
        return DiagnosticTestDataModel::Status::NoResult;
    }
}

DiagnosticTests makeTests(ObdMonitorTestItem::Items const& items)
{
    DiagnosticTests tests;
    for (std::shared_ptr<IMonitorTestItem> const& item : items) {
        tests.push_back(std::make_shared<DiagnosticTestDataModel>(item->testId(), item->description(), item->value(),
                                                                  item->minimum(), item->maximum(), item->unit(),
                                                                  testStatus(item->status())));
    }
    return tests;
}

template <typename Tracking>
void appendCounters(IEcu const& ecu, unsigned char infoType, PerformanceCounters& counters)
{
    if (!ecu.isSupported(ObdMode::VehicleInformation, infoType, 0)) {
        return;
    }
    auto const tracking = std::make_shared<Tracking>();
    if (!fetch(tracking)) {
        return;
    }
    for (int const counter : tracking->counters(ecu)) {
        counters.push_back(std::make_shared<PerformanceCounterDataModel>(tracking->counterDescription(counter),
                                                                         tracking->counterValue(ecu, counter)));
    }
}

} // namespace

DiagnosticsService::DiagnosticsService(IObdVelmora const* obd, Following following)
    : BaseService(obd, servicePriority, following)
{}

ReadinessMonitors DiagnosticsService::fetchReadinessMonitors()
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const status = std::make_shared<MonitorStatus>();
    if (module == nullptr || !fetch(status)) {
        return {};
    }
    return makeReadinessMonitors(status->getIgnitionType(*module), [&](ReadinessMonitorTest test) {
        return readinessSinceCleared(*module, *status, test);
    });
}

// Which monitors the vehicle has is told by PID 0x01 only, so both are read.
ReadinessMonitors DiagnosticsService::fetchReadinessMonitorsThisCycle()
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr || !module->isSupported(ObdMode::CurrentData, thisCyclePid, 0)) {
        return {};
    }
    auto const status = std::make_shared<MonitorStatus>();
    auto const thisCycle = std::make_shared<MonitorStatusThisCycle>();
    if (!fetch(status) || !fetch(thisCycle)) {
        return {};
    }
    return makeReadinessMonitors(status->getIgnitionType(*module), [&](ReadinessMonitorTest test) {
        return readinessThisCycle(*module, *status, *thisCycle, test);
    });
}

std::vector<std::shared_ptr<DiagnosticMonitorDataModel>> DiagnosticsService::fetchMonitorTests()
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr) {
        return {};
    }
    UnitSystem const system = unitSystem(); // once, for it may change meanwhile
    std::vector<std::shared_ptr<DiagnosticMonitorDataModel>> monitors;
    for (unsigned char const id : module->supportedIds(ObdMode::MonitorTests, 0)) {
        if (isSupportMask(id)) {
            continue;
        }
        auto const results = std::make_shared<MonitorTestResult>(id);
        if (!fetch(results)) {
            continue;
        }
        for (std::shared_ptr<ObdMonitorTestItem> const& monitor : results->getItems(*module)) {
            monitors.push_back(std::make_shared<DiagnosticMonitorDataModel>(
                static_cast<int>(monitor->id), monitor->description, makeTests(monitor->items(system))));
        }
    }
    return monitors;
}

PerformanceCounters DiagnosticsService::fetchPerformanceCounters()
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr) {
        return {};
    }
    PerformanceCounters counters;
    appendCounters<PerformanceTrackingSpark>(*module, sparkCounters, counters);
    appendCounters<PerformanceTrackingCompression>(*module, compressionCounters, counters);
    return counters;
}

std::vector<OxygenSensorLocation> DiagnosticsService::oxygenSensorLocations()
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    return module != nullptr ? module->oxygenSensorLocations() : std::vector<OxygenSensorLocation>();
}

std::vector<std::shared_ptr<OxygenSensorMonitorDataModel>>
DiagnosticsService::fetchOxygenSensorTests(OxygenSensorLocation location)
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr) {
        return {};
    }
    std::vector<std::shared_ptr<OxygenSensorMonitorDataModel>> results;
    for (unsigned char const tid : module->supportedTids(location)) {
        tervex::TraceStream << "Supported test for location " << static_cast<int>(location) << " "
                            << static_cast<int>(tid);
        auto const test = std::make_shared<OxygenSensorTestResult>(tid, location);
        if (!fetch(test)) {
            continue;
        }
        if (auto const result = test->getResult(module)) { // null if only another module answered
            results.push_back(result);
        }
    }
    return results;
}

bool DiagnosticsService::isOxygenSensorTestComplete()
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const status = std::make_shared<MonitorStatus>();
    return module != nullptr && fetch(status) && status->isTestComplete(*module, ReadinessOxygenSensor);
}

std::shared_ptr<IDiagnosticsService> DiagnosticsServiceBuilder::create()
{
    return buildService<DiagnosticsService>();
}

} // namespace obd
