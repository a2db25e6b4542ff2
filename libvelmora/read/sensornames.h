#pragma once

#include <velmora/offers.h>

#include <optional>
#include <string>

namespace velmora {

// The PID of a name or an alias in any letter case, with '-' or a blank for '_'.
std::optional<int> findSensorName(std::string const& text);

} // namespace velmora
