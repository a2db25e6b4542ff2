#pragma once

#include "libvelmora/report/json.h"

#include <velmora/performance.h>

namespace velmora {

// As toJson prints it.
Json performanceJson(PerformanceRun const& run, std::vector<SprintGoal> const& goals);

} // namespace velmora
