#pragma once

#include <velmora/ports.h>

#include <filesystem>
#include <vector>

namespace velmora {

// Serial lines that an adapter may hang on: USB serial converters, USB modems, bound Bluetooth ports. sysRoot and
// devRoot are "/sys" and "/dev" but for tests.
std::vector<SerialPortEntry> listSerialPorts(std::filesystem::path const& sysRoot = "/sys",
                                             std::filesystem::path const& devRoot = "/dev");

} // namespace velmora
