#pragma once

#include <velmora/trips.h>

#include <string>
#include <vector>

namespace velmora::cli {

// A line a trip, then the totals of trips by day and by month. Days are those of the local zone at the begin.
std::string tripsText(std::vector<Trip> const& trips);
std::string tripsCsv(std::vector<Trip> const& trips);

} // namespace velmora::cli
