#pragma once

#include "libvelmora/signal/signal.h"

#include <optional>

namespace velmora {

// The usual PIDs of service 01 (SAE J1979) as signals, for equations that reckon with them; nothing for any other.
// Asked as a broadcast.
std::optional<Signal> standardPidSignal(unsigned char pid);

} // namespace velmora
