#pragma once

#include "libvelmora/port/iport.h"
#include "libvelmora/port/openingstop.h"
#include "libvelmora/port/portaddress.h"

#include <memory>

namespace velmora {

// Whether this build can speak to the system's Bluetooth service, which Low Energy, lists and pairing need.
bool hasBluetoothService();

// Connects to a classic adapter: through the system's Bluetooth service, or past it by the kernel's own socket. Throws
// Error.
std::unique_ptr<IPort> openBluetoothPort(BluetoothAddress const& address, OpeningStop const& stop);

} // namespace velmora
