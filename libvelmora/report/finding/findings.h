#pragma once

#include "libvelmora/report/vehiclereport.h"

#include <velmora/findings.h>

#include <string>
#include <vector>

namespace velmora {

// "note", "warning" or "bad", for programs.
char const* severityKey(Severity severity);

// Where the data stands: "codes-7E8" in pages, "/modules/0/codes" in the JSON document.
std::string anchorOf(Evidence const& evidence);
std::string pointerTo(Evidence const& evidence, VehicleReport const& report);

Json toJsonValue(std::vector<Finding> const& findings, VehicleReport const& report);

} // namespace velmora
