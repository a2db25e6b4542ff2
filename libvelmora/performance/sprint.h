#pragma once

#include <velmora/performance.h>

#include <vector>

namespace velmora {

// The usual goals of both unit systems.
std::vector<SprintGoal> allSprintGoals();

// Metres from the first point on.
double distanceOf(std::vector<SpeedPoint> const& run);

} // namespace velmora
