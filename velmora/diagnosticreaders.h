#pragma once

#include "velmora/session.h"
#include "velmora/view/readinessreport.h"

#include <obd/iecu.h>

// Each reads one topic of one control module, which becomes the library's current one. A module is asked only for what
// it says it supports. They throw Failure if the link breaks or the user interrupts meanwhile.

namespace velmora {

ReadinessReport readReadiness(Session& session, obd::IEcu const& ecu);

} // namespace velmora
