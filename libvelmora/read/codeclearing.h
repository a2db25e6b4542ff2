#pragma once

#include "libvelmora/session/session.h"

#include <velmora/actions.h>
#include <velmora/error.h>

#include <vector>

namespace velmora {

// Clears the trouble codes of all control modules with one request, without any question; those that answered and were
// not known are among the results. Throws Error if the link breaks or the user interrupts.
std::vector<ModuleTopic<ClearReport>> clearCodes(Session& session);

// Throws Error unless a module has cleared its codes.
void requireCleared(std::vector<ModuleTopic<ClearReport>> const& modules);

// What a refusal means for who wanted it.
Error refusedToClear(ModuleTopic<ClearReport> const& module);

} // namespace velmora
