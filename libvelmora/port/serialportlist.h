#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace velmora {

struct SerialPortEntry
{
    std::string device;      // "/dev/ttyUSB0"
    std::string description; // what the system tells of it, such as the USB product; may be empty
};

// Serial lines that an adapter may hang on: USB serial converters, USB modems, bound Bluetooth ports. sysRoot and
// devRoot are "/sys" and "/dev" but for tests.
std::vector<SerialPortEntry> listSerialPorts(std::filesystem::path const& sysRoot = "/sys",
                                             std::filesystem::path const& devRoot = "/dev");

} // namespace velmora
