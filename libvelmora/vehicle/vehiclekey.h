#pragma once

#include <string>

namespace velmora {

// What a vehicle's layouts are kept under. It tells vehicles apart, and nobody the number.
std::string vehicleKey(std::string const& vin);

} // namespace velmora
