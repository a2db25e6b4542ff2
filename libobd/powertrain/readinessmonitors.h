#pragma once

#include "libobd/powertrain/monitorstatus.h"

#include <obd/diagnosticdatamodels.h>

#include <string>
#include <vector>

namespace obd {

// The monitor's name for display; "NA" for a number that names none, empty for the ignition bit.
std::string readinessMonitorText(ReadinessMonitorTest test);

// The monitors that an engine can have, in the order of display.
std::vector<ReadinessMonitorTest> readinessMonitorTests(IgnitionType ignition);

ReadinessMonitorDataModel::Status readinessSinceCleared(IEcu const& ecu, MonitorStatus const& status,
                                                        ReadinessMonitorTest test);

// Availability is told by PID 0x01 only: in PID 0x41 a clear bit may as well mean disabled for this cycle.
ReadinessMonitorDataModel::Status readinessThisCycle(IEcu const& ecu, MonitorStatus const& status,
                                                     MonitorStatusThisCycle const& thisCycle,
                                                     ReadinessMonitorTest test);

} // namespace obd
