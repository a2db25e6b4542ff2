#include "libvelmora/port/opening/portsearch.h"

#include "libvelmora/port/opening/openport.h"
#include "libvelmora/port/opening/portprobe.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

namespace {

using Outcome = SerialProbe::Outcome;

// The lines of USB modems and of Bluetooth have no rate of their own, so one attempt tells.
bool hasRate(std::string const& device)
{
    return device.find("ttyACM") == std::string::npos && device.find("rfcomm") == std::string::npos;
}

SerialAddress const* lastSerial(PortSearch const& search)
{
    return search.last ? std::get_if<SerialAddress>(&*search.last) : nullptr;
}

bool isBluetooth(PortAddress const& address)
{
    return std::holds_alternative<BluetoothAddress>(address) || std::holds_alternative<BleAddress>(address);
}

// The one used before first, which need not be paired.
std::vector<PortAddress> bluetoothAddresses(PortSearch const& search)
{
    std::vector<PortAddress> list;
    if (search.last && isBluetooth(*search.last)) {
        list.push_back(*search.last);
    }
    for (BluetoothEntry const& entry : search.paired) {
        PortAddress const address = parsePortAddress(entry.address);
        if (entry.paired && std::find(list.begin(), list.end(), address) == list.end()) {
            list.push_back(address);
        }
    }
    return list;
}

std::vector<std::string> devices(PortSearch const& search)
{
    std::vector<std::string> list;
    for (SerialPortEntry const& port : search.ports) {
        list.push_back(port.device);
    }
    if (SerialAddress const* const last = lastSerial(search)) {
        auto const known = std::find(list.begin(), list.end(), last->device);
        if (known != list.end()) {
            std::rotate(list.begin(), known, known + 1);
        }
    }
    return list;
}

std::vector<unsigned int> rates(PortSearch const& search, std::string const& device)
{
    std::vector<unsigned int> list = search.baud ? std::vector<unsigned int>{*search.baud} : usualRates();
    SerialAddress const* const last = lastSerial(search);
    if (last != nullptr && last->device == device) {
        auto const known = std::find(list.begin(), list.end(), last->baud);
        if (known != list.end()) {
            std::rotate(list.begin(), known, known + 1);
        }
    }
    list.resize(hasRate(device) ? list.size() : 1);
    return list;
}

std::string describe(std::string const& device, SerialProbe const& probe)
{
    switch (probe.outcome) {
    case Outcome::Held:
        return device + " is held by " +
               (probe.text.empty() ? "another program; by which is not readable" : probe.text);
    case Outcome::Forbidden:
        return device + " is not yours to open: add your user to the group dialout and log in again";
    case Outcome::OtherThing:
        return device + " answers, but not as an adapter does (\"" + probe.text.substr(0, 40) + "\")";
    case Outcome::Missing:
        return device + " can't be opened";
    case Outcome::NoPort:
        return device + " is no serial port";
    default:
        return "nothing answers on " + device;
    }
}

void tellTrying(PortSearch const& search, std::string const& what)
{
    if (search.tell) {
        search.tell("Trying " + what + " ...\n");
    }
}

void endIfStopped(PortSearch const& search)
{
    if (search.stop && search.stop()) {
        failInterruptedOpening();
    }
}

std::optional<PortAddress> findOnSerialPorts(PortSearch const& search, std::vector<std::string>& found)
{
    for (std::string const& device : devices(search)) {
        auto const trying = [&](unsigned int baud) { tellTrying(search, fmt::format("{} at {} baud", device, baud)); };
        SerialProbe const probe = probeSerialPort(device, rates(search, device), trying, search.stop, search.places);
        if (probe.outcome == Outcome::Adapter) {
            return SerialAddress{device, probe.baud};
        }
        endIfStopped(search);
        found.push_back(describe(device, probe));
    }
    return std::nullopt;
}

std::optional<PortAddress> findByBluetooth(PortSearch const& search, std::vector<std::string>& found)
{
    for (PortAddress const& address : bluetoothAddresses(search)) {
        tellTrying(search, toString(address));
        try {
            if (answersAsAdapter(openPort(address, search.stop), search.stop)) {
                return address;
            }
            found.push_back(toString(address) + " does not answer as an adapter does");
        } catch (Error const& error) {
            if (error.kind() == ErrorKind::Interrupted) {
                throw;
            }
            found.emplace_back(error.what());
        }
        endIfStopped(search);
    }
    return std::nullopt;
}

// The radio takes its time, so the wires go first unless the adapter was a Bluetooth one the last time.
std::optional<PortAddress> findAnywhere(PortSearch const& search, std::vector<std::string>& found)
{
    if (search.last && isBluetooth(*search.last)) {
        std::optional<PortAddress> const address = findByBluetooth(search, found);
        return address ? address : findOnSerialPorts(search, found);
    }
    std::optional<PortAddress> const address = findOnSerialPorts(search, found);
    return address ? address : findByBluetooth(search, found);
}

} // namespace

std::string toAddressText(PortAddress const& address)
{
    auto const* const serial = std::get_if<SerialAddress>(&address);
    return serial != nullptr ? fmt::format("serial://{}?baud={}", serial->device, serial->baud) : toString(address);
}

PortAddress findAdapter(PortSearch const& search)
{
    std::vector<std::string> found;
    if (std::optional<PortAddress> const address = findAnywhere(search, found)) {
        return *address;
    }
    std::string const what = found.empty() ? "No port is named, and there is no serial port to look for an adapter on"
                                           : "No port is named, and no adapter was found";
    found.emplace_back("is the adapter plugged in, and does it have power from the car's socket?");
    found.emplace_back("a network adapter is named with --port; a Bluetooth one, too, unless it is paired: `velmora "
                       "ports` lists them");
    found.emplace_back("sim:petrol-can11 is a simulated car");
    throw Error(ErrorKind::PortFailed, what, found);
}

} // namespace velmora
