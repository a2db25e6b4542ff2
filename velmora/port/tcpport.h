#pragma once

#include "velmora/port/iport.h"
#include "velmora/port/portaddress.h"

#include <memory>

namespace velmora {

// Connects to a network adapter, within 10 seconds.
std::unique_ptr<IPort> openTcpPort(TcpAddress const& address);

} // namespace velmora
