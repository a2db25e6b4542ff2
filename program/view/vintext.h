#pragma once

#include "libvelmora/vehicle/vin.h"
#include "program/view/style.h"

#include <string>

namespace velmora::cli {

// What a vehicle identification number says, a line each.
std::string toText(VinFacts const& facts, Style const& style);

} // namespace velmora::cli
