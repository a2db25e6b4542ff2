#pragma once

#include "simulator/car/vehiclefile.h"

#include <string>
#include <vector>

namespace obdsim {

/// Names of the vehicles that are built in, sorted.
std::vector<std::string> vehicleNames();

/// The vehicle of that name, or else of that file. Throws VehicleFileError if
/// neither exists or the file is broken.
VehicleData loadVehicle(std::string const& nameOrPath);

} // namespace obdsim
