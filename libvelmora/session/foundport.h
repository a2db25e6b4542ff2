#pragma once

#include "libvelmora/port/opening/portsearch.h"

#include <filesystem>

namespace velmora {

// Looks for an adapter, first where one was found the last time, and remembers the winner in the settings file, apart
// from a port that the user names. What can't be remembered is told and stands in nobody's way. Throws as findAdapter.
PortAddress findAdapterAgain(PortSearch search, std::filesystem::path const& settings);

} // namespace velmora
