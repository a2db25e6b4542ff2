#pragma once

#include "velmora/session.h"
#include "velmora/view/countersreport.h"
#include "velmora/view/inforeport.h"
#include "velmora/view/monitorsreport.h"
#include "velmora/view/oxygenreport.h"
#include "velmora/view/readinessreport.h"

#include <obd/iecu.h>

// Each reads one topic of one control module, which becomes the library's current one. A module is asked only for what
// it says it supports. They throw Failure if the link breaks or the user interrupts meanwhile.

namespace velmora {

ReadinessReport readReadiness(Session& session, obd::IEcu const& ecu);
// Asks once for each monitor, which takes seconds.
MonitorsReport readMonitors(Session& session, obd::IEcu const& ecu);
OxygenReport readOxygen(Session& session, obd::IEcu const& ecu);
CountersReport readCounters(Session& session, obd::IEcu const& ecu);
InfoReport readInfo(Session& session, obd::IEcu const& ecu);

} // namespace velmora
