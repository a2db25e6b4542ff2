#pragma once

#include "libvelmora/port/openingstop.h"

#include <velmora/ports.h>

#include <chrono>
#include <vector>

namespace velmora {

// What the system's Bluetooth service knows and, with a search above 0, hears in that time. Throws Error where there is
// no such service, or it is switched off.
std::vector<BluetoothEntry> listBluetoothAdapters(std::chrono::seconds search, OpeningStop const& stop);

} // namespace velmora
