#pragma once

#include <velmora/limits.h>

#include <optional>
#include <string>

namespace velmora::cli {

// A value in a metric unit as another unit has it, both by their labels; nothing for a pair that is not known.
std::optional<double> converted(double value, std::string const& metric, std::string const& shown);

// A limit that was set in a metric unit; none at all where the pair is not known, for a wrong one would be worse.
SensorLimit converted(SensorLimit const& limit, std::string const& metric, std::string const& shown);

} // namespace velmora::cli
