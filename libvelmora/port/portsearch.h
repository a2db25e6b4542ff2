#pragma once

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
    std::optional<SerialAddress> last; // where one was found before; tried first, at its rate first
    std::optional<unsigned int> baud;  // the only rate to try, if the user names one
    std::function<void(std::string const& line)> tell;
    std::function<bool()> stop;
    HolderPlaces places;
};

// The first port on which an adapter answers. Throws Error that tells of each port what was found there.
SerialAddress findAdapter(PortSearch const& search);

// "serial:///dev/ttyUSB0?baud=38400", as parsePortAddress reads it.
std::string toAddressText(SerialAddress const& address);

} // namespace velmora
