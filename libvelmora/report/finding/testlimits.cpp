#include "libvelmora/report/finding/testlimits.h"

#include "common/text/text.h"

#include <algorithm>
#include <array>
#include <cmath>

namespace velmora {

namespace {

constexpr double closePart = 0.1;

// The steps in which numbers of two bytes are told (SAE J1979, appendix E), and what they become in the imperial units
// that are shown.
constexpr std::array factors = {1.0,
                                0.1,
                                0.01,
                                0.001,
                                0.0001,
                                0.00025,
                                0.25,
                                0.5,
                                0.05,
                                0.0117,
                                0.079,
                                10.0,
                                0.005,
                                0.00005,
                                3.0517578125e-05,
                                0.00030517578125,
                                0.0001220703125,
                                0.00390625,
                                0.000244140625,
                                0.0015259021896696422,
                                0.0030517578125,
                                0.000775146484375,
                                6.103516e-05};
constexpr std::array conversions = {1.0,         0.621371192, 0.145037738,  0.00220462262, 0.947816988,
                                    0.737562149, 1.8,         0.0393700787, 0.264172052};

bool isMultiple(double limit, double counts)
{
    return std::any_of(factors.begin(), factors.end(), [&](double factor) {
        return std::any_of(conversions.begin(), conversions.end(), [&](double conversion) {
            double const end = counts * factor * conversion;
            return std::abs(limit - end) <= end * 2e-5;
        });
    });
}

// -40 to 6513.5 degrees Celsius, and the same in Fahrenheit.
bool isTemperatureEnd(double limit)
{
    constexpr std::array ends = {6513.5, 11756.3};
    return std::any_of(ends.begin(), ends.end(), [limit](double end) { return std::abs(limit - end) < 0.2; });
}

bool isUpperEnd(double limit)
{
    return isMultiple(limit, 65535.0) || isMultiple(limit, 32767.0) || isTemperatureEnd(limit);
}

bool isLowerEnd(double limit)
{
    return limit == 0.0 || isMultiple(-limit, 32768.0) || limit == -40.0;
}

bool isClose(double distance, double measure)
{
    return distance > 0.0 && distance <= measure * closePart;
}

struct MonitorRange
{
    int first;
    int last;
    char const* petrol;
    char const* diesel;
};

constexpr MonitorRange monitorRanges[] = {
    {0x01, 0x1F, "Oxygen Sensor", "Exhaust Gas Sensor"},
    {0x21, 0x24, "Catalyst", "NMHC Catalyst"},
    {0x31, 0x38, "EGR and/or VVT System", "EGR and/or VVT System"},
    {0x39, 0x3D, "Evaporative System", nullptr},
    {0x41, 0x5F, "Oxygen Sensor Heater", "Exhaust Gas Sensor"},
    {0x61, 0x64, "Heated Catalyst", nullptr},
    {0x71, 0x74, "Secondary Air System", nullptr},
    {0x81, 0x84, "Fuel System", "Fuel System"},
    {0x85, 0x86, nullptr, "Boost Pressure"},
    {0x90, 0x99, nullptr, "NOx Aftertreatment"},
    {0xA1, 0xB1, "Misfire", "Misfire"},
    {0xB2, 0xB3, "Gasoline Particulate Filter", "PM filter"},
};

} // namespace

std::optional<TestLimits> limitsOf(LimitTest const& test)
{
    auto const value = numberIn(test.value);
    bool const judged = test.verdict == LimitTest::Verdict::Passed || test.verdict == LimitTest::Verdict::Failed;
    TestLimits limits{value.value_or(0.0), numberIn(test.minimum), numberIn(test.maximum)};
    if (!value || !judged || (limits.min && limits.max && *limits.min > *limits.max)) {
        return std::nullopt;
    }
    if (limits.max && isUpperEnd(*limits.max)) {
        limits.max.reset();
    }
    if (limits.min && isLowerEnd(*limits.min)) {
        limits.min.reset();
    }
    return limits.min || limits.max ? std::optional(limits) : std::nullopt;
}

Closeness closenessOf(LimitTest const& test)
{
    auto const limits = limitsOf(test);
    if (!limits || test.verdict != LimitTest::Verdict::Passed) {
        return Closeness::Far;
    }
    bool const both = limits->min && limits->max;
    double const span = both ? *limits->max - *limits->min : 0.0;
    if (limits->max && isClose(*limits->max - limits->value, both ? span : std::abs(*limits->max))) {
        return Closeness::NearMaximum;
    }
    if (limits->min && isClose(limits->value - *limits->min, both ? span : std::abs(*limits->min))) {
        return Closeness::NearMinimum;
    }
    return Closeness::Far;
}

char const* readinessNameOf(int monitor, bool diesel)
{
    for (MonitorRange const& range : monitorRanges) {
        if (monitor >= range.first && monitor <= range.last) {
            return diesel ? range.diesel : range.petrol;
        }
    }
    return nullptr;
}

} // namespace velmora
