#pragma once

#include "libvelmora/report/finding/inspection.h"

namespace velmora {

// Holds the vehicle against the rule of the report, and fills in verdict and reasons. The model year must be known
// where the rule goes by it.
void judgeInspection(VehicleReport const& vehicle, InspectionReport& report);

} // namespace velmora
