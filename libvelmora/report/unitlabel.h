#pragma once

#include <obd/measurementunit.h>

namespace velmora {

// The sign of a unit as people write it, such as "km/h"; empty for a value without one.
char const* unitLabel(MeasurementUnit unit);

// That of a sensor: the library gives ignition and injection timing without a unit, yet they are degrees.
char const* unitLabel(int uid, MeasurementUnit unit);

} // namespace velmora
