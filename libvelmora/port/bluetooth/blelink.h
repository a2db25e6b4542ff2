#pragma once

#include "libvelmora/port/bluetooth/bluez.h"
#include "libvelmora/port/portaddress.h"

#include <cstddef>
#include <memory>
#include <string>

namespace velmora {

// A connected adapter: how its bytes come and go. A socket that is -1 stands for the slower way, by messages.
struct BleLink
{
    std::unique_ptr<SystemBus> bus; // the link lasts as long as this connection
    std::string device;
    SerialLink characteristics;
    int notifySocket = -1; // one datagram a notification
    int writeSocket = -1;  // one datagram a write, dropped by the service without a word if longer than the piece
    std::size_t piece = 20;
    bool wasConnected = false; // before, by somebody else
};

// Throws Error.
BleLink connectBle(BleAddress const& address, OpeningStop const& stop);

} // namespace velmora
