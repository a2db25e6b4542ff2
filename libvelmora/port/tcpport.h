#pragma once

#include "libvelmora/port/iport.h"
#include "libvelmora/port/portaddress.h"

#include <memory>

namespace velmora {

// Connects to a network adapter, within 10 seconds.
std::unique_ptr<IPort> openTcpPort(TcpAddress const& address);

} // namespace velmora
