#pragma once

#include <obd/diagnosticdatamodels.h>
#include <obd/export.h>
#include <obd/outcome.h>
#include <obd/oxygensensorlocation.h>

#include <memory>
#include <vector>

namespace obd {

/// Readiness, test results and in-use counters of the current control module. Every operation but oxygenSensorLocations
/// asks the vehicle and blocks its caller meanwhile; call from any thread but the dispatcher's worker. Without a
/// connection or a control module lists are empty and booleans false, and so they are where the vehicle does not
/// answer; the log tells why. What the module does not support is not asked for.
class IDiagnosticsService
{
public:
    virtual ~IDiagnosticsService() = default;

    /// Every monitor that an engine of this ignition type can have, since the codes were cleared.
    virtual std::vector<std::shared_ptr<ReadinessMonitorDataModel>> fetchReadinessMonitors() = 0;
    /// The same in the present driving cycle. Empty also where the module does not tell it.
    virtual std::vector<std::shared_ptr<ReadinessMonitorDataModel>> fetchReadinessMonitorsThisCycle() = 0;

    /// The results of service 06, in the unit system of the settings. Asks once for each monitor, which takes seconds;
    /// a monitor that does not answer is left out.
    virtual std::vector<std::shared_ptr<DiagnosticMonitorDataModel>> fetchMonitorTests() = 0;

    /// In-use performance (service 09): the counters that the module keeps.
    virtual std::vector<std::shared_ptr<PerformanceCounterDataModel>> fetchPerformanceCounters() = 0;

    /// The oxygen sensors that the module reports, as known since the connection was opened.
    virtual std::vector<OxygenSensorLocation> oxygenSensorLocations() = 0;
    /// The results of service 05, which the legacy buses have. Asks once for each test.
    virtual std::vector<std::shared_ptr<OxygenSensorMonitorDataModel>>
    fetchOxygenSensorTests(OxygenSensorLocation location) = 0;
    /// Whether the oxygen sensor monitor has run since the codes were cleared: before, its results mean nothing.
    virtual bool isOxygenSensorTestComplete() = 0;

    /// The same operations, each with how it went. What the module says it does not offer is not asked for.
    /// NothingStored of the readiness: not one of the monitors is there, so neither is that of the oxygen sensors; of
    /// the counters: all are 0. Tests and counters may be told in part, see Outcome::missing.
    virtual Outcome<std::vector<std::shared_ptr<ReadinessMonitorDataModel>>> askReadinessMonitors() = 0;
    /// fetchReadinessMonitorsThisCycle, with how it went.
    virtual Outcome<std::vector<std::shared_ptr<ReadinessMonitorDataModel>>> askReadinessMonitorsThisCycle() = 0;
    /// fetchMonitorTests, with how it went.
    virtual Outcome<std::vector<std::shared_ptr<DiagnosticMonitorDataModel>>> askMonitorTests() = 0;
    /// fetchPerformanceCounters, with how it went.
    virtual Outcome<std::vector<std::shared_ptr<PerformanceCounterDataModel>>> askPerformanceCounters() = 0;
    /// fetchOxygenSensorTests, with how it went.
    virtual Outcome<std::vector<std::shared_ptr<OxygenSensorMonitorDataModel>>>
    askOxygenSensorTests(OxygenSensorLocation location) = 0;
    virtual Outcome<bool> askOxygenSensorTestComplete() = 0; ///< fetchOxygenSensorTestComplete
};

namespace DiagnosticsServiceBuilder {

/// A new service on the top-level object that was built last, which must outlive it; null before the first one. Build
/// and drop it on the thread that dispatches: see IObdVelmora.
OBD_EXPORT std::shared_ptr<IDiagnosticsService> create();

} // namespace DiagnosticsServiceBuilder

} // namespace obd
