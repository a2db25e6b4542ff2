#pragma once

#include "libvelmora/report/limittest.h"
#include "libvelmora/report/moduletopic.h"

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// "Bank 1 sensor 2"
std::string locationName(obd::OxygenSensorLocation location);

// "tests" is null on CAN.
Json toJsonValue(OxygenReport const& report);

} // namespace velmora
