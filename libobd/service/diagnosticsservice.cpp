#include "libobd/service/diagnosticsservice.h"

#include "libobd/parameters/monitortestresult.h"
#include "libobd/parameters/oxygensensortestresult.h"
#include "libobd/parameters/performancetracking.h"
#include "libobd/powertrain/readinessmonitors.h"
#include "libobd/service/builtservice.h"
#include "libobd/service/diagnosticmodels.h"

#include <common/tracestream.h>
#include <obd/iecu.h>
#include <obd/sensorpids.h>

namespace obd {

namespace {

constexpr unsigned char thisCyclePid = 0x41;
constexpr unsigned char sparkCounters = 0x08;
constexpr unsigned char compressionCounters = 0x0B;

using ReadinessMonitors = std::vector<std::shared_ptr<ReadinessMonitorDataModel>>;
using DiagnosticMonitors = std::vector<std::shared_ptr<DiagnosticMonitorDataModel>>;
using OxygenSensorTests = std::vector<std::shared_ptr<OxygenSensorMonitorDataModel>>;
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

template <typename Tracking>
void appendCounters(BaseService const& service, IEcu const& ecu, unsigned char infoType, PerformanceCounters& counters,
                    AskedTimes& asked)
{
    if (!ecu.isSupported(ObdMode::VehicleInformation, infoType, 0)) {
        return;
    }
    auto const tracking = std::make_shared<Tracking>();
    Verdict const verdict = judged(service, fetchFrom(tracking, ecu));
    asked.add(verdict);
    if (!verdict.isTold()) {
        return;
    }
    for (int const counter : tracking->counters(ecu)) {
        counters.push_back(std::make_shared<PerformanceCounterDataModel>(tracking->counterDescription(counter),
                                                                         tracking->counterValue(ecu, counter)));
    }
}

// Of an operation that asks for all that a module offers of a service. Of a set that could not be read, how that went.
template <typename T>
Outcome<T> outcomeOf(AskedTimes const& asked, IEcu const& module, ObdMode mode, T value)
{
    Outcome<T> outcome = asked.outcome(std::move(value));
    Verdict const detection = module.detection(mode, 0);
    bool const isKnown = detection.kind == OutcomeKind::Answered || detection.kind == OutcomeKind::Refused;
    if (outcome.kind == OutcomeKind::NotOffered && outcome.code == 0 && !isKnown) {
        return detection;
    }
    return outcome;
}

} // namespace

DiagnosticsService::DiagnosticsService(IObdVelmora const* obd, Following following)
    : BaseService(obd, servicePriority, following)
{}

Outcome<ReadinessMonitors> DiagnosticsService::askSinceCleared(Need const& needed) const
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const status = std::make_shared<MonitorStatus>();
    return ask(*this, module, needed, status, [&] {
        return makeReadinessMonitors(status->getIgnitionType(*module), [&](ReadinessMonitorTest test) {
            return readinessSinceCleared(*module, *status, test);
        });
    });
}

Outcome<ReadinessMonitors> DiagnosticsService::askReadinessMonitors()
{
    return askSinceCleared(Needed{ObdMode::CurrentData, monitorStatusPid});
}

ReadinessMonitors DiagnosticsService::fetchReadinessMonitors()
{
    return askSinceCleared(std::nullopt).value;
}

// Which monitors the vehicle has is told by PID 0x01 only, so both are read.
Outcome<ReadinessMonitors> DiagnosticsService::askReadinessMonitorsThisCycle()
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const status = std::make_shared<MonitorStatus>();
    auto const thisCycle = std::make_shared<MonitorStatusThisCycle>();
    Needed const needed{ObdMode::CurrentData, thisCyclePid};
    Outcome<bool> const first = ask(*this, module, needed, status, [] { return true; });
    if (!first.value) {
        return Verdict(first);
    }
    return ask(*this, module, needed, thisCycle, [&] {
        return makeReadinessMonitors(status->getIgnitionType(*module), [&](ReadinessMonitorTest test) {
            return readinessThisCycle(*module, *status, *thisCycle, test);
        });
    });
}

ReadinessMonitors DiagnosticsService::fetchReadinessMonitorsThisCycle()
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr || !module->isSupported(ObdMode::CurrentData, thisCyclePid, 0)) {
        return {};
    }
    return askReadinessMonitorsThisCycle().value;
}

Outcome<DiagnosticMonitors> DiagnosticsService::askMonitorTests()
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr) {
        return Verdict{OutcomeKind::NotConnected};
    }
    UnitSystem const system = unitSystem(); // once, for it may change meanwhile
    DiagnosticMonitors monitors;
    AskedTimes asked;
    for (unsigned char const id : module->supportedIds(ObdMode::MonitorTests, 0)) {
        if (isSupportMask(id)) {
            continue;
        }
        auto const results = std::make_shared<MonitorTestResult>(id);
        Verdict const verdict = judged(*this, fetchFrom(results, *module));
        asked.add(verdict);
        if (!verdict.isTold()) {
            continue;
        }
        for (std::shared_ptr<ObdMonitorTestItem> const& monitor : results->getItems(*module)) {
            monitors.push_back(makeMonitorModel(*monitor, system));
        }
    }
    return outcomeOf(asked, *module, ObdMode::MonitorTests, std::move(monitors));
}

DiagnosticMonitors DiagnosticsService::fetchMonitorTests()
{
    return askMonitorTests().value;
}

Outcome<PerformanceCounters> DiagnosticsService::askPerformanceCounters()
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr) {
        return Verdict{OutcomeKind::NotConnected};
    }
    PerformanceCounters counters;
    AskedTimes asked;
    appendCounters<PerformanceTrackingSpark>(*this, *module, sparkCounters, counters, asked);
    appendCounters<PerformanceTrackingCompression>(*this, *module, compressionCounters, counters, asked);
    return outcomeOf(asked, *module, ObdMode::VehicleInformation, std::move(counters));
}

PerformanceCounters DiagnosticsService::fetchPerformanceCounters()
{
    return askPerformanceCounters().value;
}

std::vector<OxygenSensorLocation> DiagnosticsService::oxygenSensorLocations()
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    return module != nullptr ? module->oxygenSensorLocations() : std::vector<OxygenSensorLocation>();
}

Outcome<OxygenSensorTests> DiagnosticsService::askOxygenSensorTests(OxygenSensorLocation location)
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr) {
        return Verdict{OutcomeKind::NotConnected};
    }
    OxygenSensorTests results;
    AskedTimes asked;
    for (unsigned char const tid : module->supportedTids(location)) {
        tervex::TraceStream << "Supported test for location " << static_cast<int>(location) << " "
                            << static_cast<int>(tid);
        auto const test = std::make_shared<OxygenSensorTestResult>(tid, location);
        Verdict const verdict = judged(*this, fetchFrom(test, *module));
        asked.add(verdict);
        if (!verdict.isTold()) {
            continue;
        }
        if (auto const result = test->getResult(module)) {
            results.push_back(result);
        }
    }
    return asked.outcome(std::move(results));
}

OxygenSensorTests DiagnosticsService::fetchOxygenSensorTests(OxygenSensorLocation location)
{
    return askOxygenSensorTests(location).value;
}

Outcome<bool> DiagnosticsService::askOxygenSensorMonitor(Need const& needed) const
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const status = std::make_shared<MonitorStatus>();
    Outcome<bool> outcome =
        ask(*this, module, needed, status, [&] { return status->isTestComplete(*module, ReadinessOxygenSensor); });
    if (outcome.isTold() && !status->isTestAvailable(*module, ReadinessOxygenSensor)) {
        outcome.kind = OutcomeKind::NothingStored;
    }
    return outcome;
}

Outcome<bool> DiagnosticsService::askOxygenSensorTestComplete()
{
    return askOxygenSensorMonitor(Needed{ObdMode::CurrentData, monitorStatusPid});
}

bool DiagnosticsService::isOxygenSensorTestComplete()
{
    return askOxygenSensorMonitor(std::nullopt).value;
}

std::shared_ptr<IDiagnosticsService> DiagnosticsServiceBuilder::create()
{
    return buildService<DiagnosticsService>();
}

} // namespace obd
