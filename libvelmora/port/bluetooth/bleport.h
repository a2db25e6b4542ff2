#pragma once

#include "libvelmora/port/iport.h"
#include "libvelmora/port/openingstop.h"
#include "libvelmora/port/portaddress.h"

#include <memory>

namespace velmora {

// Connects to a Bluetooth Low Energy adapter by the system's Bluetooth service. It need not be paired: many can't be.
// Throws Error.
std::unique_ptr<IPort> openBlePort(BleAddress const& address, OpeningStop const& stop);

} // namespace velmora
