#include "libvelmora/performance/performancejson.h"

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

Json performanceJson(PerformanceMeter const& meter, std::vector<SprintGoal> const& goals, int kilograms)
{
    std::vector<SpeedPoint> const run = meter.run();
    Json json = {{"state", stateText(meter.state())},
                 {"weight_kg", kilograms},
                 {"interval_s", rounded(meter.interval(), 1000.0)},
                 {"distance_m", rounded(distanceOf(run), 10.0)},
                 {"goals", Json::array()},
                 {"speed", Json::array()},
                 {"power", Json::array()}};
    for (SprintGoal const& goal : goals) {
        json["goals"].push_back(goalJson(goal, timeOf(goal, run, meter.interval())));
    }
    for (SpeedPoint const& point : run) {
        json["speed"].push_back({{"s", rounded(point.seconds - run.front().seconds, 1000.0)}, {"kmh", point.kmh}});
    }
    for (PerformanceMeter::PowerPoint const& point : meter.powers()) {
        json["power"].push_back(
            {{"rpm", point.rpm}, {"kw", rounded(point.kilowatt, 10.0)}, {"nm", rounded(point.newtonMetre, 10.0)}});
    }
    return json;
}

} // namespace velmora
