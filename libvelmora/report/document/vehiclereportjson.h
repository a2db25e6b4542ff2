#pragma once

#include "libvelmora/report/vehiclereport.h"

namespace velmora {

// The document that VehicleReport::toJson prints.
Json toJsonValue(VehicleReport const& report);

// The report that such a document was made from; its findings are worked out anew. A document may come from anywhere.
// Throws Error that names the place that is not as it should be.
VehicleReport parseReport(Json const& document);

} // namespace velmora
