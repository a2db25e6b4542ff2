#pragma once

#include "libvelmora/port/openingstop.h"

#include <chrono>
#include <string>
#include <vector>

namespace velmora {

// A Bluetooth device that looks like an adapter.
struct BluetoothEntry
{
    std::string address; // as --port takes it: "bt://00:1D:A5:68:98:8B" or "ble://..."
    std::string name;    // as the user knows it
    bool paired = false;
    bool nearby = false;     // heard in this search
    bool namedAsOne = false; // its name is one of adapters; else only its service could be one's
};

// What the system's Bluetooth service knows and, with a search above 0, hears in that time. Throws Error where there is
// no such service, or it is switched off.
std::vector<BluetoothEntry> listBluetoothAdapters(std::chrono::seconds search, OpeningStop const& stop);

} // namespace velmora
