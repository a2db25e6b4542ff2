#pragma once

#include "libvelmora/performance/performancemeter.h"
#include "libvelmora/report/json.h"

namespace velmora {

// All of a run: goals with times and errors, the speed over time, power and torque over the engine speed. kilograms:
// the vehicle's weight that they were reckoned with.
Json performanceJson(PerformanceMeter const& meter, std::vector<SprintGoal> const& goals, int kilograms);

} // namespace velmora
