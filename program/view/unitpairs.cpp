#include "program/view/unitpairs.h"

#include <string_view>

namespace velmora::cli {

namespace {

struct UnitPair
{
    std::string_view metric;
    std::string_view shown;
    double factor;
    double offset = 0.0;
};

// As the library turns them for display.
constexpr UnitPair unitPairs[] = {
    {"km/h", "mph", 0.62137},       {"km", "mi", 0.62137},          {"°C", "°F", 1.8, 32.0},
    {"kPa", "psi", 0.1450377},      {"kPa", "inHg", 0.2953005865},  {"kPa", "inH2O", 4.01463092},
    {"Pa", "inH2O", 0.00401463092}, {"g/s", "lb/min", 0.132277357}, {"kW", "hp", 1.3410220888},
};

} // namespace

std::optional<double> converted(double value, std::string const& metric, std::string const& shown)
{
    if (metric == shown) {
        return value;
    }
    for (UnitPair const& each : unitPairs) {
        if (each.metric == metric && each.shown == shown) {
            return value * each.factor + each.offset;
        }
    }
    return std::nullopt;
}

SensorLimit converted(SensorLimit const& limit, std::string const& metric, std::string const& shown)
{
    SensorLimit result;
    if (limit.lowest) {
        result.lowest = converted(*limit.lowest, metric, shown);
    }
    if (limit.highest) {
        result.highest = converted(*limit.highest, metric, shown);
    }
    return result;
}

} // namespace velmora::cli
