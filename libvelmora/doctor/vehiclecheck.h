#pragma once

#include "libvelmora/doctor/doctorreport.h"
#include "libvelmora/session/session.h"

namespace velmora {

// The control modules of a session that is connected, and how fast they can be read.
void checkVehicle(Session& session, DoctorReport& report);

// What the channel to the adapter has met and healed so far.
void noteHabits(Session const& session, DoctorReport& report);

} // namespace velmora
