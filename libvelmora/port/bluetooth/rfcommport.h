#pragma once

#include "libvelmora/port/bluetooth/rfcomm.h"
#include "libvelmora/port/iport.h"
#include "libvelmora/port/portaddress.h"

#include <chrono>
#include <functional>
#include <memory>
#include <optional>

namespace velmora {

// A connected socket, and what has to stay alive with it, if anything.
struct DialedSocket
{
    int socket = -1;
    std::shared_ptr<void> keeper;
};

// Asks the system's Bluetooth service for a connected socket; nothing where there is none, or it refuses.
using ProfileDialer = std::function<std::optional<DialedSocket>(std::string const& mac, OpeningStop const& stop)>;

struct RfcommWays
{
    ProfileDialer profile;                // asked first, unless the address names a channel
    IRfcommDialer& dialer;                // asked then
    std::chrono::milliseconds pause{500}; // between channels: the end of the last call is still under way
};

// A connected socket to the serial channel of a classic adapter. Without a channel in the address, 1 to 3 are tried,
// each only after the one before was refused as unknown: any other error holds for all. Throws Error.
DialedSocket dialAdapter(BluetoothAddress const& address, RfcommWays const& ways, OpeningStop const& stop);

// The port over such a socket, which becomes the port's own.
std::unique_ptr<IPort> makeSocketPort(DialedSocket dialed);

} // namespace velmora
