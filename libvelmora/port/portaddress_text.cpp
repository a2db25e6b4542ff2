#include "libvelmora/port/portaddress.h"

namespace velmora {

namespace {

// Each kind of address as it is written.
struct AddressText
{
    std::string operator()(SerialAddress const& address) const
    {
        return address.device + " (" + std::to_string(address.baud) + " baud)";
    }
    std::string operator()(TcpAddress const& address) const
    {
        bool const bracketed = address.host.find(':') != std::string::npos;
        return (bracketed ? "[" + address.host + "]" : address.host) + ":" + std::to_string(address.port);
    }
    std::string operator()(SimulatorAddress const& address) const
    {
        std::string options = address.instant ? "&instant" : "";
        auto const add = [&options](char const* name, std::string const& value) {
            options += value.empty() ? "" : std::string("&") + name + "=" + value;
        };
        add("adapter", address.adapter);
        add("drive", address.drive);
        add("scenario", address.scenario);
        for (std::string const& fault : address.faults) {
            add("fault", fault);
        }
        return "sim:" + address.vehicle + (options.empty() ? "" : "?" + options.substr(1));
    }
    std::string operator()(ReplayAddress const& address) const { return "replay:" + address.file; }
    std::string operator()(BluetoothAddress const& address) const
    {
        return "bt://" + address.mac + (address.channel ? "?channel=" + std::to_string(*address.channel) : "");
    }
    std::string operator()(BleAddress const& address) const { return "ble://" + address.mac; }
};

} // namespace

std::string toString(PortAddress const& address)
{
    return std::visit(AddressText{}, address);
}

} // namespace velmora
