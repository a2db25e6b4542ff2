#pragma once

#include "libobd/service/ask.h"

#include <obd/idiagnosticsservice.h>

namespace obd {

// Holds no state of its own: each operation asks with parameter objects that it makes.
class DiagnosticsService : public BaseService, public IDiagnosticsService
{
public:
    using ReadinessMonitors = std::vector<std::shared_ptr<ReadinessMonitorDataModel>>;

    explicit DiagnosticsService(IObdVelmora const* obd, Following following = Following::AtOnce);

    std::vector<std::shared_ptr<ReadinessMonitorDataModel>> fetchReadinessMonitors() override;
    std::vector<std::shared_ptr<ReadinessMonitorDataModel>> fetchReadinessMonitorsThisCycle() override;
    std::vector<std::shared_ptr<DiagnosticMonitorDataModel>> fetchMonitorTests() override;
    std::vector<std::shared_ptr<PerformanceCounterDataModel>> fetchPerformanceCounters() override;
    std::vector<OxygenSensorLocation> oxygenSensorLocations() override;
    std::vector<std::shared_ptr<OxygenSensorMonitorDataModel>>
    fetchOxygenSensorTests(OxygenSensorLocation location) override;
    bool isOxygenSensorTestComplete() override;
    Outcome<ReadinessMonitors> askReadinessMonitors() override;
    Outcome<ReadinessMonitors> askReadinessMonitorsThisCycle() override;
    Outcome<std::vector<std::shared_ptr<DiagnosticMonitorDataModel>>> askMonitorTests() override;
    Outcome<std::vector<std::shared_ptr<PerformanceCounterDataModel>>> askPerformanceCounters() override;
    Outcome<std::vector<std::shared_ptr<OxygenSensorMonitorDataModel>>>
    askOxygenSensorTests(OxygenSensorLocation location) override;
    Outcome<bool> askOxygenSensorTestComplete() override;

private:
    // The fetch operations ask whatever the module says it supports, the others do not: they say what it needs.
    using Need = std::optional<Needed>;

    Outcome<ReadinessMonitors> askSinceCleared(Need const& needed) const;
    Outcome<bool> askOxygenSensorMonitor(Need const& needed) const;
};

} // namespace obd
