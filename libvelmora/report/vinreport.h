#pragma once

#include "libvelmora/report/json.h"
#include "libvelmora/vehicle/vin.h"

#include <string>

namespace velmora {

// How the program says who made the vehicle: a maker, with "probably" where the lists are not sure, or a small maker.
std::string makerText(VinFacts const& facts);

// The object that docs/json.md describes under vin.
Json toJsonValue(VinFacts const& facts);

} // namespace velmora
