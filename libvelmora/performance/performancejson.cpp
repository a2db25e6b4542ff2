#include "libvelmora/performance/performancejson.h"

#include "libvelmora/performance/sprint.h"

#include <cmath>

namespace velmora {

namespace {

double rounded(double value, double parts)
{
    return std::round(value * parts) / parts;
}

Json goalJson(SprintGoal const& goal, std::optional<SprintTime> const& time)
{
    Json json = {{"name", goal.name}, {"seconds", nullptr}, {"error_s", nullptr}, {"end_kmh", nullptr}};
    if (time) {
        json["seconds"] = rounded(time->seconds, 1000.0);
        json["error_s"] = rounded(time->errorSeconds, 1000.0);
        json["end_kmh"] = rounded(time->endKmh, 10.0);
    }
    return json;
}

} // namespace

Json performanceJson(PerformanceRun const& run, std::vector<SprintGoal> const& goals)
{
    Json json = {{"state", stateText(run.state)},
                 {"weight_kg", run.kilograms},
                 {"interval_s", rounded(run.interval, 1000.0)},
                 {"distance_m", rounded(distanceOf(run.speeds), 10.0)},
                 {"goals", Json::array()},
                 {"speed", Json::array()},
                 {"power", Json::array()}};
    for (SprintGoal const& goal : goals) {
        json["goals"].push_back(goalJson(goal, timeOf(goal, run.speeds, run.interval)));
    }
    for (SpeedPoint const& point : run.speeds) {
        json["speed"].push_back(
            {{"s", rounded(point.seconds - run.speeds.front().seconds, 1000.0)}, {"kmh", point.kmh}});
    }
    for (PowerPoint const& point : run.powers) {
        json["power"].push_back(
            {{"rpm", point.rpm}, {"kw", rounded(point.kilowatt, 10.0)}, {"nm", rounded(point.newtonMetre, 10.0)}});
    }
    return json;
}

std::string toJson(PerformanceRun const& run, std::vector<SprintGoal> const& goals)
{
    return printed(performanceJson(run, goals));
}

} // namespace velmora
