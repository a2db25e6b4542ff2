#pragma once

#include "libvelmora/port/iport.h"
#include "libvelmora/port/openingstop.h"
#include "libvelmora/port/portaddress.h"

#include <memory>

namespace velmora {

// Opens the port; it is not started yet. Throws Error (port failed) with what happened and what to try, or
// (interrupted) when stop said so.
std::unique_ptr<IPort> openPort(PortAddress const& address, OpeningStop const& stop = {});

} // namespace velmora
