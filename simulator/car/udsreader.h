#pragma once

#include "simulator/car/moduledata.h"
#include "simulator/car/tablereader.h"

namespace obdsim {

/// What a module tells beyond OBD: signals, codes of ISO 14229, refusals. Throws VehicleFileError.
void readUdsOf(ModuleData& module, TableReader& table);

} // namespace obdsim
