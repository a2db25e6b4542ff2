#pragma once

#include "simulator/car/moduledata.h"
#include "simulator/car/tablereader.h"

namespace obdsim {

/// What a module tells of the vehicle and itself (service 09). Throws VehicleFileError.
VehicleInfo readInfo(TableReader& table);

} // namespace obdsim
