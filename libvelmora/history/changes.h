#pragma once

#include "libvelmora/report/vehiclereport.h"

#include <cstdint>
#include <string>
#include <vector>

namespace velmora {

enum class ChangeWeight : std::uint8_t
{
    Neutral,
    Better,
    Worse,
};

// One thing that two scans of a vehicle tell differently.
struct Change
{
    char const* kind; // the same in all versions: "code-new"
    ChangeWeight weight;
    std::string module; // "7E8 ECM"; empty for the vehicle
    std::string what;   // "confirmed code", "monitor", ...
    std::string name;   // which one
    std::string before;
    std::string after;
};

// What changed. Only what both scans told is compared: a list that a module did not tell once is neither new nor gone.
// Worse are a new confirmed or permanent code, a lamp that came on, a monitor that is no longer complete though nothing
// was cleared, and a test result that has left its limits.
std::vector<Change> changesBetween(VehicleReport const& older, VehicleReport const& newer);

bool hasWorse(std::vector<Change> const& changes);

// Whether codes were cleared between the scans: something that is counted since then counts less than before. A count
// that stands at the end of its range tells nothing.
bool wereCleared(VehicleReport const& older, VehicleReport const& newer);

Json toJsonValue(std::vector<Change> const& changes);

} // namespace velmora
