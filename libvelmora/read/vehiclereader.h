#pragma once

#include "libvelmora/report/vehiclereport.h"
#include "libvelmora/session/session.h"

namespace velmora {

// Asks adapter and control modules for all that a report holds, one module after another; each becomes the library's
// current one. Takes seconds. session must be connected. Throws Error if the link breaks or the user interrupts.
VehicleReport readVehicle(Session& session);

} // namespace velmora
