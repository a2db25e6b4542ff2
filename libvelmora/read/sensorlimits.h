#pragma once

#include <velmora/limits.h>

#include <string>
#include <vector>

namespace velmora {

class SettingsStore;

// By a sensor's key. None for a sensor without, and for a text that is no limit.
SensorLimit limitOf(SettingsStore& store, std::string const& key);
// One without ends removes it. Without bringing it to the disk.
void setLimit(SettingsStore& store, std::string const& key, SensorLimit const& limit);
// The keys of all sensors that have one.
std::vector<std::string> limitedSensors(SettingsStore& store);

} // namespace velmora
