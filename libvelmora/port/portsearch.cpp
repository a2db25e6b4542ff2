#include "libvelmora/port/portsearch.h"

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

std::vector<std::string> devices(PortSearch const& search)
{
    std::vector<std::string> list;
    for (SerialPortEntry const& port : search.ports) {
        list.push_back(port.device);
    }
    if (search.last) {
        auto const known = std::find(list.begin(), list.end(), search.last->device);
        if (known != list.end()) {
            std::rotate(list.begin(), known, known + 1);
        }
    }
    return list;
}

std::vector<unsigned int> rates(PortSearch const& search, std::string const& device)
{
    std::vector<unsigned int> list = search.baud ? std::vector<unsigned int>{*search.baud} : usualRates();
    if (search.last && search.last->device == device) {
        auto const known = std::find(list.begin(), list.end(), search.last->baud);
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

} // namespace

std::string toAddressText(SerialAddress const& address)
{
    return fmt::format("serial://{}?baud={}", address.device, address.baud);
}

SerialAddress findAdapter(PortSearch const& search)
{
    std::vector<std::string> found;
    for (std::string const& device : devices(search)) {
        auto const trying = [&](unsigned int baud) {
            if (search.tell) {
                search.tell(fmt::format("Trying {} at {} baud ...\n", device, baud));
            }
        };
        SerialProbe const probe = probeSerialPort(device, rates(search, device), trying, search.stop, search.places);
        if (probe.outcome == Outcome::Adapter) {
            return {device, probe.baud};
        }
        if (search.stop && search.stop()) {
            throw Error(ErrorKind::Interrupted, "Interrupted");
        }
        found.push_back(describe(device, probe));
    }
    std::string const what = found.empty() ? "No port is named, and there is no serial port to look for an adapter on"
                                           : "No port is named, and no adapter was found";
    found.emplace_back("is the adapter plugged in, and does it have power from the car's socket?");
    found.emplace_back("a network or Bluetooth adapter is named with --port; `velmora ports` lists serial ports");
    found.emplace_back("sim:petrol-can11 is a simulated car");
    throw Error(ErrorKind::PortFailed, what, found);
}

} // namespace velmora
