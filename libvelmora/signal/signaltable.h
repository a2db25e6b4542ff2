#pragma once

#include "libvelmora/signal/signal.h"
#include "libvelmora/text/toml.h"

#include <string>
#include <vector>

namespace velmora {

// Reads one [[signal]]. place names it in mistakes, which are added: all that are found, not the first alone.
Signal readSignal(toml::table const& table, std::string const& place, std::vector<SignalMistake>& mistakes);

} // namespace velmora
