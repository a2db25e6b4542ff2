#pragma once

#include "libvelmora/report/countersreport.h"
#include "libvelmora/report/inforeport.h"
#include "libvelmora/report/monitorsreport.h"
#include "libvelmora/report/oxygenreport.h"
#include "libvelmora/report/readinessreport.h"
#include "libvelmora/session/session.h"

#include <obd/iecu.h>
#include <velmora/report.h>

#include <optional>
#include <vector>

// Each reads one topic of one control module, which becomes the library's current one. A module is asked only for what
// it says it supports. They throw Error if the link breaks or the user interrupts meanwhile.

namespace velmora {

ReadinessReport readReadiness(Session& session, obd::IEcu const& ecu);
// The same where the lamp may be known already.
ReadinessReport readReadinessBeside(Session& session, obd::IEcu const& ecu, std::optional<bool> lamp);
// Asks once for each monitor, which takes seconds.
MonitorsReport readMonitors(Session& session, obd::IEcu const& ecu);
OxygenReport readOxygen(Session& session, obd::IEcu const& ecu);
CountersReport readCounters(Session& session, obd::IEcu const& ecu);
InfoReport readInfo(Session& session, obd::IEcu const& ecu);
// The same where some values have just been read: what they tell is not asked for.
InfoReport readInfoBeside(Session& session, obd::IEcu const& ecu, std::vector<LiveValue> const& values);
// The vehicle identification number; empty if the module does not tell it.
std::string readVin(Session& session, obd::IEcu const& ecu);

} // namespace velmora
