#pragma once

#include "libvelmora/report/document/reportdocument.h"
#include "libvelmora/report/finding/findings.h"

#include <vector>

// The sections of a report that stand round those of the single control modules.

namespace velmora {

DocumentSection vehicleSection(VehicleReport const& report, ReportFacts const& facts, std::vector<Finding> const& list);
DocumentSection inspectionSection(InspectionReport const& report);

// What the vehicle told, then what that suggests, which may be wrong and says so.
std::vector<DocumentSection> findingSections(std::vector<Finding> const& list);

// The control modules side by side.
DocumentSection modulesSection(VehicleReport const& report);

} // namespace velmora
