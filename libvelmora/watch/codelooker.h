#pragma once

#include "libvelmora/session/session.h"
#include "libvelmora/watch/codewatch.h"

#include <vector>

namespace velmora {

// Asks each module of an open session for lamp, codes and readiness. Throws Error if the link breaks.
std::vector<CodeLook> lookAtCodes(Session& session);

} // namespace velmora
