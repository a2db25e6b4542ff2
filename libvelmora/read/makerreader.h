#pragma once

#include "libvelmora/session/session.h"
#include "libvelmora/vehicle/makerchoice.h"

#include <string>

namespace velmora {

// Whose meanings the vehicle's codes have: those of the maker that the user named, else by the vehicle identification
// number, for which the selected modules are asked until one tells it. Each becomes the library's current one. Throws
// Error if the link breaks or the session is interrupted.
MakerChoice readMaker(Session& session, std::string const& named);

} // namespace velmora
