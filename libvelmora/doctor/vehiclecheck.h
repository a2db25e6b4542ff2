#pragma once

#include "libvelmora/doctor/doctorreport.h"
#include "libvelmora/session/session.h"

namespace velmora {

// The control modules of a session that is connected, and how fast they can be read.
void checkVehicle(Session& session, DoctorReport& report);

} // namespace velmora
