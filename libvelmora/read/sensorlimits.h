#pragma once

#include <optional>
#include <string>
#include <vector>

namespace velmora {

class SettingsStore;

// What a sensor's value should stay in, in its metric unit; views mark values outside.
struct SensorLimit
{
    std::optional<double> lowest;
    std::optional<double> highest;

    bool isOutside(double value) const { return (lowest && value < *lowest) || (highest && value > *highest); }
    bool operator==(SensorLimit const&) const = default;
};

// Reads "6000" and "..6000" (at most), "11.8.." (at least), "11.8..14.8". Throws Error for any other text.
SensorLimit parseLimit(std::string const& text);
// "..6000", "11.8..", "11.8..14.8"; empty for none.
std::string limitText(SensorLimit const& limit);

// The key that a sensor's limit is kept under: that of a PID in any usual form or by any of its names, else the text
// itself, for a signal's id. Throws Error for a text that can be neither.
std::string limitKey(std::string const& sensor);

// By a sensor's key. None for a sensor without, and for a text that is no limit.
SensorLimit limitOf(SettingsStore& store, std::string const& key);
// One without ends removes it. Without bringing it to the disk.
void setLimit(SettingsStore& store, std::string const& key, SensorLimit const& limit);
// The keys of all sensors that have one.
std::vector<std::string> limitedSensors(SettingsStore& store);

} // namespace velmora
