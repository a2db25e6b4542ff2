#pragma once

#include <obd/measurementunit.h>

namespace velmora {

// The sign of a unit as people write it, such as "km/h"; empty for a value without one.
char const* unitLabel(MeasurementUnit unit);

} // namespace velmora
