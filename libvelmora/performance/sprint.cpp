#include "libvelmora/performance/sprint.h"

#include <algorithm>
#include <cmath>

namespace velmora {

namespace {

constexpr double metrePerSecond = 1.0 / 3.6; // in a km/h
constexpr double kmhInMph = 1.609344;
constexpr double quarterMile = 402.336; // metres

double metresBetween(SpeedPoint const& a, SpeedPoint const& b)
{
    return (a.kmh + b.kmh) * 0.5 * metrePerSecond * (b.seconds - a.seconds);
}

// Where a speed lies on the way from a to b, which rises and meets it.
SpeedPoint atSpeed(SpeedPoint const& a, SpeedPoint const& b, double kmh)
{
    return {a.seconds + (kmh - a.kmh) / (b.kmh - a.kmh) * (b.seconds - a.seconds), kmh};
}

// Where so many metres of the way from a to b lie behind; the speed changes evenly.
SpeedPoint atDistance(SpeedPoint const& a, SpeedPoint const& b, double metres)
{
    double const duration = b.seconds - a.seconds;
    double const speed = a.kmh * metrePerSecond;
    double const acceleration = (b.kmh - a.kmh) * metrePerSecond / duration;
    double const root = std::sqrt(std::max(0.0, speed * speed + 2.0 * acceleration * metres));
    double const time = 2.0 * metres / (speed + root);
    return {a.seconds + time, a.kmh + (b.kmh - a.kmh) * time / duration};
}

// Where the run leaves a speed for the last time before `end`, rising, so that a speed that was held before does not
// count; the start for a speed of 0.
std::optional<SpeedPoint> lastRise(std::vector<SpeedPoint> const& run, double kmh, double end)
{
    if (kmh <= 0.0) {
        return run.front();
    }
    std::optional<SpeedPoint> found;
    for (std::size_t i = 1; i < run.size(); ++i) {
        if (run[i - 1].kmh <= kmh && run[i].kmh > kmh) {
            SpeedPoint const point = atSpeed(run[i - 1], run[i], kmh);
            found = point.seconds <= end ? std::optional(point) : found;
        }
    }
    return found;
}

std::optional<SpeedPoint> firstRise(std::vector<SpeedPoint> const& run, double kmh)
{
    for (std::size_t i = 1; i < run.size(); ++i) {
        if (run[i - 1].kmh < kmh && run[i].kmh >= kmh) {
            return atSpeed(run[i - 1], run[i], kmh);
        }
    }
    return std::nullopt;
}

std::optional<SpeedPoint> afterMetres(std::vector<SpeedPoint> const& run, double metres)
{
    if (metres <= 0.0) {
        return std::nullopt;
    }
    for (std::size_t i = 1; i < run.size(); ++i) {
        double const part = metresBetween(run[i - 1], run[i]);
        if (part >= metres) {
            return atDistance(run[i - 1], run[i], metres);
        }
        metres -= part;
    }
    return std::nullopt;
}

} // namespace

std::vector<SprintGoal> sprintGoals(bool imperial)
{
    SprintGoal const sprint =
        imperial ? SprintGoal{"0 to 60 mph", 0.0, 60.0 * kmhInMph, {}} : SprintGoal{"0 to 100 km/h", 0.0, 100.0, {}};
    return {sprint, {"80 to 120 km/h", 80.0, 120.0, {}}, {"quarter mile", 0.0, {}, quarterMile}};
}

std::optional<SprintTime> timeOf(SprintGoal const& goal, std::vector<SpeedPoint> const& run, double interval)
{
    if (run.size() < 2) {
        return std::nullopt;
    }
    std::optional<SpeedPoint> const end = goal.toKmh ? firstRise(run, *goal.toKmh) : afterMetres(run, *goal.metres);
    std::optional<SpeedPoint> const begin = end ? lastRise(run, goal.fromKmh, end->seconds) : std::nullopt;
    if (!begin || end->seconds <= begin->seconds) {
        return std::nullopt;
    }
    double const seconds = end->seconds - begin->seconds;
    double const acceleration = (end->kmh - begin->kmh) / seconds; // km/h a second
    if (acceleration <= 0.0) {
        return std::nullopt;
    }
    return SprintTime{seconds, (1.0 + acceleration * interval) / acceleration, end->kmh};
}

std::vector<SprintGoal> allSprintGoals()
{
    std::vector<SprintGoal> goals = sprintGoals(false);
    goals.insert(goals.begin() + 1, sprintGoals(true).front());
    return goals;
}

double distanceOf(std::vector<SpeedPoint> const& run)
{
    double metres = 0.0;
    for (std::size_t i = 1; i < run.size(); ++i) {
        metres += metresBetween(run[i - 1], run[i]);
    }
    return metres;
}

} // namespace velmora
