#pragma once

#include "simulator/car/moduledata.h"
#include "simulator/car/tablereader.h"

namespace obdsim {

/// Reads one [[module]] of a vehicle whose protocol and engine are known already.
/// Throws VehicleFileError.
ModuleData readModule(TableReader& table, VehicleData const& vehicle);

} // namespace obdsim
