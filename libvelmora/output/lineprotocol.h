#pragma once

#include "libvelmora/output/record.h"

#include <string>

namespace velmora {

// A reading in the line protocol of time series databases, with its line end: measurement "velmora", tags vehicle,
// module and sensor, the number in the field value and a text in the field text, nanoseconds. Empty for a reading
// without a value. The first line fixes a field's type for good, so numbers are always floats.
std::string toLineProtocol(Reading const& reading);

} // namespace velmora
