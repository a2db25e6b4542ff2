#pragma once

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// A short name of a PID, as people type it. The first name of a PID in the table is the one that messages use.
struct SensorName
{
    int pid;
    char const* name; // capitals, digits and underscores
};

// All names, by PID.
std::vector<SensorName> const& sensorNames();

// Names that other tools' users know, by PID: understood, but never written, so that keys stay as they are.
std::vector<SensorName> const& sensorAliases();

// The PID of a name or an alias in any letter case, with '-' or a blank for '_'.
std::optional<int> findSensorName(std::string const& text);

// The first name of a PID, empty for one without.
std::string sensorNameOf(int pid);

// The key of a PID for programs: its first name, or "PID_C2".
std::string sensorKey(int pid);

} // namespace velmora
