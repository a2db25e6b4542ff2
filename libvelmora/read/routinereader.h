#pragma once

#include "libvelmora/report/routinesreport.h"
#include "libvelmora/session/session.h"

#include <obd/iecu.h>

#include <memory>

namespace velmora {

// The routines of one control module, which becomes the library's current one. Asks the vehicle nothing.
RoutinesReport readRoutines(Session& session, obd::IEcu const& ecu);

// A routine with the control module that it is to be run on.
struct RoutineChoice
{
    std::shared_ptr<obd::IEcu> ecu;
    Routine routine;
};

// The first of the selected modules that offers the routine. What a routine does that the library does not know, nobody
// can be warned of; it is not found. Throws Error if none offers it.
RoutineChoice findRoutine(Session& session, int id);

// Starts a routine, without any question.
RoutineRun runRoutine(Session& session, obd::IEcu const& ecu, Routine const& routine);

} // namespace velmora
