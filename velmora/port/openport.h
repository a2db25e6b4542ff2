#pragma once

#include "velmora/port/iport.h"
#include "velmora/port/portaddress.h"

#include <memory>

namespace velmora {

// Opens the port; it is not started yet. Throws Failure (port failed) with what happened and what to try.
std::unique_ptr<IPort> openPort(PortAddress const& address);

} // namespace velmora
