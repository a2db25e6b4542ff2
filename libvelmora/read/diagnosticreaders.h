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

// Whether the module reports PID 0x01.
bool tellsReadiness(obd::IEcu const& ecu);
ReadinessReport readReadiness(Session& session, obd::IEcu const& ecu);
// Asks once for each monitor, which takes seconds.
MonitorsReport readMonitors(Session& session, obd::IEcu const& ecu);
OxygenReport readOxygen(Session& session, obd::IEcu const& ecu);
CountersReport readCounters(Session& session, obd::IEcu const& ecu);
// What a reply of service 09 means that gave no counters. The legacy buses' check bytes hide which are 0.
TopicAnswer judgeWithoutCounters(std::vector<unsigned char> const& reply, obd::ObdProtocol protocol);
InfoReport readInfo(Session& session, obd::IEcu const& ecu);
// The vehicle identification number; empty if the module does not tell it.
std::string readVin(Session& session, obd::IEcu const& ecu);

} // namespace velmora
