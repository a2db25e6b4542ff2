#pragma once

#include "simulator/car/moduledata.h"
#include "simulator/error.h"

#include <string_view>

namespace obdsim {

/// A vehicle file that cannot be used. what() begins with "FILE:LINE: ".
class VehicleFileError : public SimulatorError
{
public:
    using SimulatorError::SimulatorError;
};

/// Reads the text of a vehicle file; `origin` is its name in error messages.
/// Throws VehicleFileError for broken TOML, an unknown key, a value of the wrong
/// kind or out of its range, and a missing one.
VehicleData parseVehicle(std::string_view text, std::string const& origin);

} // namespace obdsim
