#pragma once

#include <velmora/unitlabel.h>

namespace velmora {

// That of a sensor: the library gives ignition and injection timing without a unit, yet they are degrees.
char const* unitLabel(int uid, MeasurementUnit unit);

} // namespace velmora
