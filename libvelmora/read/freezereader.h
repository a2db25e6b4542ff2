#pragma once

#include "libvelmora/report/freezereport.h"
#include "libvelmora/session/session.h"

#include <obd/iecu.h>

namespace velmora {

// Reads a freeze frame of one control module, which becomes the library's current one.
FreezeReport readFreeze(Session& session, obd::IEcu const& ecu, unsigned char frame);

} // namespace velmora
