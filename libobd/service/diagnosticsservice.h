#pragma once

#include "libobd/service/baseservice.h"

#include <obd/idiagnosticsservice.h>

namespace obd {

// Holds no state of its own: each operation asks with parameter objects that it makes.
class DiagnosticsService : public BaseService, public IDiagnosticsService
{
public:
    explicit DiagnosticsService(IObdVelmora const* obd, Following following = Following::AtOnce);

    std::vector<std::shared_ptr<ReadinessMonitorDataModel>> fetchReadinessMonitors() override;
    std::vector<std::shared_ptr<ReadinessMonitorDataModel>> fetchReadinessMonitorsThisCycle() override;
    std::vector<std::shared_ptr<DiagnosticMonitorDataModel>> fetchMonitorTests() override;
    std::vector<std::shared_ptr<PerformanceCounterDataModel>> fetchPerformanceCounters() override;
    std::vector<OxygenSensorLocation> oxygenSensorLocations() override;
    std::vector<std::shared_ptr<OxygenSensorMonitorDataModel>>
    fetchOxygenSensorTests(OxygenSensorLocation location) override;
    bool isOxygenSensorTestComplete() override;
};

} // namespace obd
