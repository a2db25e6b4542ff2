#pragma once

#include "libvelmora/port/bluetooth/rfcommport.h"

#include <optional>
#include <string>

namespace velmora {

// Has the system's Bluetooth service connect to the serial port service of a classic adapter that it knows: it asks the
// adapter for the channel, and hands the connected socket over. Nothing where there is no such service, the device is
// not known to it, or it refuses, for then one's own socket may still get through. Throws Error (interrupted).
std::optional<DialedSocket> dialByProfile(std::string const& mac, OpeningStop const& stop);

} // namespace velmora
