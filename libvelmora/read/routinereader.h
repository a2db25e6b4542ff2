#pragma once

#include "libvelmora/report/routinesreport.h"
#include "libvelmora/session/session.h"

#include <obd/iecu.h>

namespace velmora {

// The routines of one control module, which becomes the library's current one. Asks the vehicle nothing.
RoutinesReport readRoutines(Session& session, obd::IEcu const& ecu);

// Starts a routine, without any question.
RoutineRun runRoutine(Session& session, obd::IEcu const& ecu, Routine const& routine);

} // namespace velmora
