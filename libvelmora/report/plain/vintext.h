#pragma once

#include "common/text/style.h"
#include "libvelmora/vehicle/vin.h"

#include <string>

namespace velmora {

// What a vehicle identification number says, a line each.
std::string toText(VinFacts const& facts, Style const& style);

} // namespace velmora
