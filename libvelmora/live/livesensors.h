#pragma once

#include "libvelmora/uds/signalrow.h"
#include "libvelmora/vehicle/units.h"

#include <obd/parameterdescriptor.h>
#include <velmora/live.h>

namespace velmora {

// The sensors of a parameter, in the units that the descriptor has; metric describes it in metric ones.
LiveParameter liveSensors(obd::ParameterDescriptor const& descriptor, obd::ParameterDescriptor const& metric,
                          unsigned int module, std::optional<double> hertz, Units units);
LiveParameter liveSensors(SignalRow const& signal);

} // namespace velmora
