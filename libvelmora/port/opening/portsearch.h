#pragma once

#include "libvelmora/port/bluetooth/adapterlist.h"
#include "libvelmora/port/openingstop.h"
#include "libvelmora/port/portaddress.h"
#include "libvelmora/port/serialportlist.h"
#include "libvelmora/port/serialprobe.h"

#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// How an adapter is looked for.
struct PortSearch
{
    std::vector<SerialPortEntry> ports;
    std::vector<BluetoothEntry> paired; // tried behind the serial ports; never a device that is only nearby
    std::optional<PortAddress> last;    // where one was found before; tried first, at its rate first
    std::optional<unsigned int> baud;   // the only rate to try, if the user names one
    std::function<void(std::string const& line)> tell;
    OpeningStop stop;
    HolderPlaces places;
};

// The first port on which an adapter answers. Throws Error that tells of each port what was found there.
PortAddress findAdapter(PortSearch const& search);

// What parsePortAddress reads as the same address: "serial:///dev/ttyUSB0?baud=38400".
std::string toAddressText(PortAddress const& address);

} // namespace velmora
