#pragma once

#include "libvelmora/output/record.h"

#include <string>
#include <vector>

namespace velmora {

// All trips and engine runs of a database, by their begin. Only reads. Throws Error.
std::vector<Trip> readTrips(std::string const& file);

} // namespace velmora
