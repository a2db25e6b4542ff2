#pragma once

#include "libvelmora/report/limittest.h"
#include "libvelmora/report/moduletopic.h"

#include <string>
#include <vector>

namespace velmora {

// Monitors with failed tests first, and in each the failed tests first; else as they were.
std::vector<OnBoardMonitor> failedFirst(std::vector<OnBoardMonitor> monitors);

Json toJsonValue(MonitorsReport const& report);

} // namespace velmora
