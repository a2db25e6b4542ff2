#pragma once

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// One point of a run's speed over time; between two of them the speed is taken to rise or fall evenly.
struct SpeedPoint
{
    double seconds = 0.0;
    double kmh = 0.0;
};

// What a run is timed for: to a speed, from one, or over a distance from standing.
struct SprintGoal
{
    std::string name; // "0 to 100 km/h"
    double fromKmh = 0.0;
    std::optional<double> toKmh;
    std::optional<double> metres;
};

// The usual ones: 0 to 100 km/h, or 0 to 60 mph for imperial units; 80 to 120 km/h; a quarter mile.
std::vector<SprintGoal> sprintGoals(bool imperial);
// Those of both.
std::vector<SprintGoal> allSprintGoals();

struct SprintTime
{
    double seconds = 0.0;
    double errorSeconds = 0.0; // what whole km/h and the pause between readings make uncertain
    double endKmh = 0.0;
};

// The time of a goal by the points of a run, whose first one is the start; nothing while it is not reached. A speed
// between two readings is met on the line between them. interval: seconds between two readings.
std::optional<SprintTime> timeOf(SprintGoal const& goal, std::vector<SpeedPoint> const& run, double interval);

// Metres from the first point on.
double distanceOf(std::vector<SpeedPoint> const& run);

} // namespace velmora
