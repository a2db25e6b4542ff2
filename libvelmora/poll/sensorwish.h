#pragma once

#include <optional>
#include <string>

namespace velmora {

// What one word of a user asks for: a sensor, of a control module if one is named, so many times a second if a rate is
// named.
struct SensorWish
{
    std::optional<unsigned int> module;
    std::string sensor; // as typed: a PID, a name, words of a title, or "all"
    std::optional<double> hertz;
};

// Reads "RPM", "RPM@10hz", "7E8:RPM" and "7E9:05@0.2hz". Throws Error for a rate that is none, and for a part that is
// empty.
SensorWish parseSensorWish(std::string const& word);

// Reads "10hz", "0.2 Hz" or "10"; nothing for any other text, and for rates outside 0.001 to 1000.
std::optional<double> parseRate(std::string const& text);

// "10", "0.2", "33.3": at most three digits that count.
std::string rateText(double hertz);

} // namespace velmora
