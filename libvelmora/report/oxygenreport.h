#pragma once

#include "libvelmora/report/limittest.h"
#include "libvelmora/report/moduletopic.h"

#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace velmora {

// Bank and sensor, each from 1 on.
std::pair<int, int> placeOf(obd::OxygenSensorLocation location);

// "Bank 1 sensor 2"
std::string locationName(obd::OxygenSensorLocation location);

// "tests" is null on CAN.
Json toJsonValue(OxygenReport const& report);

} // namespace velmora
