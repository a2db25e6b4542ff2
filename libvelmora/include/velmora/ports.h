#pragma once

#include <velmora/export.h>

#include <chrono>
#include <functional>
#include <string>
#include <vector>

/// Where adapters may be, before there is a car.

namespace velmora {

/// A serial line that an adapter may hang on.
struct SerialPortEntry
{
    std::string device;      ///< as CarOptions::port takes it: "/dev/ttyUSB0"
    std::string description; ///< what the system tells of it, such as the USB product; may be empty
};

/// A Bluetooth device that looks like an adapter.
struct BluetoothEntry
{
    std::string address;     ///< as CarOptions::port takes it: "bt://00:1D:A5:68:98:8B" or "ble://..."
    std::string name;        ///< as the user knows it
    bool paired = false;     ///< with this computer
    bool nearby = false;     ///< heard in this search
    bool namedAsOne = false; ///< its name is one of adapters; else only its service could be one's
};

/// Asked now and then while something takes its time, on the thread that waits: true ends the attempt, which then
/// throws Error of the kind Interrupted. Null never ends it.
using StopAsked = std::function<bool()>;

/// USB serial converters, USB modems and bound Bluetooth ports.
VELMORA_EXPORT std::vector<SerialPortEntry> serialPorts();

/// What the system's Bluetooth service knows and, with a search above 0, hears in that time. Throws Error where there
/// is no such service, or it is switched off.
VELMORA_EXPORT std::vector<BluetoothEntry> bluetoothAdapters(std::chrono::seconds search, StopAsked const& stop = {});

/// Pairs this computer with an adapter: answers its question for a PIN with 1234, then 0000, which adapters have, and
/// confirms what modern ones ask; then trusts it. device: its address, alone or as CarOptions::port takes it. tell gets
/// each step as a line with its line feed. Paired already is no error. Gives the address as it was understood. Throws
/// Error.
VELMORA_EXPORT std::string pairBluetooth(std::string const& device,
                                         std::function<void(std::string const& line)> const& tell,
                                         StopAsked const& stop = {});

} // namespace velmora
