#pragma once

#include "libvelmora/report/countersreport.h"
#include "libvelmora/report/inforeport.h"
#include "libvelmora/report/monitorsreport.h"
#include "libvelmora/report/oxygenreport.h"
#include "libvelmora/report/readinessreport.h"
#include "libvelmora/session/session.h"

#include <obd/iecu.h>

// Each reads one topic of one control module, which becomes the library's current one. A module is asked only for what
// it says it supports. They throw Error if the link breaks or the user interrupts meanwhile.

namespace velmora {

ReadinessReport readReadiness(Session& session, obd::IEcu const& ecu);
// Asks once for each monitor, which takes seconds.
MonitorsReport readMonitors(Session& session, obd::IEcu const& ecu);
OxygenReport readOxygen(Session& session, obd::IEcu const& ecu);
CountersReport readCounters(Session& session, obd::IEcu const& ecu);
InfoReport readInfo(Session& session, obd::IEcu const& ecu);
// The vehicle identification number; empty if the module does not tell it.
std::string readVin(Session& session, obd::IEcu const& ecu);

} // namespace velmora
