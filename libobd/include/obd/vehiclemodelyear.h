#pragma once

#include <obd/export.h>

#include <string>

namespace obd {

/// The model year by the tenth character of a VIN (ISO 3779), 1996 to 2025: the years since OBD-II began. 0 for a text
/// that is not 17 characters long, and for a character that stands for no year.
OBD_EXPORT int GetVehicleModelYear(std::string const& vin);

} // namespace obd
