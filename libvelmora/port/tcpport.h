#pragma once

#include "libvelmora/port/iport.h"
#include "libvelmora/port/openingstop.h"
#include "libvelmora/port/portaddress.h"

#include <memory>

namespace velmora {

// Connects to a network adapter, within 10 seconds. Throws Error.
std::unique_ptr<IPort> openTcpPort(TcpAddress const& address, OpeningStop const& stop);

} // namespace velmora
