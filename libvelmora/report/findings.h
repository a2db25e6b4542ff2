#pragma once

#include "libvelmora/report/vehiclereport.h"

#include <string>
#include <vector>

namespace velmora {

enum class Severity : int
{
    Warning, // not known to be right yet
    Bad,
};

// Something that is wrong, or not known to be right yet.
struct Finding
{
    Severity severity;
    std::string module; // "7E8 ECM"
    std::string what;   // such as "confirmed, permanent"
    std::string text;
};

// All of a vehicle: lamps first, then codes, failed tests and what has not been tested.
std::vector<Finding> findings(VehicleReport const& report);

} // namespace velmora
