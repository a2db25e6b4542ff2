#pragma once

#include "libobd/parameters/monitortestitem.h"

#include <obd/diagnosticdatamodels.h>
#include <obd/unitsystem.h>

#include <memory>

namespace obd {

// An on-board monitor with its test results, as texts in one unit system.
std::shared_ptr<DiagnosticMonitorDataModel> makeMonitorModel(ObdMonitorTestItem const& monitor, UnitSystem system);

} // namespace obd
