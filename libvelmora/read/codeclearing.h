#pragma once

#include "libvelmora/session/session.h"

#include <velmora/actions.h>
#include <velmora/error.h>

#include <vector>

namespace velmora {

// Clears the trouble codes of all control modules with one request, without any question; those that answered and were
// not known are among the results. Throws Error if the link breaks or the user interrupts.
std::vector<ModuleTopic<ClearReport>> clearCodes(Session& session);

} // namespace velmora
