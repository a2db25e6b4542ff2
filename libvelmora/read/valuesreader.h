#pragma once

#include "libvelmora/read/groupedpids.h"
#include "libvelmora/session/session.h"

#include <obd/iecu.h>
#include <velmora/report.h>

#include <memory>
#include <vector>

namespace velmora {

// The sensors that a report's findings look at, as far as the module supports them: run time, temperatures, fuel system
// and trims, voltage, and what was counted since the codes were cleared. bus is of this module. Throws Error if the
// link breaks or the user interrupts.
std::vector<LiveValue> readValues(Session& session, obd::IEcu const& ecu, std::shared_ptr<GroupedPids> const& bus);

// Asks again for those that change from second to second, and adds the samples. What stands in a value is then its last
// reading.
void readValuesAgain(Session& session, obd::IEcu const& ecu, std::shared_ptr<GroupedPids> const& bus,
                     std::vector<LiveValue>& values);

} // namespace velmora
