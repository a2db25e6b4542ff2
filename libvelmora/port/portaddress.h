#pragma once

#include <optional>
#include <string>
#include <variant>
#include <vector>

namespace velmora {

struct SerialAddress
{
    std::string device;
    unsigned int baud;

    bool operator==(SerialAddress const&) const = default;
};

struct TcpAddress
{
    std::string host;
    unsigned short port;

    bool operator==(TcpAddress const&) const = default;
};

// A vehicle of the simulator, by name or file. What is empty is the simulator's own choice.
struct SimulatorAddress
{
    std::string vehicle;
    bool instant = false; // the adapter answers at once, in place of the time that adapters and cars take
    std::string adapter = {};
    std::string drive = {};    // by name or file
    std::string scenario = {}; // a file
    std::vector<std::string> faults = {};

    bool operator==(SimulatorAddress const&) const = default;
};

// A recorded dialogue.
struct ReplayAddress
{
    std::string file;

    bool operator==(ReplayAddress const&) const = default;
};

// A classic Bluetooth adapter. The address stands in upper case: "00:1D:A5:68:98:8B".
struct BluetoothAddress
{
    std::string mac;
    std::optional<unsigned int> channel; // found by itself if it is not told

    bool operator==(BluetoothAddress const&) const = default;
};

// A Bluetooth Low Energy adapter.
struct BleAddress
{
    std::string mac;

    bool operator==(BleAddress const&) const = default;
};

using PortAddress =
    std::variant<SerialAddress, TcpAddress, SimulatorAddress, ReplayAddress, BluetoothAddress, BleAddress>;

constexpr unsigned int defaultBaud = 38400;
constexpr unsigned short defaultTcpPort = 35000; // what Wi-Fi adapters listen on

// Reads what a user gives to --port. baud holds for a serial port whose address names no other.
// Throws Error (wrong use) for a text that is no address.
PortAddress parsePortAddress(std::string const& text, unsigned int baud = defaultBaud);

// Six pairs of hexadecimal digits with colons between, returned in upper case. Throws Error (wrong use).
std::string parseBluetoothMac(std::string const& text);

// The address as the user may write it, for messages.
std::string toString(PortAddress const& address);

} // namespace velmora
