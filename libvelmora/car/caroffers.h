#pragma once

#include "libvelmora/session/session.h"

#include <velmora/offers.h>

#include <vector>

namespace velmora {

// What each selected module offers, one after the other; each becomes the library's current one. all: also what the
// library can show and the module does not offer.
std::vector<ModuleOffers> readOffers(Session& session, bool all);

} // namespace velmora
