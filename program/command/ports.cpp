#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/interrupt.h"
#include "program/terminal/output.h"
#include "program/view/json.h"
#include "program/view/printtext.h"

#include <velmora/error.h>
#include <velmora/ports.h>

#include <CLI/App.hpp>
#include <fmt/format.h>

#include <memory>

namespace velmora::cli {

namespace {

constexpr std::chrono::seconds inquiry{11}; // one takes 10.24 s

struct PortsOptions
{
    CLI::App* pair = nullptr;
    std::string device;
    bool known = false;
};

bool interrupted()
{
    return Interrupt::instance().raised();
}

// A computer without Bluetooth is no failure, only a remark.
std::vector<BluetoothEntry> findBluetooth(bool known)
{
    try {
        std::vector<BluetoothEntry> entries = bluetoothAdapters(std::chrono::seconds(0), interrupted);
        if (!known) {
            tell(fmt::format("Listening for Bluetooth adapters nearby, {} s ...\n", inquiry.count()));
            entries = bluetoothAdapters(inquiry, interrupted);
        }
        return entries;
    } catch (Error const& error) {
        if (error.kind() == ErrorKind::Interrupted) {
            throw;
        }
        tellText(std::string("No Bluetooth: ") + error.what() + "\n");
        return {};
    }
}

std::string describe(BluetoothEntry const& entry)
{
    std::string text = entry.name.empty() ? "no name" : entry.name;
    text += entry.paired ? ", paired" : entry.nearby ? ", nearby, not paired" : ", not paired";
    return entry.namedAsOne ? text : text + "; its service could be an adapter's, or a printer's";
}

Json toJsonValue(SerialPortEntry const& port)
{
    return {{"device", port.device},
            {"kind", "serial"},
            {"description", textOrNull(port.description)},
            {"paired", nullptr}};
}

Json toJsonValue(BluetoothEntry const& entry)
{
    return {{"device", entry.address},
            {"kind", entry.address.starts_with("ble:") ? "ble" : "bluetooth"},
            {"description", textOrNull(entry.name)},
            {"paired", entry.paired}};
}

ExitCode listPorts(PortsOptions const& options, bool json)
{
    std::vector<SerialPortEntry> const ports = serialPorts();
    std::vector<BluetoothEntry> const adapters = findBluetooth(options.known);
    if (json) {
        Json list = Json::array();
        for (SerialPortEntry const& port : ports) {
            list.push_back(toJsonValue(port));
        }
        for (BluetoothEntry const& entry : adapters) {
            list.push_back(toJsonValue(entry));
        }
        fmt::print("{}", printed(list));
        return ExitCode::Done;
    }
    for (SerialPortEntry const& port : ports) {
        printText(fmt::format("{}{}{}\n", port.device, port.description.empty() ? "" : "  ", port.description));
    }
    for (BluetoothEntry const& entry : adapters) {
        printText(fmt::format("{}  {}\n", entry.address, describe(entry)));
    }
    if (ports.empty() && adapters.empty()) {
        tellText("No port that looks like an adapter. A network adapter needs none: --port HOST:PORT\n");
    }
    return ExitCode::Done;
}

ExitCode pair(std::string const& device)
{
    std::string const mac = pairBluetooth(
        device, [](std::string const& line) { tell(line); }, interrupted);
    tell("Paired with " + mac + "\n");
    return ExitCode::Done;
}

} // namespace

void addPortsCommand(CommandLine& commandLine)
{
    auto const options = std::make_shared<PortsOptions>();
    CLI::App* const command = commandLine.addCommand(
        "ports", "List serial ports and Bluetooth devices that look like adapters",
        [options](GlobalOptions const& global) {
            return options->pair->parsed() ? pair(options->device) : listPorts(*options, global.json);
        });
    command->add_flag("--known", options->known, "Only what is known; don't listen for Bluetooth adapters nearby");
    options->pair =
        command->add_subcommand("pair", "Pair with a Bluetooth adapter, by the PINs that they usually have");
    options->pair->add_option("MAC", options->device, "The adapter's address, 00:1D:A5:68:98:8B")->required();
}

} // namespace velmora::cli
