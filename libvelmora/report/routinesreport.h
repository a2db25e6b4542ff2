#pragma once

#include "libvelmora/report/moduletopic.h"

#include <velmora/actions.h>

#include <string>

namespace velmora {

// "01"
std::string routineId(int id);

// "accepted", "refused", "no answer" or "unreadable".
char const* resultWord(RoutineRun::Result result);

Json toJsonValue(RoutinesReport const& report);

Json toJsonValue(RoutineRun const& run);

} // namespace velmora
