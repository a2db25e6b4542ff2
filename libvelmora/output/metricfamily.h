#pragma once

#include <string>

namespace velmora {

// How a quantity is called where base units are the custom, and what turns a number of ours into it.
struct MetricFamily
{
    std::string name; // "velmora_speed_meters_per_second"
    std::string help; // "Speed."
    double factor = 1.0;
    double offset = 0.0; // added after the factor
};

// The family of all readings with a unit label, such as "km/h". A unit that the table lacks has a family of its own.
MetricFamily metricFamily(std::string const& unit);

// What may stand between the quotes of a label.
std::string escapedLabel(std::string const& text);

} // namespace velmora
