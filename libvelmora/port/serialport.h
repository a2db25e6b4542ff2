#pragma once

#include "libvelmora/port/iport.h"
#include "libvelmora/port/portaddress.h"

#include <memory>

namespace velmora {

// Opens a serial line, 8 data bits, no parity, no flow control. The line is taken for this program alone.
std::unique_ptr<IPort> openSerialPort(SerialAddress const& address);

} // namespace velmora
